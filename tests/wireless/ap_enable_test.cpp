// SPDX-License-Identifier: MIT
// The access point on and off: what is in the files afterwards, what ran, what is logged.
#include <gmock/gmock.h>
#include <taviwireless/wireless.h>

#include "tests/support/log_capture.h"
#include "tests/support/sleep_capture.h"
#include "tests/wireless/wifi_fixture.h"
#include "wireless/rules/dhcp.h"

namespace taviwireless::test {
namespace {

using testing::ElementsAre;
using testing::EndsWith;
using testing::HasSubstr;

constexpr char kFlag[] = "/var/tmp/.wireless_ap_connecting";
constexpr char kSettings[] = "/usr/tavi/etc/wireless_ap.conf";
constexpr char kHostapdInfo[] = "/etc/hostapd/hostapd-wlan0.info";
constexpr char kInterfaceFile[] = "/etc/sysconfig/network-scripts/ifcfg-wlan0";
constexpr char kBridgeFile[] = "/etc/sysconfig/network-scripts/ifcfg-lbr0";
constexpr char kDhcpInfo[] = "/etc/dhcpd/dhcpd-lbr0-lbr0.info";
constexpr char kDhcpPutAside[] = "/etc/dhcpd/dhcpd-lbr0-lbr0.info.manual";
constexpr char kInterfaceText[] =
    "ONBOOT=yes\nDEVICE=wlan0\nBRIDGE=lbr0\nIPADDR=10.1.14.1\nNETMASK=255.255.255.0\n"
    "BOOTPROTO=static\n";
constexpr char kAskForChannels[] = "/usr/sbin/iwlist wlan0 active_channel";
const std::string kRestart = "/etc/rc.network restart wlan0 ";  // BRIDGE

// "VALUE VALUE" of the keys "KEY|KEY", in the order of the file.
std::string Values(const std::string& file, const std::string& keys) {
    return Shell("echo -n $(sed -nE 's/^(" + keys + ")=\"?([^\"]*)\"?$/\\2/p' " + file + ")");
}

// An appliance whose access point was never on, with settings that want it on.
struct AccessPoint {
    explicit AccessPoint(const std::string& settings = "") {
        Shell(
            "rm -rf /etc/hostapd /etc/sysconfig /etc/dhcpd /usr/tavi/etc /tmp/ready"
            " /var/tmp/.wireless_ap_connecting\n"
            "mkdir -p /usr/tavi/etc /etc/sysconfig/network-scripts");
        tools.ForgetCommands();
        tools.Add("/etc/rc.network");
        tools.Add("/sbin/iwlist", "echo 'channel 1'");
        WriteFile("/tmp/wireless.info", "PRODUCT=USB Stick\nAP_SUPPORT=yes\n");
        WriteFile(kSettings, "[USB Stick]\n\tenable=yes\n" + settings);
    }

    ToolStandIns tools;
    WirelessInterface adapter;
    LogCapture log;
};

void ExpectIsOn() {
    EXPECT_EQ(ReadFile(kHostapdInfo), "enable=\"yes\"\n");
    EXPECT_EQ(Values(kBridgeFile, "ONBOOT"), "yes");
    EXPECT_EQ(Values(kBridgeFile, "IPADDR|NETMASK"), "10.1.14.1 255.255.255.0");
    EXPECT_EQ(Values(kDhcpInfo, "enable|start|end"), "yes 10.1.14.2 10.1.14.254");
    EXPECT_EQ(Values(kDhcpInfo, "lease|gateway"), "86400 10.1.14.1");
    EXPECT_EQ(ReadFile(kInterfaceFile), kInterfaceText);
    EXPECT_FALSE(Exists(kFlag));
}

TEST(DhcpRange, IsAllBehindTheServerInSubnetsOfAnySize) {
    const struct {
        const char *address, *netmask;
        const char *start, *end;  // empty when there is none
    } kCases[] = {
        {"10.1.14.1", "255.255.255.0", "10.1.14.2", "10.1.14.254"},
        {"10.1.14.1", "255.0.0.0", "10.1.14.2", "10.255.255.254"},
        {"10.1.14.129", "255.255.255.192", "10.1.14.130", "10.1.14.190"},
        {"192.168.1.255", "255.255.252.0", "192.168.2.0", "192.168.3.254"},
        {"10.0.0.5", "255.255.255.252", "10.0.0.6", "10.0.0.6"},
        {"255.255.255.255", "255.255.255.255", "0.0.0.0", "255.255.255.254"},
        {"", "255.255.255.0", "", ""},
        {"10.1.14.1", "/24", "", ""},
    };
    for (const auto& c : kCases) {
        const auto range =
            wireless::DhcpRangeBehind(c.address, c.netmask).value_or(wireless::DhcpRange{});
        EXPECT_EQ(range.start, c.start) << c.address << '/' << c.netmask;
        EXPECT_EQ(range.end, c.end) << c.address << '/' << c.netmask;
    }
}

TEST(Enable, MakesTheWirelessLanWithItsDhcpService) {
    AccessPoint ap;
    ap.tools.Add("/etc/rc.network", "[ -e " + std::string(kFlag) + " ]");
    EXPECT_EQ(TAVIWirelessAPEnable(), 1);
    ExpectIsOn();
    EXPECT_THAT(ReadFile("/etc/hostapd/hostapd-wlan0-host.conf"), HasSubstr("bridge=lbr0\n"));
    EXPECT_EQ(Values(kBridgeFile, "PRIMARY"), "wlan0");
    EXPECT_THAT(ap.tools.Commands(), ElementsAre(kAskForChannels, kRestart + "lbr0"));
    EXPECT_EQ(ap.log.Text(), "");

    WriteFile(kDhcpInfo, "enable=yes\nstart=10.1.14.20\nend=10.1.14.30\nlease=60\n");
    EXPECT_EQ(TAVIWirelessAPEnable(), 1);
    EXPECT_EQ(Values(kDhcpInfo, "start|lease"), "10.1.14.20 60");
    EXPECT_EQ(ReadFile(kInterfaceFile), kInterfaceText);
}

TEST(Enable, JoinsAWiredBridgeWithoutADhcpService) {
    AccessPoint ap("\tbridge=br0\n");
    EXPECT_EQ(TAVIWirelessAPEnable(), 1);
    EXPECT_EQ(Values("/etc/sysconfig/network-scripts/ifcfg-br0", "PRIMARY|IPADDR"), "eth0");
    EXPECT_FALSE(Exists("/etc/dhcpd"));
    EXPECT_THAT(ReadFile(kInterfaceFile), HasSubstr("BRIDGE=br0\nIPADDR=10.1.14.1\n"));
    EXPECT_THAT(ap.tools.Commands(), ElementsAre(kAskForChannels, kRestart + "br0"));
}

TEST(Enable, TakesADhcpServiceBackThatFitsTheSubnet) {
    const std::pair<std::string, const char*> kCases[] = {
        {"enable=no\nstart=10.1.14.9\nend=10.1.14.10\n", "no 10.1.14.9"},
        {"enable=yes\nstart=10.1.14.9\nend=10.1.15.9\n", "yes 10.1.14.2"},
        {"enable=no\nstart=10.1.13.9\nend=10.1.14.9\n", "yes 10.1.14.2"},
        {"enable=no\n", "yes 10.1.14.2"},
    };
    for (const auto& [settings, taken] : kCases) {
        AccessPoint ap;
        WriteFile(kDhcpPutAside, settings);
        EXPECT_EQ(TAVIWirelessAPEnable(), 1) << ap.log.Text();
        EXPECT_FALSE(Exists(kDhcpPutAside));
        EXPECT_EQ(Values(kDhcpInfo, "enable|start"), taken) << settings;
    }
}

TEST(Enable, DoesNothingWhileTheFlagIsUpOrTheSettingsSayOff) {
    AccessPoint ap;
    WriteFile(kFlag, "");
    EXPECT_EQ(TAVIWirelessAPIsConnecting() + TAVIWirelessTestAPMode(), 2);
    EXPECT_EQ(TAVIWirelessAPEnable(), 0);
    EXPECT_EQ(TAVIWirelessAPIsConnecting() + TAVIWirelessTestAPMode(), 0);  // it took it down
    WriteFile(kSettings, "[USB Stick]\n\tenable=no\n");
    EXPECT_EQ(TAVIWirelessAPEnable(), 0);
    EXPECT_THAT(ap.log.Text(), testing::MatchesRegex(
                                   "wireless_ap_enable.cpp:[0-9]+ Another ap construction is going"
                                   "\n[^\n]* Failed to enable AP.\n"));
    EXPECT_FALSE(Exists("/etc/hostapd") || Exists(kFlag));
    EXPECT_THAT(ap.tools.Commands(), ElementsAre());
}

TEST(Enable, RefusesABridgeThatCanBeNoneBeforeAnythingIsWritten) {
    for (const std::string bridge :
         {"-x", " ", "*", "a/../b", "..", "eth0:1", "wlan0", "wlan0-far", "eth0", "gbr", "lo"}) {
        AccessPoint ap("\tbridge=" + bridge + "\n");
        EXPECT_EQ(TAVIWirelessAPEnable(), 0);
        EXPECT_TRUE(ap.log.Has("Failed to set bridge[" + bridge + "] config."));
        EXPECT_EQ(Shell("ls /etc/hostapd /etc/sysconfig/network-scripts 2> /dev/null; true"),
                  "/etc/sysconfig/network-scripts:\n");
        EXPECT_THAT(ap.tools.Commands(), ElementsAre());
    }
    AccessPoint ap("\tbridge=br-lan_2.7\n");
    Shell("ip link add br-lan_2.7 type bridge");
    EXPECT_EQ(TAVIWirelessAPEnable(), 1) << ap.log.Text();
    Shell("ip link delete br-lan_2.7");
}

TEST(Enable, WaitsFiveSecondsForChannels) {
    for (const unsigned readyAfter : {4u, 5u}) {
        AccessPoint ap;
        ap.tools.Add("/sbin/iwlist", "[ ! -e /tmp/ready ] || echo 'channel 1'");
        unsigned slept = 0;
        const SleepCapture sleeps([&](unsigned) {
            if (++slept == readyAfter) {
                WriteFile("/tmp/ready", "");
            }
        });
        const bool isEnabled = readyAfter == 4;
        EXPECT_EQ(TAVIWirelessAPEnable(), isEnabled ? 1 : 0);
        EXPECT_EQ(sleeps.Calls(), std::vector<unsigned>(readyAfter, 1));
        EXPECT_EQ(ap.log.Count("Wait for wireless interface 'wlan0' ready ("), int(readyAfter));
        EXPECT_TRUE(ap.log.Has("'wlan0' ready (0)"));
        EXPECT_EQ(ap.log.Has("There is no wireless interface available"), !isEnabled);
        EXPECT_EQ(ap.tools.Commands().size(), isEnabled ? 6u : 5u);
        ExpectIsOn();  // as far as files go
    }
}

TEST(Enable, FailsAtOnceWithoutItsTools) {
    AccessPoint ap;
    ap.tools.Add("/etc/rc.network", "exit 1");
    EXPECT_EQ(TAVIWirelessAPEnable(), 0);
    EXPECT_TRUE(ap.log.Has("Failed to restart /etc/rc.network"));
    const std::string path = getenv("PATH");
    setenv("PATH", "/nowhere", 1);
    EXPECT_EQ(TAVIWirelessAPEnable(), 0);
    setenv("PATH", path.c_str(), 1);
    EXPECT_TRUE(ap.log.Has("Failed to execute [iwlist wlan0 active_channel|wc -l]"));
    EXPECT_FALSE(ap.log.Has("Wait for wireless interface"));
}

TEST(Enable, FailsCleanlyAndWorksWhenTheCauseIsGone) {
    const std::string folder = "/etc/sysconfig/network-scripts";
    const std::string bridge = kBridgeFile, interface = kInterfaceFile;
    const auto full = [](const std::string& path) {
        return "mkdir -p " + path + "; mount -t tmpfs -o size=4k none " + path + "; ! yes > " +
               path + "/all 2> /dev/null";
    };
    const std::string ofHostapd = "Failed to set hostapd conf of interface [wlan0].";
    const struct {
        std::string arrange, log, undo;
    } kCases[] = {
        {full("/etc/hostapd"), ofHostapd, "umount /etc/hostapd"},
        {"printf 'LOCAL_LAN=yes\nIPADDR=10.1.14.1\nNETMASK=255.255.255.0\n' > " + bridge +
             "; mount --bind " + folder + ' ' + folder + "; mount -o remount,bind,ro " + folder,
         "Failed to set key[ONBOOT] in [" + bridge + "].", "umount " + folder},
        {full("/etc/dhcpd"), "Failed to set dhcpServer conf for [lbr0].", "umount /etc/dhcpd"},
        {"mkdir " + interface, "Failed to set " + interface + " tavierr=[0x0800]",
         "rmdir " + interface},
    };
    for (const auto& c : kCases) {
        SCOPED_TRACE(c.arrange);
        AccessPoint ap;
        Shell(c.arrange);
        const std::string stored = ReadFile(kSettings);
        EXPECT_EQ(TAVIWirelessAPEnable(), 0);
        EXPECT_TRUE(ap.log.Has(c.log)) << ap.log.Text();
        EXPECT_THAT(ap.log.Text(), EndsWith("Failed to enable AP.\n"));
        EXPECT_THAT(ap.tools.Commands(), ElementsAre());
        EXPECT_EQ(ReadFile(kSettings), stored);
        EXPECT_FALSE(Exists(kFlag));
        // Half of it would be an open network.
        if (c.log == ofHostapd) {
            EXPECT_FALSE(Exists("/etc/hostapd/hostapd-wlan0-host.conf"));
        }
        Shell(c.undo);
        EXPECT_EQ(TAVIWirelessAPEnable(), 1) << ap.log.Text();
        ExpectIsOn();
    }
}

TEST(Disable, TakesTheLastMemberOutAndPutsTheDhcpServiceAside) {
    AccessPoint ap;
    EXPECT_EQ(TAVIWirelessAPEnable(), 1);
    WriteFile(kInterfaceFile, ReadFile(kInterfaceFile) + "LOCAL_LAN=yes\n");
    const std::string service = ReadFile(kDhcpInfo);
    ap.tools.ForgetCommands();
    EXPECT_EQ(TAVIWirelessAPDisable(), 1);
    EXPECT_FALSE(Exists(kHostapdInfo));
    EXPECT_EQ(Values(kBridgeFile, "ONBOOT"), "no");
    EXPECT_EQ(ReadFile(kInterfaceFile),
              "ONBOOT=yes\nDEVICE=wlan0\nIPADDR=10.1.14.1\nNETMASK=255.255.255.0\n"
              "BOOTPROTO=static\n");
    EXPECT_FALSE(Exists(kDhcpInfo));
    EXPECT_EQ(ReadFile(kDhcpPutAside), service);
    EXPECT_EQ(TAVIWirelessAPDisable(), 1);  // it is in no bridge any more
    EXPECT_THAT(ap.tools.Commands(), ElementsAre(kRestart + "lbr0", kRestart));
    EXPECT_EQ(ap.log.Text(), "");
    EXPECT_EQ(TAVIWirelessAPEnable(), 1);
    EXPECT_FALSE(Exists(kDhcpPutAside));
    EXPECT_EQ(ReadFile(kDhcpInfo), service);
    EXPECT_EQ(Values(kBridgeFile, "ONBOOT"), "yes");
}

TEST(Disable, LeavesTheBridgeToItsOtherMembers) {
    const std::pair<std::string, std::string> kCases[] = {
        // members of the kernel's bridge; its settings ONBOOT and PRIMARY
        {"", "no wlan0"},
        {"wlan0", "no wlan0"},
        {"wlan0 wlan0-far", "yes wlan0-far"},
        {"wlan0-far", "yes wlan0"},
    };
    for (const auto& [members, settings] : kCases) {
        AccessPoint ap;
        EXPECT_EQ(TAVIWirelessAPEnable(), 1);
        Shell("ip link add lbr0 type bridge\nfor i in " + members +
              "; do ip link set $i master lbr0; done");
        EXPECT_EQ(TAVIWirelessAPDisable(), 1);
        Shell("ip link delete lbr0");
        EXPECT_EQ(Values(kBridgeFile, "ONBOOT|PRIMARY"), settings);
        EXPECT_EQ(Values(kInterfaceFile, "BRIDGE"), "");
        EXPECT_EQ(ap.log.Text(), "");
    }
}

}  // namespace
}  // namespace taviwireless::test
