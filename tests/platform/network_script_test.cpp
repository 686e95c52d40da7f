// The network script: real bridges and the real DHCP server and client; hostapd, which needs a
// radio, is a stand-in that stays until it is told to end.
#include <gmock/gmock.h>
#include <tavicore/file.h>
#include <tavicore/process.h>
#include <tavisdk/bridge.h>

#include "tests/platform/root_scripts.h"
#include "tests/platform/veth.h"

namespace taviwireless::test {
namespace {

using testing::HasSubstr;
using testing::Not;

const std::string kInterfaceFile = "/etc/sysconfig/network-scripts/ifcfg-";  // and its name
constexpr char kGuestInfo[] = "/etc/hostapd/hostapd-wlan0-guest.info";
constexpr char kJoined[] = "/var/run/hostapd-wlan0.conf";
constexpr char kServerPid[] = "/var/run/udhcpd-lbr0.pid";

struct NetworkScript : testing::Test {
    void SetUp() override {
        InstallRootScripts();
        InstallScript(TAVI_SOURCE_DIR "/sim/hostapd", "/usr/sbin/hostapd");
        MakeInterface("wlan0", "192.168.9.9/24");
        WriteFile("/etc/hostapd/hostapd-wlan0-host.conf", "ssid=main\n");
        WriteFile("/etc/hostapd/hostapd-wlan0-guest.conf", "bss=gwlan\n");
    }
    void TearDown() override { SwitchAccessPoint("no"); }

    // What it says in failing, or nothing.
    std::string Restart(const std::string& bridge) {
        const RunResult result = RunProgram({"/etc/rc.network", "restart", "wlan0", bridge});
        EXPECT_EQ(result.status, result.err.empty() ? 0 : 1) << result.err;
        return result.err;
    }
    void SwitchAccessPoint(const std::string& enable) {
        WriteFile("/etc/hostapd/hostapd-wlan0.info", "enable=\"" + enable + "\"\n");
    }

    // What enabling the access point on a local bridge leaves behind.
    void SaveLocalBridge() {
        const TAVINetBridge bridge = {1, "lbr0", "10.1.14.1", "255.255.255.0"};
        const TAVINetBridgeMember member = {TAVI_NET_MEMBER_WIRELESS, "wlan0"};
        const TAVINetDhcpServer server = {
            1,      30,     600,         "10.1.14.20", "10.1.14.20",
            "lbr0", "lbr0", "10.1.14.1", "10.1.14.1",  "255.255.255.0"};
        ASSERT_EQ(TAVINetSetBridgeConfig(&bridge, &member), 0);
        ASSERT_EQ(TAVINetSetDhcpServerConfigFiles(&server, 1), 1);
        WriteFile(kInterfaceFile + "wlan0", "BRIDGE=lbr0\nIPADDR=10.1.14.1\n");
        SwitchAccessPoint("yes");
    }
};

// The lease that a station, at the far end of wlan0, gets: "ADDRESS ROUTER DNS LEASETIME".
std::string LeaseOfStation() {
    WriteFile("/tmp/station", "#!/bin/sh\n[ $1 != bound ] || echo $ip $router $dns $lease\n");
    chmod("/tmp/station", 0755);
    return RunProgram({"udhcpc", "-f", "-n", "-q", "-t", "4", "-T", "1", "-i", "wlan0-far", "-s",
                       "/tmp/station"})
        .out;
}

// The server asks 10 ms long, not 2 s, whether somebody else has the address.
void HurryServer() {
    RunProgram({"sh", "-c",
                "mkdir /tmp/real && mv /usr/sbin/udhcpd /tmp/real/ && "
                "printf '#!/bin/sh\\nexec /tmp/real/udhcpd -a 10 \"$@\"\\n' >/usr/sbin/udhcpd && "
                "chmod 755 /usr/sbin/udhcpd"});
}

TEST_F(NetworkScript, StationOfALocalBridgeGetsALease) {
    HurryServer();
    SaveLocalBridge();
    for (int i = 0; i < 2; ++i) {  // again: whatever ran before
        ASSERT_EQ(Restart("lbr0"), "");
        EXPECT_THAT(Ip("address show lbr0"), HasSubstr("inet 10.1.14.1/24 brd 10.1.14.255"));
        EXPECT_THAT(Ip("address show wlan0"), HasSubstr("master lbr0"));
        EXPECT_THAT(Ip("address show wlan0"), Not(HasSubstr("inet ")));
        EXPECT_EQ(LeaseOfStation(), "10.1.14.20 10.1.14.1 10.1.14.1 600\n");
    }
}

TEST_F(NetworkScript, AccessPointHasItsGuestsWhileThatIsSwitchedOn) {
    SaveLocalBridge();
    ASSERT_EQ(Restart("lbr0"), "");
    EXPECT_EQ(ReadFile(kJoined), "ssid=main\n");
    EXPECT_EQ(FileMode(kJoined), 0600);
    const pid_t first = VEXACReadPidFile("/var/run/hostapd-wlan0.pid");
    WriteFile(kGuestInfo, "enable=yes\n");
    ASSERT_EQ(Restart("lbr0"), "");
    EXPECT_NE(kill(first, 0), 0);
    EXPECT_EQ(ReadFile(kJoined), "ssid=main\nbss=gwlan\n");
    EXPECT_THAT(Ip("link show gbr"), HasSubstr("UP"));
    WriteFile(kGuestInfo, "enable=no\n");
    ASSERT_EQ(Restart("lbr0"), "");
    EXPECT_FALSE(Exists("/sys/class/net/gbr"));
}

TEST_F(NetworkScript, SwitchedOffLeavesNothingRunning) {
    SaveLocalBridge();
    ASSERT_EQ(Restart("lbr0"), "");
    EXPECT_EQ(VEXACProcAliveByPidFile(kServerPid), 1);
    const pid_t hostapd = VEXACReadPidFile("/var/run/hostapd-wlan0.pid");
    const pid_t server = VEXACReadPidFile(kServerPid);
    remove("/etc/hostapd/hostapd-wlan0.info");
    WriteFile(kInterfaceFile + "wlan0", "IPADDR=10.1.14.1\n");
    WriteFile(kInterfaceFile + "lbr0", "ONBOOT=no\n");
    VEXACSysRename("/etc/dhcpd/dhcpd-lbr0-lbr0.info", "/etc/dhcpd/dhcpd-lbr0-lbr0.info.manual");
    EXPECT_EQ(Restart("lbr0"), "");
    EXPECT_NE(kill(hostapd, 0), 0);
    EXPECT_NE(kill(server, 0), 0);
    EXPECT_FALSE(Exists(kJoined));
    EXPECT_FALSE(Exists("/sys/class/net/lbr0"));
    EXPECT_THAT(Ip("address show wlan0"), Not(HasSubstr("inet ")));
}

TEST_F(NetworkScript, InterfaceLeavesABridgeThatOthersKeep) {
    SaveLocalBridge();
    MakeInterface("eth1", "10.9.0.1/24");
    WriteFile(kInterfaceFile + "eth1", "BRIDGE=lbr0\n");
    ASSERT_EQ(Restart("lbr0"), "");
    EXPECT_THAT(Ip("link show master lbr0"), HasSubstr("wlan0"));
    WriteFile(kInterfaceFile + "wlan0", "");
    WriteFile(kInterfaceFile + "lbr0",
              "ONBOOT=yes\nPRIMARY=eth1\nIPADDR=10.1.14.1\nNETMASK=255.255.255.0\n");
    ASSERT_EQ(Restart("lbr0"), "");
    EXPECT_THAT(Ip("link show master lbr0"), HasSubstr("eth1"));
    EXPECT_THAT(Ip("link show master lbr0"), Not(HasSubstr("wlan0")));
}

TEST_F(NetworkScript, WiredBridgeBorrowsTheAddressOfItsInterface) {
    MakeInterface("eth0", "10.9.0.5/16");
    WriteFile(kInterfaceFile + "eth0",
              "ONBOOT=yes\nIPADDR=10.9.0.5\nNETMASK=255.255.0.0\nGATEWAY=10.9.0.1\n");
    for (const auto& [onBoot, owner] : {std::pair("yes", "br0"), {"no", "eth0"}}) {
        WriteFile(kInterfaceFile + "br0", std::string("PRIMARY=eth0\nONBOOT=") + onBoot + "\n");
        EXPECT_EQ(Restart("br0"), "");
        EXPECT_THAT(Ip("-4 -oneline address show to 10.9.0.5"), HasSubstr(owner));
        EXPECT_EQ(Ip("route show default"),
                  "default via 10.9.0.1 dev " + std::string(owner) + " \n");
    }
}

TEST_F(NetworkScript, FailureIsTold) {
    SaveLocalBridge();
    WriteFile("/usr/sbin/hostapd", "#!/bin/sh\necho no radio; exit 1\n");
    for (const char* bridge : {"lbr0", ""}) {
        EXPECT_EQ(Restart(bridge),
                  "no radio\nrc.network: cannot start hostapd on wlan0; its "
                  "messages above say why\n");
    }
    for (const char* bridge : {"../lbr0", "-x", "a b", "a-name-that-is-too-long", "gbr"}) {
        EXPECT_THAT(Restart(bridge), testing::StartsWith("rc.network: ")) << bridge;
    }
    EXPECT_EQ(RunProgram({"/etc/rc.network", "restart", "wlan0"}).status, 2);
}

TEST_F(NetworkScript, ValuesAreNeverRun) {
    SaveLocalBridge();
    for (const char* odd : {"$(touch /tmp/run)", "`touch /tmp/run`", "'; touch /tmp/run; '", "*"}) {
        for (const char* key : {"IPADDR", "PRIMARY", "GATEWAY"}) {
            WriteFile(kInterfaceFile + "lbr0",
                      "ONBOOT=yes\nIPADDR=10.1.14.1\nNETMASK=255.255.255.0\n" + std::string(key) +
                          '=' + odd + '\n');
            RunProgram({"/etc/rc.network", "restart", "wlan0", "lbr0"});
            EXPECT_FALSE(Exists("/tmp/run")) << key << '=' << odd;
        }
    }
}

TEST_F(NetworkScript, ProgramThatGotTheNumberOfAnotherIsSpared) {
    Process other({"sleep", "60"});
    WriteFile(kServerPid, std::to_string(other.Pid()) + "\n");
    WriteFile(kInterfaceFile + "lbr0", "ONBOOT=no\n");
    EXPECT_EQ(Restart("lbr0"), "");
    EXPECT_EQ(other.Wait(Process::Milliseconds(50)), std::nullopt);  // it goes on
    EXPECT_FALSE(Exists(kServerPid));
}

}  // namespace
}  // namespace taviwireless::test
