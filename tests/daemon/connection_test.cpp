// SPDX-License-Identifier: MIT
// A connection that runs while the service, its modem or the files around it change.

#include "tests/support/bus.h"
#include "tests/support/files.h"
#include "tests/support/wait.h"

namespace taviwireless::test {
namespace {

using testing::HasSubstr;
using testing::StartsWith;

constexpr char kInfo[] = "/tmp/usbmodem.info0";

bool IsDialling() {
    return RunProgram({"pgrep", "-x", "sleep"}).status == 0;
}

std::string DefaultRoute() {
    return RunProgram({"ip", "route", "show", "default"}).out;
}

// A machine with a default route, and a modem whose connection has taken it away.
class Connected {
  public:
    Connected() : simulator({"--modem", "12d1,ports=dial/at"}) {
        Shell(
            "ip link add eth7 type veth peer name far7; ip address add 10.7.0.2/24 dev eth7;"
            "ip link set eth7 up; ip link set far7 up; ip route add default via 10.7.0.1;"
            "ip link add ppp0 type veth peer name far0; ip address add 10.64.64.64/32 dev ppp0");
        InstallDialler(
            "ip route delete default; echo '--> Using interface ppp0' >&2;"
            "echo '--> secondary DNS address 10.64.64.3' >&2");
        service.emplace(LoggingCommand());
        EXPECT_TRUE(service->Says("usbmodem0 is ready"));
        EXPECT_EQ(CallService({"SetProfile", "usbmodem0", "default_gw=true"}).err, "");
        EXPECT_EQ(CallService({"Connect", "usbmodem0"}).err, "");
        EXPECT_TRUE(Eventually([] { return IsDialling() && DefaultRoute().empty(); }));
    }
    void Restart() {
        service->End();
        service.emplace(LoggingCommand());
    }
    static void ExpectHungUp() {
        EXPECT_TRUE(Eventually([] { return !IsDialling(); }));
        EXPECT_TRUE(Eventually([] { return !DefaultRoute().empty(); }));
        EXPECT_THAT(DefaultRoute(), StartsWith("default via 10.7.0.1 dev eth7"));
        EXPECT_FALSE(Exists("/var/lib/usbmodem/usbmodem.pid.0"));
    }
    // Nothing that the service knows or asks ends the connection.
    static void ExpectConnected() {
        std::string document;
        for (int i = 0; i < 2; ++i) {  // finds the interface; then its address
            document = CallService({"GetUSBModem", "usbmodem0"}).out;
        }
        EXPECT_THAT(document, HasSubstr("\"net_status\": \"connected\""));
        EXPECT_THAT(document, HasSubstr("\"ip\": \"10.64.64.64\""));
        EXPECT_TRUE(IsDialling());
    }

    PrivateBus bus;
    ModemSimulator simulator;
    std::optional<ModemService> service;
};

// What a control line does to the modem while no service runs, what the next one says then, and
// what a command does before the modem is unplugged.
void ExpectHungUpAfter(const char* whileNobodyLooks, const char* said, const char* happens) {
    Connected connected;
    connected.service->End();
    connected.simulator.Command(whileNobodyLooks);
    connected.service.emplace(LoggingCommand());
    EXPECT_TRUE(connected.service->Says(said));
    Shell(happens);
    if (Exists(kInfo)) {
        connected.simulator.Unplug("0");
        EXPECT_TRUE(connected.service->Says("usbmodem0 was unplugged"));
    }
    Connected::ExpectHungUp();
}

TEST(UnpluggedAfterARestart, GetsTheRouteBackWhenTheDiallerNoticedFirst) {
    ExpectHungUpAfter("received 0", "usbmodem0 is ready", "pkill -KILL -x sleep");
}

TEST(UnpluggedAfterARestart, IsHungUpWhenNobodyLooked) {
    ExpectHungUpAfter("unplug 0", "usbmodem0 was unplugged", "true");
}

TEST(Connection, StaysWhenTheModemDoesNotTellItsSIMAfterARestart) {
    Connected connected;
    for (const std::string command : {"AT+CIMI", "AT+CPIN?"}) {
        SCOPED_TRACE(command);
        connected.simulator.Reply("0", command, "\r\nwhat\r\n\r\nERROR?\r\n");
        connected.Restart();
        EXPECT_TRUE(connected.service->Says("usbmodem0 is ready"));
        Connected::ExpectConnected();
    }
}

TEST(Connection, AModemIsReadyOnceItTellsItsSIM) {
    PrivateBus bus;
    ModemSimulator simulator({"--modem", "12d1,ports=dial/at"});
    simulator.ReplyOnce("0", "AT+CIMI", "\r\nERROR\r\n");
    ModemService service(LoggingCommand());
    EXPECT_TRUE(service.Says("usbmodem0 is ready"));
    EXPECT_THAT(service.Log(), HasSubstr("usbmodem0 does not answer"));
}

TEST(Connection, EndsWithAResetOfTheModem) {
    Connected connected;
    const std::string info = ReadFile(kInfo);
    connected.simulator.Unplug("0.1");
    connected.simulator.Plug("0.1");
    EXPECT_TRUE(connected.service->Says("usbmodem0 was plugged in anew"));
    Connected::ExpectHungUp();
    EXPECT_TRUE(connected.service->Says("usbmodem0 is ready"));
    EXPECT_THAT(CallService({"GetUSBModem", "usbmodem0"}).out, HasSubstr("E1752"));
    EXPECT_EQ(ReadFile(kInfo), info);
}

}  // namespace
}  // namespace taviwireless::test
