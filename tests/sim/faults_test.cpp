// Misbehaviour, each kind as a client sees it.
#include <gmock/gmock.h>

#include <chrono>

#include "tests/sim/client.h"
#include "tests/support/files.h"
#include "tests/support/modem_simulator.h"

namespace taviwireless::test {
namespace {

using Clock = std::chrono::steady_clock;
using std::chrono::milliseconds;
using testing::AnyOf;
using testing::EndsWith;
using testing::HasSubstr;
using testing::StartsWith;

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
        {"error=AT+C*", "AT+CSQ\r\r\nERROR\r\n"},
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

TEST(Fault, BabbleNeverPausesAndStillAnswers) {
    ModemSimulator simulator({"--fault", "0:babble"});
    Client client(1);
    client.Write("AT+CSQ\r");
    std::string text;
    const auto end = Clock::now() + milliseconds(300);
    while (Clock::now() < end) {
        ASSERT_TRUE(client.ReadMore(1000, &text));
    }
    EXPECT_THAT(text, HasSubstr("+CSQ: 17,99"));
    simulator.Fault("0", "off");
    client.ReadUntilQuiet();
    EXPECT_EQ(client.Ask("AT+CSQ"), kEchoed);
}

TEST(Fault, VanishUnplugsTheModemWithinAReply) {
    const struct {
        const char* fault;
        const char* heard;
    } kFaults[] = {{"vanish", "AT+CSQ\r"}, {"vanish=9", "AT+CSQ\r\r\n+CSQ: 1"}};
    ModemSimulator simulator;
    for (const auto& fault : kFaults) {
        SCOPED_TRACE(fault.fault);
        simulator.Fault("0.1", fault.fault);
        Client client(1);
        client.Write("AT+CSQ\r");
        // The kernel drops what was not read when the line is hung up.
        EXPECT_THAT(client.ReadUntilQuiet(Client::kPatience), AnyOf(fault.heard, ""));
        EXPECT_TRUE(client.IsHungUp());
        EXPECT_FALSE(Exists("/dev/ttyUSB1"));
        EXPECT_FALSE(Exists("/tmp/usbmodem.info0"));
        simulator.Plug("0");
        EXPECT_EQ(Client(1).Ask("AT+CSQ"), kEchoed);  // it vanishes once
    }
}

TEST(Reply, IsWhatWasGivenUntilItIsTakenBack) {
    const char kText[] = "\r\n+CSQ: \"99\"\r\n\0\x7f tail\r\nOK\r\n";
    const std::string text(kText, sizeof kText - 1);
    ModemSimulator simulator;
    Client client(1);
    simulator.Reply("0", "at+csq", text);
    EXPECT_EQ(client.Ask("AT+CSQ"), "AT+CSQ\r" + text);
    EXPECT_EQ(client.Ask("AT+CSQ"), "AT+CSQ\r" + text);
    simulator.Command("reply 0 AT+CSQ off");
    EXPECT_EQ(client.Ask("AT+CSQ"), kEchoed);
}

}  // namespace
}  // namespace taviwireless::test
