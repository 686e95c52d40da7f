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

TEST(SimCard, WithoutAPinIsReadyAndUnprotected) {
    RunSteps("12d1", {{"AT+CPIN?", "+CPIN: READY OK"},
                      {"AT+CLCK=\"SC\",2", "+CLCK: 0 OK"},
                      {"AT^CPIN?", "^CPIN: READY,,10,3,10,3 OK"},
                      {"AT+CPIN=1234", kNotAllowed},
                      {"AT+CPIN=12345678,1234", kNotAllowed},
                      {"AT+CPWD=\"SC\",\"0000\",\"1234\"", kNotAllowed}});
}

TEST(SimCard, AnswersOnlyWhatALockedCardCanUntilThePinIsEntered) {
    RunSteps("12d1,pin=1234", {{"AT+CPIN?", "+CPIN: SIM PIN OK"},
                               {"AT+CIMI", kNeedsPin},
                               {"AT+COPS?", kNeedsPin},
                               {"AT+CLCK=\"SC\",2", kNeedsPin},
                               {"ATD*99#", kNeedsPin},
                               {"AT+CREG?", "+CREG: 2,0,\"1F4B\",\"00A2C3D1\" OK"},
                               {"AT+CGMM", "E1752 OK"},
                               {"AT+CPIN=\"1234\"", "OK"},
                               {"AT+CPIN?", "+CPIN: READY OK"},
                               {"AT+CREG?", "+CREG: 2,1,\"1F4B\",\"00A2C3D1\" OK"},
                               {"AT+CIMI", "001010123456789 OK"}});
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

TEST(SimCard, ARightPinGivesTheAttemptsBack) {
    RunSteps("12d1,pin=1234,attempts=1", {{"AT^CPIN?", "^CPIN: SIM PIN,1,10,1,10,3 OK"},
                                          {"AT+CPIN=1234", "OK"},
                                          {"AT^CPIN?", "^CPIN: READY,,10,3,10,3 OK"}});
}

TEST(SimCard, ALastWrongPukBlocksItForGood) {
    RunSteps("12d1,pin=1234,attempts=0,puk_attempts=1",
             {{"AT+CPIN?", "+CPIN: SIM PUK OK"},
              {"AT+CPIN=11111111,5678", kWrong},
              {"AT+CPIN?", "+CME ERROR: SIM blocked"},
              {"AT+CPIN=12345678,5678", "+CME ERROR: SIM blocked"}});
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

TEST(SimCard, WrongPinsWhileReadyAskForThePukToo) {
    RunSteps("12d1,pin=1234,lock=off", {{"AT+CLCK=\"SC\",1,\"1111\"", kWrong},
                                        {"AT+CLCK=\"SC\",1,\"1111\"", kWrong},
                                        {"AT+CLCK=\"SC\",1,\"1111\"", kWrong},
                                        {"AT+CPIN?", "+CPIN: SIM PUK OK"}});
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

TEST(SimCard, IsSetUpWhileItRuns) {
    ModemSimulator simulator;
    Client client(1);
    client.Ask("ATE0");
    simulator.Set("0", "pin", "4321");
    simulator.Set("0", "lock", "on");
    simulator.Set("0", "pin_attempts", "1");
    EXPECT_EQ(Flat(client.Ask("AT+EPINC?")), "+EPINC: 1,3,10,10 OK");
    EXPECT_EQ(Flat(client.Ask("AT+CPIN=4321")), "OK");
    EXPECT_THROW(simulator.Set("0", "pin", "12"), std::runtime_error);
}

}  // namespace
}  // namespace taviwireless::test
