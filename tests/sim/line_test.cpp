// What goes over the line, byte for byte: commands, misbehaviour, calls, clients that come and go.
#include <gmock/gmock.h>

#include "tests/sim/client.h"
#include "tests/support/files.h"
#include "tests/support/modem_simulator.h"
#include "tests/support/wait.h"

namespace taviwireless::test {
namespace {

using testing::EndsWith;

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
        {"AT+NONSENSE\r", "AT+NONSENSE\r\r\nERROR\r\n"},
        {"no command\r", "no command\r"},
        {"AT+CSQ;+CFUN?\r", "AT+CSQ;+CFUN?\r\r\n+CSQ: 17,99\r\n+CFUN: 1\r\n\r\nOK\r\n"},
        {"ATQ0 V1 E1 S0=0 &C1 &D2 +FCLASS=0\r", "ATQ0 V1 E1 S0=0 &C1 &D2 +FCLASS=0\r\r\nOK\r\n"},
        {"AT+CFUN=\r", "AT+CFUN=\r\r\n+CME ERROR: incorrect parameters\r\n"},
        {"AT+CGDCONT=1,\"IP\",\"my Net\"\r", "AT+CGDCONT=1,\"IP\",\"my Net\"\r\r\nOK\r\n"},
        {"AT+CGDCONT?\r",
         "AT+CGDCONT?\r\r\n+CGDCONT: 1,\"IP\",\"my Net\",\"0.0.0.0\",0,0\r\n\r\nOK\r\n"},
        {"AT+CMEE=1\r", "AT+CMEE=1\r\r\nOK\r\n"},
        {"AT+CFUN=\r", "AT+CFUN=\r\r\n+CME ERROR: 50\r\n"},
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

constexpr char kSignal[] = "\r\n+CSQ: 17,99\r\n\r\nOK\r\n";
const std::string kEchoed = "AT+CSQ\r" + std::string(kSignal);

TEST(Fault, ChangesTheReplyAndCanBeTakenAway) {
    const struct {
        const char* fault;
        std::string reply;
    } kFaults[] = {
        {"silent", ""},
        {"error", "AT+CSQ\r\r\nERROR\r\n"},
        {"error=at+csq", "AT+CSQ\r\r\nERROR\r\n"},
        {"error=AT+CGMM", kEchoed},
        {"noecho", kSignal},
        {"garbage", "AT+CSQ\r\xff\xfe\x80\x01\x1b\xc3\x28\x7f" + std::string(kSignal)},
        {"unsolicited=^RSSI:21",
         "AT+CSQ\r\r\n^RSSI:21\r\n\r\n+CSQ: 17,99\r\n\r\n^RSSI:21\r\n\r\nOK\r\n"},
        {"pieces=3/1", kEchoed},
        {"slow=1", kEchoed},
    };
    ModemSimulator simulator;
    Client client(1);
    for (const auto& fault : kFaults) {
        SCOPED_TRACE(fault.fault);
        simulator.Fault("0", fault.fault);
        client.Write("AT+CSQ\r");
        std::string reply;
        if (fault.reply.empty()) {
            reply = client.ReadUntilQuiet();
        }
        while (reply.size() < fault.reply.size() && client.ReadMore(Client::kPatience, &reply)) {
        }
        EXPECT_EQ(reply, fault.reply);
        simulator.Fault("0", "off");
        EXPECT_EQ(client.Ask("AT+CSQ"), kEchoed);
    }
    EXPECT_EQ(client.ReadUntilQuiet(), "");
}

// Everything up to these words.
std::string ReadUntil(Client& client, const std::string& last) {
    std::string text;
    while (text.find(last) == std::string::npos && client.ReadMore(Client::kPatience, &text)) {
    }
    return text;
}

TEST(Call, CommandHasTheLineUntilItEndsAndThenTheModemHangsUp) {
    ModemSimulator simulator(
        {"--on-dial", "echo welcome; read -r line; echo \"heard $line\"; exit 3"});
    Client client(0);
    for (int round = 0; round < 2; ++round) {
        client.Write("ATD*99#\r");
        EXPECT_THAT(ReadUntil(client, "welcome\n"), EndsWith("\r\nCONNECT\r\nwelcome\n"));
        simulator.Received("0");
        client.Write("AT+CSQ\n");  // is the command's now
        EXPECT_EQ(ReadUntil(client, "NO CARRIER\r\n"), "heard AT+CSQ\n\r\nNO CARRIER\r\n");
        EXPECT_THAT(simulator.Received("0"), testing::IsEmpty());
        EXPECT_THAT(client.Ask("AT"), EndsWith("OK\r\n"));
    }
}

TEST(Call, CommandEndsWithTheModem) {
    ModemSimulator simulator({"--on-dial",
                              "trap 'echo gone >/tmp/call; exit' TERM; echo welcome; "
                              "while :; do sleep 0.1; done"});
    Client client(0);
    client.Write("ATD*99#\r");
    ReadUntil(client, "welcome\n");
    simulator.Unplug("0");
    EXPECT_EQ(ReadFile("/tmp/call"), "gone\n");
}

}  // namespace
}  // namespace taviwireless::test
