// What goes over the line, byte for byte, and clients that come and go.
#include <gmock/gmock.h>

#include <fstream>
#include <sstream>
#include <thread>

#include "tests/sim/client.h"
#include "tests/support/modem_simulator.h"
#include "tests/support/wait.h"

namespace taviwireless::test {
namespace {

using testing::ElementsAre;

struct Exchange {
    const char* sent;
    const char* answered;
};

TEST(Line, IsFramedAndEchoedLikeAModems) {
    const Exchange kExchanges[] = {
        {"AT\r", "AT\r\r\nOK\r\n"},
        {"at+csq\r", "at+csq\r\r\n+CSQ: 17,99\r\n\r\nOK\r\n"},
        {"AT+CSQ\r\n", "AT+CSQ\r\r\n+CSQ: 17,99\r\n\r\nOK\r\n"},
        {"\r", ""},
        {"\r\r\r\r\r", ""},
        {"AT+NONSENSE\r", "AT+NONSENSE\r\r\nERROR\r\n"},
        {"no command\r", "no command\r"},
        {"AT+CSQ;+CFUN?\r", "AT+CSQ;+CFUN?\r\r\n+CSQ: 17,99\r\n+CFUN: 1\r\n\r\nOK\r\n"},
        {"ATQ0 V1 E1 S0=0 &C1 &D2 +FCLASS=0\r", "ATQ0 V1 E1 S0=0 &C1 &D2 +FCLASS=0\r\r\nOK\r\n"},
        {"AT+CSQ+\r", "AT+CSQ+\r\r\nERROR\r\n"},
        {"AT+CFUN=?\r", "AT+CFUN=?\r\r\nOK\r\n"},
        {"AT+CFUN=\r", "AT+CFUN=\r\r\n+CME ERROR: incorrect parameters\r\n"},
        {"AT+CGDCONT=1,\"IP\",\"my Net\"\r", "AT+CGDCONT=1,\"IP\",\"my Net\"\r\r\nOK\r\n"},
        {"AT+CGDCONT?\r",
         "AT+CGDCONT?\r\r\n+CGDCONT: 1,\"IP\",\"my Net\",\"0.0.0.0\",0,0\r\n\r\nOK\r\n"},
        {"AT+CMEE=1\r", "AT+CMEE=1\r\r\nOK\r\n"},
        {"AT+CFUN=\r", "AT+CFUN=\r\r\n+CME ERROR: 50\r\n"},
        {"AT+CMEE=0\r", "AT+CMEE=0\r\r\nOK\r\n"},
        {"AT+CFUN=\r", "AT+CFUN=\r\r\nERROR\r\n"},
        {"ATE0\r", "ATE0\r\r\nOK\r\n"},
        {"AT+CSQ\r", "\r\n+CSQ: 17,99\r\n\r\nOK\r\n"},
        {"ATZ\r", "\r\nOK\r\n"},
        {"AT\r", "AT\r\r\nOK\r\n"},
    };
    ModemSimulator simulator;
    Client client(1);
    for (const auto& exchange : kExchanges) {
        SCOPED_TRACE(exchange.sent);
        client.Write(exchange.sent);
        std::string answer;
        while (answer.size() < std::string(exchange.answered).size() &&
               client.ReadMore(Client::kPatience, &answer)) {
        }
        EXPECT_EQ(answer, exchange.answered);
    }
    EXPECT_EQ(client.ReadUntilQuiet(), "");
}

TEST(Line, OutlivesItsClientsAndKeepsNothingForTheNext) {
    ModemSimulator simulator;
    for (int round = 0; round < 50; ++round) {
        Client(1).Write("AT+CGMM\r");  // leaves before the reply
        std::vector<std::string> received;
        Eventually([&] { return !(received = simulator.Received("0")).empty(); });
        ASSERT_THAT(received, ElementsAre("AT+CGMM"));
        Client client(1);
        ASSERT_EQ(client.Ask("AT+CSQ"), "AT+CSQ\r\r\n+CSQ: 17,99\r\n\r\nOK\r\n");
        simulator.Received("0");
    }
}

TEST(Line, DialledPortCarriesDataUntilItIsEscapedFromOrReopened) {
    ModemSimulator simulator;
    {
        Client client(0);
        EXPECT_EQ(client.Ask("ATDT*99#"), "ATDT*99#\r\r\nCONNECT\r\n");
        client.Write("AT\r~\x7d");
        EXPECT_EQ(client.ReadUntilQuiet(), "");
        client.Write("+++");
        EXPECT_EQ(client.ReadReply(), "\r\nOK\r\n");
        EXPECT_EQ(client.Ask("ATH"), "ATH\r\r\nOK\r\n");
        client.Ask("ATD*99#");
    }
    EXPECT_EQ(Client(0).Ask("AT"), "AT\r\r\nOK\r\n");
}

// Clock ticks of processor time that a process has used.
long TicksUsed(pid_t pid) {
    std::ifstream file("/proc/" + std::to_string(pid) + "/stat");
    std::string word;
    for (int field = 1; field <= 13; ++field) {
        file >> word;
    }
    long user = 0;
    long system = 0;
    if (!(file >> user >> system)) {
        throw std::runtime_error("The process has no statistics");
    }
    return user + system;
}

TEST(Line, CostsNothingWhileNobodyTalks) {
    ModemSimulator simulator({"--fault", "0:babble"});
    Client(0).Write("AT\r");
    { Client client(1); }
    const long before = TicksUsed(simulator.Pid());
    std::this_thread::sleep_for(std::chrono::milliseconds(500));
    EXPECT_LE(TicksUsed(simulator.Pid()) - before, 2);  // of 50
}

}  // namespace
}  // namespace taviwireless::test
