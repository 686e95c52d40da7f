// SPDX-License-Identifier: MIT
// The adapter and its interface, addresses, and the route through it.
#include <tavisdk/wireless.h>

#include "tests/wireless/station_fixture.h"

namespace taviwireless::test {
namespace {

using testing::ElementsAre;
using testing::HasSubstr;

TEST(Adapter, IsKnownByItsInterfacesAndTheModel) {
    LogCapture log;
    EXPECT_EQ(TAVIWirelessAdapterNum(), 0);
    const WirelessInterface adapter;  // and "wlan0-far"
    EXPECT_EQ(TAVIWirelessAdapterNum(), 2);
    EXPECT_STREQ(TAVIWirelessInterfaceGet(), "wlan0");
    for (const char* value : {"yes", "no", "YES"}) {
        WriteFile("/etc.defaults/taviinfo.conf", std::string("support_wireless=") + value + "\n");
        EXPECT_EQ(TAVIWirelessIsSupported() != 0, std::string(value) == "yes");
    }
    EXPECT_EQ(log.Text(), "");
}

TEST(ModeChange, RunsTheHotplugScript) {
    Station station;
    const std::string script = "/usr/tavi/hotplug/usb.wireless.function";
    station.tools.Add(script, "[ $2 = ap ]");
    EXPECT_EQ(TAVIWirelessModeChange(0), 1);
    EXPECT_EQ(TAVIWirelessModeChange(1), 0);
    EXPECT_EQ(TAVIWirelessModeChange(2), 0);
    EXPECT_THAT(station.tools.Commands(),
                ElementsAre(script + " change-mode ap", script + " change-mode client"));
    EXPECT_TRUE(station.log.Has("Failed to change to wireless client mode."));
    EXPECT_TRUE(station.log.Has("Wrong Wireless Mode."));
}

TEST(DefaultGatewaySet, RunsOneCommandWhateverTheTextHolds) {
    Station station;
    station.tools.Add("/sbin/route");
    EXPECT_EQ(TAVIWirelessDefaultGatewaySet("a;`touch /tmp/x`\ntouch /tmp/x"), 0);
    EXPECT_EQ(ReadFile("/tmp/commands"),
              "/sbin/route add default gw a;`touch /tmp/x`\ntouch /tmp/x metric 0 dev wlan0\n");
    EXPECT_FALSE(Exists("/tmp/x"));
    // Cut short, it would run without its interface.
    station.tools.ForgetCommands();
    EXPECT_EQ(TAVIWirelessDefaultGatewaySet(std::string(200, '1').c_str()), -1);
    EXPECT_EQ(station.tools.Commands().size(), 0u);
    EXPECT_TRUE(station.log.Has("Failed to execute '/sbin/route add default gw 1"));
    EXPECT_EQ(TAVIWirelessDefaultGatewaySet(""), -1);
    EXPECT_TRUE(station.log.Has("Bad parameters"));
}

std::string Addresses() {
    return Shell("ip -4 -o address show wlan0");
}

// The DHCP client is a stand-in; what a real one does is the platform's business.
TEST(IfconfigSet, SetsAStaticAddressOrThatOfALease) {
    Station station;
    WirelessConf conf = MakeConf();
    station.tools.Add("/usr/sbin/udhcpc", "exit 1");
    EXPECT_EQ(TAVIWirelessIfconfigSet("wlan0", &conf), -1);
    EXPECT_TRUE(station.log.Has("Failed to get IP from DHCP"));
    EXPECT_TRUE(station.log.Has("Failed to set network interface"));
    EXPECT_EQ(Addresses(), "");
    station.log.Clear();
    station.tools.Add("/usr/sbin/udhcpc",
                      "{ sleep 60; :; } &\necho $! > /etc/dhcpc/dhcpcd-wlan0.pid\n"
                      "printf 'IPADDR=10.1.1.2\\nNETMASK=255.0.0.0\\n'"
                      " > /etc/dhcpc/dhcpcd-wlan0.info");
    EXPECT_EQ(TAVIWirelessIfconfigSet("wlan0", &conf), 0);
    EXPECT_THAT(Addresses(), HasSubstr("10.1.1.2/8"));

    strcpy(conf.netmask, "255.255.0.0");
    strcpy(conf.ipAddr, "10.0.0.2");
    EXPECT_EQ(TAVIWirelessIfconfigSet("wlan0", &conf), 0);
    EXPECT_THAT(Addresses(), HasSubstr("10.0.0.2/16"));
    strcpy(conf.ipAddr, "dhcp");
    EXPECT_EQ(TAVIWirelessIfconfigSet("wlan0", &conf), -1);
    EXPECT_TRUE(station.log.Has("Failed to set network interface"));
    EXPECT_EQ(TAVIWirelessIfconfigSet("--help", &conf), -1);
    EXPECT_TRUE(station.log.Has("Bad parameters"));
}

TEST(IsSingle, WhenNoOtherInterfaceIsConnected) {
    Station station;
    // "ip netns" would have to mount a second /sys, which only the machine's root can.
    Process far({"unshare", "--net", "sh", "-c", "echo up; exec sleep 60"});
    ASSERT_EQ(far.ReadLine(), "up");
    const std::string pid = std::to_string(far.Pid());
    Shell("ip link set wlan0-far netns " + pid + "; nsenter --net=/proc/" + pid +
          "/ns/net ip link set wlan0-far up");
    EXPECT_EQ(TAVIWirelessIsSingle_core(), 0);  // not connected
    station.driver.accessPoint = {2};
    EXPECT_EQ(TAVIWirelessIsSingle_core(), 1);
    Shell("ip link add eth0 type veth peer name eth1");
    Shell("ip link set eth0 up");  // without a carrier
    EXPECT_EQ(TAVIWirelessIsSingle_core(), 1);
    Shell("ip link set eth1 up");
    EXPECT_EQ(TAVIWirelessIsSingle_core(), 0);
    Shell("ip link delete eth0");
}

}  // namespace
}  // namespace taviwireless::test
