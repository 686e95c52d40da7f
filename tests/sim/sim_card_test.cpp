// The SIM card's states, as commands show them.
#include <gmock/gmock.h>

#include "tests/sim/client.h"
#include "tests/support/modem_simulator.h"

namespace taviwireless::test {
namespace {

constexpr char kWrong[] = "+CME ERROR: incorrect password";
constexpr char kNotAllowed[] = "+CME ERROR: operation not allowed";
constexpr char kBadArgument[] = "+CME ERROR: incorrect parameters";
constexpr char kNeedsPin[] = "+CME ERROR: SIM PIN required";
constexpr char kNeedsPuk[] = "+CME ERROR: SIM PUK required";

struct Step {
    const char* command;
    const char* reply;  // without line ends; a blank between lines
};

std::string Flat(const std::string& reply) {
    std::string flat;
    for (const char c : reply) {
        if (c == '\n' && !flat.empty() && flat.back() != ' ') {
            flat += ' ';
        } else if (c != '\r' && c != '\n') {
            flat += c;
        }
    }
    return flat.substr(0, flat.find_last_not_of(' ') + 1);
}

void RunSteps(const std::string& modem, const std::vector<Step>& steps) {
    ModemSimulator simulator({"--modem", modem});
    Client client(2);
    client.Ask("ATE0");
    for (const Step& step : steps) {
        SCOPED_TRACE(step.command);
        EXPECT_EQ(Flat(client.Ask(step.command)), step.reply);
    }
}

TEST(SimCard, AThirdWrongPinAsksForThePukWhichSetsANewPin) {
    RunSteps("12d1,pin=1234,puk=87654321", {{"AT+CPIN=1111", kWrong},
                                            {"AT^CPIN?", "^CPIN: SIM PIN,2,10,2,10,3 OK"},
                                            {"AT+CPIN=12", kBadArgument},  // never reaches the card
                                            {"AT+CPIN=1111", kWrong},
                                            {"AT^CPIN?", "^CPIN: SIM PIN,1,10,1,10,3 OK"},
                                            {"AT+CPIN=1111", kWrong},
                                            {"AT+CPIN?", "+CPIN: SIM PUK OK"},
                                            {"AT+CPIN=1234", kNeedsPuk},
                                            {"AT+CIMI", kNeedsPuk},
                                            {"AT+CPIN=11111111,5678", kWrong},
                                            {"AT^CPIN?", "^CPIN: SIM PUK,9,9,0,10,3 OK"},
                                            {"AT+CPIN=\"87654321\",\"5678\"", "OK"},
                                            {"AT^CPIN?", "^CPIN: READY,,10,3,10,3 OK"},
                                            {"AT+CLCK=\"SC\",0,\"5678\"", "OK"}});
}

TEST(SimCard, ProtectionAndPinAreChangedWithThePinOnly) {
    RunSteps("12d1,pin=1234,lock=off", {{"AT+CPIN?", "+CPIN: READY OK"},
                                        {"AT+CLCK=\"SC\",1,\"1111\"", kWrong},
                                        {"AT+CLCK=\"SC\",2", "+CLCK: 0 OK"},
                                        {"AT+CLCK=SC,1,1234", "OK"},
                                        {"AT+CLCK=\"SC\",2", "+CLCK: 1 OK"},
                                        {"AT+CPWD=\"SC\",\"1111\",\"5678\"", kWrong},
                                        {"AT+CPWD=\"SC\",\"1234\",\"56\"", kBadArgument},
                                        {"AT+CPWD=\"SC\",\"1234\",\"5678\"", "OK"},
                                        {"AT+CLCK=\"SC\",0,\"1234\"", kWrong},
                                        {"AT+CLCK=\"SC\",0,\"5678\"", "OK"},
                                        {"AT+CLCK=\"SC\",2", "+CLCK: 0 OK"}});
}

TEST(SimCard, ThatIsNotUsableSaysWhy) {
    ModemSimulator simulator;
    Client client(1);
    client.Ask("ATE0");
    const Step kStates[] = {{"absent", "+CME ERROR: SIM not inserted"},
                            {"busy", "+CME ERROR: SIM BUSY"},
                            {"failure", "+CME ERROR: SIM failure"},
                            {"ready", "+CPIN: READY OK"}};
    for (const Step& state : kStates) {
        simulator.Set("0", "sim", state.command);
        EXPECT_EQ(Flat(client.Ask("AT+CPIN?")), state.reply);
    }
}

TEST(SimCard, AsksForItsPinAgainAfterPowerWasLost) {
    ModemSimulator simulator({"--modem", "generic,pin=1234"});
    EXPECT_EQ(Client(1).Ask("AT+CPIN=1234"), "AT+CPIN=1234\r\r\nOK\r\n");
    simulator.Unplug("0");
    simulator.Plug("0");
    EXPECT_THAT(Client(1).Ask("AT+CPIN?"), testing::HasSubstr("+CPIN: SIM PIN\r\n"));
}

}  // namespace
}  // namespace taviwireless::test
