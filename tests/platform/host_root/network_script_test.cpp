// SPDX-License-Identifier: MIT
// The network program: real bridges and the real DHCP server and client; hostapd, which needs a
// radio, is a stand-in that stays until it is told to end.
#include <gmock/gmock.h>
#include <sys/file.h>
#include <tavicore/process.h>
#include <tavisdk/bridge.h>
#include <unistd.h>

#include "base/unique_fd.h"
#include "tests/platform/host_root/root_scripts.h"
#include "tests/platform/veth.h"
#include "tests/support/wait.h"
#include "tests/wireless/wifi_fixture.h"

namespace taviwireless::test {
namespace {

using testing::HasSubstr;
using testing::Not;

const std::string kInterfaceFile = "/etc/sysconfig/network-scripts/ifcfg-";  // and its name
constexpr char kGuestInfo[] = "/etc/hostapd/hostapd-wlan0-guest.info";
constexpr char kModelInfo[] = "/etc.defaults/taviinfo.conf";
constexpr char kJoined[] = "/var/run/hostapd-wlan0.conf";
constexpr char kGuestService[] = "/etc/dhcpd/dhcpd-gbr-gbr.info";
constexpr char kGuestConf[] = "/etc/dhcpd/dhcpd-gbr-gbr.conf";
constexpr char kLock[] = "/var/run/rc.network.lock";
constexpr char kServerPid[] = "/var/run/udhcpd-lbr0.pid";

struct NetworkProgram : testing::Test {
    void SetUp() override {
        InstallRootScripts();
        InstallScript(TAVI_SOURCE_DIR "/platform/appliance_root/hostapd", "/usr/sbin/hostapd");
        MakeInterface("wlan0", "192.168.9.9/24");
        WriteFile("/etc/hostapd/hostapd-wlan0-host.conf", "ssid=main\n");
        WriteFile("/etc/hostapd/hostapd-wlan0-guest.conf", "bss=gwlan\nbssid=\n");
        WriteFile(kModelInfo, "support_pci_wifi=yes\n");
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

// How many programs of this name run. One that starts a program has a child of its own name for a
// moment, so two looks have to agree.
int Running(const std::string& name) {
    int before = -1;
    int now = -1;
    Eventually([&] {
        before = now;
        now = std::stoi(RunProgram({"pgrep", "--count", "--exact", name}).out);
        return now == before;
    });
    return now;
}

// The server's own files are made of what was written by hand, whatever lay there.
TEST_F(NetworkProgram, AccessPointHasItsGuestsWhileThatIsSwitchedOn) {
    SaveLocalBridge();
    WriteFile(kInterfaceFile + "gbr", "IPADDR=10.1.15.1\nNETMASK=255.255.255.0\n");
    const std::string service =
        "enable=yes\nlease=3600\ninterface=gbr\nbridge=gbr\nnetmask=255.255.255.0\n";
    WriteFile(kGuestService, service + "start=10.1.15.50\nend=10.1.15.59\n");
    WriteFile(kGuestConf, "nonsense\n");
    const std::pair<const char*, const char*> kRows[] = {
        {kGuestInfo, "enable=yes\n"}, {kGuestInfo, "enable=no\n"}, {kModelInfo, "\n"}};
    for (const auto& [file, text] : kRows) {
        WriteFile(kGuestInfo, "enable=yes\n");
        WriteFile(file, text);
        ASSERT_EQ(Restart("lbr0"), "");
        const bool hasGuests = std::string(text) == "enable=yes\n";
        EXPECT_EQ(Exists("/sys/class/net/gbr"), hasGuests) << text;
        EXPECT_EQ(ReadFile(kJoined), hasGuests ? "ssid=main\nbss=gwlan\n" : "ssid=main\n");
        EXPECT_EQ(FileMode(kJoined), 0600);
        EXPECT_EQ(VEXACProcAliveByPidFile("/var/run/udhcpd-gbr.pid"), hasGuests ? 1 : 0);
    }
    EXPECT_THAT(ReadFile(kGuestConf), HasSubstr("start 10.1.15.50\n"));
    WriteFile(kModelInfo, "support_pci_wifi=yes\n");
    WriteFile(kGuestService, service + "start=10.1.15.60\nend=10.1.15.59\n");
    EXPECT_EQ(Restart("lbr0"),
              "rc.network: the DHCP server on gbr cannot be run with the settings in " +
                  std::string(kGuestService) + "\n");
}

// What another tool gave eth0: addresses and routes of which no file of ours knows.
constexpr char kForeign[] =
    "ip address add 10.9.0.6/16 dev eth0 valid_lft 4000 preferred_lft 4000; ip address add "
    "fd00::5/64 dev eth0 nodad;"
    "ip route add default via 10.9.0.1 dev eth0 metric 100;"
    "ip route add 10.99.0.0/24 via 10.9.0.2 dev eth0; ip route add 10.98.0.0/24 dev eth0";
std::string WhatItHas(const std::string& interface) {
    const std::string dev = " dev " + interface;
    return Ip("-oneline address show scope global" + dev +
              " | sed 's/.*inet/inet/;s/ brd.*//;s/ scope.*//'") +
           Ip("route show scope global" + dev) + Ip("route show 10.98.0.0/24" + dev);
}

TEST_F(NetworkProgram, AddressesAndRoutesOfAnotherToolMoveAndComeBack) {
    const struct {
        const char *bridge, *eth0, *off;
    } kRows[] = {
        {"PRIMARY=eth0\n", nullptr, nullptr},  // nothing but the access point needs it
        {"TYPE=Bridge\n", "BRIDGE=br0\n", "ONBOOT=no\n"},
        {"PRIMARY=eth0\nIPADDR=10.8.0.1\nNETMASK=255.255.255.0\n", nullptr, "ONBOOT=no\n"},
    };
    for (const auto& row : kRows) {
        SCOPED_TRACE(row.bridge);
        SwitchAccessPoint("yes");
        MakeInterface("eth0", "10.9.0.5/16");
        Shell(kForeign);
        const std::string all = WhatItHas("eth0");
        if (row.eth0 != nullptr) {
            WriteFile(kInterfaceFile + "eth0", row.eth0);
        }
        WriteFile(kInterfaceFile + "wlan0", "BRIDGE=br0\n");
        WriteFile(kInterfaceFile + "br0", std::string("ONBOOT=yes\n") + row.bridge);
        for (int i = 0; i < 2; ++i) {
            ASSERT_EQ(Restart("br0"), "");
            EXPECT_EQ(WhatItHas("eth0"), "");
            for (const char* part : {"10.9.0.5/16", "10.9.0.6/16", "fd00::5/64",
                                     "default via 10.9.0.1 metric 100", "10.99.0.0/24", "10.98"}) {
                EXPECT_THAT(WhatItHas("br0"), HasSubstr(part));
            }
            EXPECT_THAT(Ip("link show master br0"), HasSubstr("wlan0"));
            EXPECT_THAT(Ip("address show br0"), Not(HasSubstr("dynamic")));
            EXPECT_EQ(ReadFile("/sys/class/net/br0/address"),
                      ReadFile("/sys/class/net/eth0/address"));
        }
        WriteFile(kInterfaceFile + "wlan0", "");
        if (row.off != nullptr) {
            WriteFile(kInterfaceFile + "br0", row.off);
        }
        SwitchAccessPoint(row.off == nullptr ? "no" : "yes");
        ASSERT_EQ(Restart("br0"), "");
        EXPECT_EQ(WhatItHas("eth0"), all);
        EXPECT_FALSE(Exists("/sys/class/net/br0"));
        EXPECT_THAT(Ip("link show wlan0"), Not(HasSubstr("master")));
        Ip("link delete eth0");
        Shell("rm -r /etc/sysconfig");
    }
}

TEST_F(NetworkProgram, PortsGetTheirOwnBackWhileOthersStay) {
    MakeInterface("eth0", "10.9.0.5/16");
    MakeInterface("eth1", "10.8.0.5/16");
    Ip("route add default via 10.8.0.1");
    Ip("link add br0 type bridge");
    MakeInterface("eth2", "10.7.0.5/16");
    Ip("link set eth2 master br0");  // by somebody else
    WriteFile(kInterfaceFile + "br0", "ONBOOT=yes\nPRIMARY=eth0\n");
    WriteFile(kInterfaceFile + "eth1", "BRIDGE=br0\n");
    ASSERT_EQ(Restart("br0"), "");
    EXPECT_THAT(WhatItHas("br0"), HasSubstr("default via 10.8.0.1"));
    remove((kInterfaceFile + "eth1").c_str());
    ASSERT_EQ(Restart("br0"), "");
    EXPECT_EQ(WhatItHas("eth1"), "inet 10.8.0.5/16\ndefault via 10.8.0.1 \n");
    EXPECT_THAT(WhatItHas("br0"), HasSubstr("10.9.0.5/16"));
    EXPECT_THAT(Ip("link show master br0"), HasSubstr("eth2"));
    WriteFile(kInterfaceFile + "br1", "ONBOOT=yes\nPRIMARY=eth0\n");
    ASSERT_EQ(Restart("br1"), "");
    EXPECT_EQ(WhatItHas("br1"), "inet 10.9.0.5/16\n");
    WriteFile(kInterfaceFile + "br1", "ONBOOT=no\n");
    ASSERT_EQ(Restart("br1"), "");
    EXPECT_EQ(WhatItHas("eth0"), "inet 10.9.0.5/16\n");
}

TEST_F(NetworkProgram, ConfiguredGatewayIsUsedWhereverItStands) {
    MakeInterface("eth0", "10.9.0.5/16");
    WriteFile("/etc/sysconfig/network", "GATEWAY=10.9.0.1\n");
    WriteFile(kInterfaceFile + "eth0", "ONBOOT=yes\nIPADDR=10.9.0.5\nNETMASK=255.255.0.0\n");
    WriteFile(kInterfaceFile + "br0", "PRIMARY=eth0\nONBOOT=yes\n");
    for (const char* gateway : {"10.9.0.1", "10.9.0.2"}) {
        WriteFile("/etc/sysconfig/network", "GATEWAY=" + std::string(gateway) + "\n");
        ASSERT_EQ(Restart("br0"), "");
        EXPECT_EQ(Ip("route show default"), "default via " + std::string(gateway) + " dev br0 \n");
    }
    // A default route that another connection has set meanwhile stays in force.
    Ip("route delete default");
    MakeInterface("ppp0", "10.64.0.5/24");
    Ip("route add default via 10.64.0.1");
    ASSERT_EQ(Restart("br0"), "");
    EXPECT_EQ(Ip("route show default"), "default via 10.64.0.1 dev ppp0 \n");
}

// The lease is of a real server at the far end of the cable, by the real client.
TEST_F(NetworkProgram, LeaseOfTheWiredInterfaceBecomesTheBridges) {
    // The server asks 10 ms long, not 2 s, whether somebody else has the address.
    Shell(
        "mkdir /tmp/real && mv /usr/sbin/udhcpd /tmp/real/ && "
        "printf '#!/bin/sh\\nexec /tmp/real/udhcpd -a 10 \"$@\"\\n' >/usr/sbin/udhcpd && "
        "chmod 755 /usr/sbin/udhcpd");
    MakeInterface("eth0", "10.9.0.5/16");
    Ip("address add 10.9.0.1/16 dev eth0-far");
    Ip("route add default via 10.9.0.7 dev eth0 metric 100");
    WriteFile("/etc/far.conf",
              "interface eth0-far\nstart 10.9.0.20\nend 10.9.0.20\noption subnet 255.255.0.0\n"
              "option router 10.9.0.1\npidfile /var/run/far.pid\nlease_file /var/run/far.leases\n");
    Process server({"udhcpd", "-f", "/etc/far.conf"});
    WriteFile(kInterfaceFile + "eth0", "BOOTPROTO=dhcp\nONBOOT=yes\n");
    WriteFile(kInterfaceFile + "br0", "PRIMARY=eth0\nONBOOT=yes\n");
    ASSERT_EQ(Restart("br0"), "");
    EXPECT_EQ(WhatItHas("br0"), "inet 10.9.0.20/16\ndefault via 10.9.0.1 metric 100 \n");
    const pid_t client = VEXACReadPidFile("/etc/dhcpc/dhcpcd-br0.pid");
    ASSERT_EQ(Restart("br0"), "");
    EXPECT_EQ(kill(client, 0), 0);  // with its lease
    EXPECT_THAT(WhatItHas("br0"), HasSubstr("10.9.0.20/16"));
    WriteFile(kInterfaceFile + "br0", "PRIMARY=eth0\nONBOOT=no\n");
    ASSERT_EQ(Restart("br0"), "");
    EXPECT_NE(kill(client, 0), 0);
    EXPECT_EQ(WhatItHas("eth0"), "inet 10.9.0.20/16\ndefault via 10.9.0.1 metric 100 \n");
    EXPECT_EQ(Running("udhcpc"), 1);
}

// A client takes all addresses away before it asks. Here nobody answers.
TEST_F(NetworkProgram, BridgeWithoutALeaseKeepsWhatItsInterfaceHad) {
    WriteProgram("/usr/sbin/udhcpc",
                 "#!/bin/sh\nif [ \"$1\" = stay ]; then while :; do sleep 0.1; done; fi\n"
                 "ip -4 address flush dev br0; \"$0\" stay >/dev/null 2>&1 &\n"
                 "echo $! >/etc/dhcpc/dhcpcd-br0.pid\n");
    MakeInterface("eth0", "10.9.0.5/16");
    Shell(kForeign);
    const std::string all = WhatItHas("eth0");
    WriteFile(kInterfaceFile + "br0", "PRIMARY=eth0\nONBOOT=yes\nBOOTPROTO=dhcp\n");
    ASSERT_EQ(Restart("br0"), "");
    EXPECT_EQ(WhatItHas("br0"), all);
    EXPECT_EQ(Running("udhcpc"), 1);
    WriteFile(kInterfaceFile + "br0", "PRIMARY=eth0\nONBOOT=no\n");
    ASSERT_EQ(Restart("br0"), "");
    EXPECT_EQ(WhatItHas("eth0"), all);
    EXPECT_EQ(Running("udhcpc"), 0);
}

// Whatever step fails, addresses, routes, members and programs are as they were.
TEST_F(NetworkProgram, FailurePutsBackWhatWas) {
    const struct {
        const char *fault, *repair, *sentence;
    } kRows[] = {
        {"echo bad >>/etc/hostapd/hostapd-wlan0-host.conf",
         "echo ssid=main >/etc/hostapd/hostapd-wlan0-host.conf",
         "no radio\nrc.network: cannot start hostapd on wlan0; its messages above say why\n"},
        {"sed -i s/^start=.*/start=x/ /etc/dhcpd/dhcpd-br0-br0.info", "true",
         "rc.network: the DHCP server on br0 cannot be run with the settings in "
         "/etc/dhcpd/dhcpd-br0-br0.info\n"},
        {"mkdir /var/run/rc.network-br0.origins", "rmdir /var/run/rc.network-br0.origins",
         "rc.network: cannot write /var/run/rc.network-br0.origins\n"},
    };
    Shell("sed -i '2i grep -qs bad \"$4\" && { echo no radio; exit 1; }' /usr/sbin/hostapd");
    SaveLocalBridge();
    ASSERT_EQ(Restart("lbr0"), "");
    MakeInterface("eth0", "10.9.0.5/16");
    Shell(kForeign);
    const TAVINetDhcpServer server = {1,     30,    600, "10.9.0.20", "10.9.0.30",
                                      "br0", "br0", "",  "",          "255.255.0.0"};
    WriteFile(kInterfaceFile + "br0", "ONBOOT=yes\nPRIMARY=eth0\n");
    WriteFile(kInterfaceFile + "wlan0", "BRIDGE=br0\n");
    const std::string all = WhatItHas("eth0");
    const std::string local = WhatItHas("lbr0");
    for (const auto& row : kRows) {
        SCOPED_TRACE(row.sentence);
        ASSERT_EQ(TAVINetSetDhcpServerConfigFiles(&server, 1), 1);
        Shell(row.fault);
        EXPECT_EQ(Restart("br0"), row.sentence);
        Shell(row.repair);
        EXPECT_EQ(WhatItHas("eth0"), all);
        EXPECT_EQ(WhatItHas("lbr0"), local);
        EXPECT_THAT(Ip("address show eth0"), HasSubstr("dynamic"));
        EXPECT_THAT(Ip("link show master lbr0"), HasSubstr("wlan0"));
        EXPECT_FALSE(Exists("/sys/class/net/br0"));
        EXPECT_EQ(VEXACProcAliveByPidFile(kServerPid), 1);
        EXPECT_EQ(Running("udhcpd"), 1);
        EXPECT_EQ(ReadFile(kJoined), "ssid=main\n");
    }
    EXPECT_EQ(Running("hostapd"), 1);
}

TEST_F(NetworkProgram, WhatIsNoBridgeOrWouldCutOffIsRefused) {
    Ip("link add br9 type bridge; ip address add 10.9.0.5/16 dev br9; ip link set br9 up;"
       "ip route add default via 10.9.0.1 metric 5");
    MakeInterface("eth3", "10.7.0.5/16");
    Ip("link add br8 type bridge; ip link set eth3 master br8");
    WriteFile(kInterfaceFile + "br6", "ONBOOT=yes\nPRIMARY=eth3\n");
    WriteFile(kInterfaceFile + "br7", "ONBOOT=yes\nPRIMARY=br7\n");
    const std::pair<const char*, const char*> kRows[] = {
        {"-x", "\"-x\" is not a bridge's name"},
        {"a-name-that-is-too-long", "\"a-name-that-is-too-long\" is not a bridge's name"},
        {"gbr", "gbr is the guests' bridge; give the main network another"},
        {"wlan0", "wlan0 is an interface of its own and not a bridge"},
        {"br6", "eth3 is a port of br8, which would be cut off"},
        {"br7", "br7 cannot be a bridge around itself"},
        {"br9",
         "this would cut the machine off: no interface would be left for the route default "
         "via 10.9.0.1 metric 5 on br9"},
    };
    SwitchAccessPoint("yes");
    for (const auto& [bridge, sentence] : kRows) {
        EXPECT_EQ(Restart(bridge), "rc.network: " + std::string(sentence) + "\n");
    }
    EXPECT_EQ(Running("hostapd"), 0);
    EXPECT_EQ(WhatItHas("br9"), "inet 10.9.0.5/16\ndefault via 10.9.0.1 metric 5 \n");
    EXPECT_EQ(RunProgram({"/etc/rc.network", "restart", "wlan0"}).status, 2);
}

TEST_F(NetworkProgram, DryRunPrintsThePlanAndChangesNothing) {
    MakeInterface("eth0", "10.9.0.5/16");
    Ip("route add default via 10.9.0.1 metric 100");
    WriteFile(kInterfaceFile + "br0", "ONBOOT=yes\nPRIMARY=eth0\n");
    WriteFile(kInterfaceFile + "wlan0", "BRIDGE=br0\n");
    SwitchAccessPoint("yes");
    // The kernel notices some time after the interface came up that it has a carrier.
    constexpr char kAllOfIt[] =
        "-4 -oneline address; ip route | sed 's/ linkdown//'; ls /sys/class/net";
    const std::string before = Ip(kAllOfIt);
    const RunResult plan = RunProgram({"/etc/rc.network", "--dry-run", "restart", "wlan0", "br0"});
    EXPECT_EQ(plan.out,
              "bridge     br0                              is made\n"
              "interface  eth0                             joins br0\n"
              "interface  wlan0                            joins br0\n"
              "address    10.9.0.5/16                      moves from eth0 to br0\n"
              "address    192.168.9.9/24                   is taken from wlan0\n"
              "route      default via 10.9.0.1 metric 100  moves from eth0 to br0\n"
              "program    hostapd                          is started anew on wlan0\n"
              "program    udhcpd                           is not to run on br0\n"
              "program    udhcpd                           is not to run on gbr\n")
        << plan.err;
    // Before the settings say so.
    SwitchAccessPoint("no");
    Shell("rm -r /etc/sysconfig");
    const auto enable = [](const char* bridge, const char* member, const char* address) {
        return RunProgram({"/etc/rc.network", "--dry-run", "enable", "wlan0", bridge, "no", member,
                           address, *address != '\0' ? "yes" : "no"});
    };
    EXPECT_EQ(enable("br0", "eth0", "").out, plan.out);
    EXPECT_THAT(enable("lbr0", "", "10.1.14.1/24").out,
                testing::AllOf(HasSubstr("10.1.14.1/24    is given to lbr0\n"),
                               HasSubstr("udhcpd          is started anew on lbr0\n")));
    EXPECT_EQ(enable("eth0", "eth0", "").status, 1);
    EXPECT_EQ(Ip(kAllOfIt), before);
    EXPECT_FALSE(Exists("/var/run/rc.network.lock"));
}

TEST_F(NetworkProgram, RestartsWaitForEachOtherAndNobodyElse) {
    SaveLocalBridge();
    const std::string three = "for n in 1 2 3; do /etc/rc.network restart wlan0 lbr0 & done; wait;";
    EXPECT_EQ(RunProgram({"sh", "-c", three + three + three}).err, "");
    EXPECT_EQ(Running("hostapd") + Running("udhcpd"), 2);
    EXPECT_EQ(FileMode(kLock), 0600);
    const UniqueFd lock(open(kLock, O_RDWR | O_CLOEXEC));
    ASSERT_EQ(flock(lock.Get(), LOCK_EX | LOCK_NB), 0);  // no program that runs has it
    WriteFile(kLock, "4711");
    Process waiting({"sh", "-c", "exec /etc/rc.network restart wlan0 lbr0 2>&1"});
    while (ReadFile("/proc/locks").find("->") == std::string::npos) {
        usleep(1000);
    }
    waiting.Signal(SIGALRM);  // as after a minute
    EXPECT_EQ(waiting.ReadLine(),
              "rc.network: the network is being restarted by process 4711, which does not come to "
              "an end; try again");
    EXPECT_EQ(waiting.Wait(), 1);
    chmod(kLock, 0644);
    EXPECT_EQ(Restart("lbr0"),
              "rc.network: others can open " + std::string(kLock) + "; remove it\n");
}

}  // namespace
}  // namespace taviwireless::test
