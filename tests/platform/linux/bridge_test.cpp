// SPDX-License-Identifier: MIT
// Bridges: what the saved settings say of them, who is in one, and its DHCP service.
#include <gmock/gmock.h>
#include <tavicore/error.h>
#include <tavicore/file.h>
#include <tavicore/keyvalue.h>
#include <tavisdk/bridge.h>
#include <unistd.h>

#include <cstring>
#include <functional>
#include <utility>

#include "common/sz_list.h"
#include "tests/platform/veth.h"
#include "tests/support/descriptors.h"
#include "tests/support/files.h"

namespace taviwireless::test {
namespace {

const std::string kInterfaceFile = "/etc/sysconfig/network-scripts/ifcfg-";  // and its name
const std::string kFile = kInterfaceFile + "lbr0";

// "COUNT NAME NAME"
std::string Members(const char* bridge) {
    SzList list(0);
    std::string text = std::to_string(VEXANetBridgeSlaveEnum(bridge, list.Address()));
    for (int i = 0; i < list.Count(); ++i) {
        text += std::string(" ") + list[i];
    }
    return text;
}

// "KIND MEMBER LOCAL ADDRESS NETMASK"
std::string Config(const char* bridge) {
    TAVINetBridge config;
    TAVINetBridgeMember member;
    if (TAVINetGetBridgeConfig(bridge, &config, &member) != 0) {
        return "none";
    }
    EXPECT_STREQ(config.name, bridge);
    return std::to_string(member.kind) + ' ' + member.interface + ' ' +
           std::to_string(config.isLocal) + ' ' + config.address + ' ' + config.netmask;
}

TEST(BridgeConfig, IsReadAsItWasWritten) {
    EXPECT_EQ(Config("lbr0"), "none");
    EXPECT_EQ(VEXACErrGet(), VEXAC_ERR_NOT_FOUND);
    const TAVINetBridge local = {1, "lbr0", "10.1.14.1", "255.255.255.0"};
    const TAVINetBridgeMember radio = {TAVI_NET_MEMBER_WIRELESS, "wlan0"};
    EXPECT_EQ(TAVINetSetBridgeConfig(&local, &radio), 0);
    EXPECT_EQ(ReadFile(kFile),
              "DEVICE=lbr0\nTYPE=Bridge\nONBOOT=yes\nPRIMARY=wlan0\nLOCAL_LAN=yes\n"
              "BOOTPROTO=static\nIPADDR=10.1.14.1\nNETMASK=255.255.255.0\n");
    EXPECT_EQ(Config("lbr0"), "3 wlan0 1 10.1.14.1 255.255.255.0");
    const TAVINetBridge wired = {0, "br0", "", ""};
    const TAVINetBridgeMember card = {TAVI_NET_MEMBER_WIRED, "eth0"};
    EXPECT_EQ(TAVINetSetBridgeConfig(&wired, &card), 0);
    EXPECT_EQ(Config("br0"), "2 eth0 0  ");
    // Another first member does not make it another kind of bridge.
    EXPECT_EQ(VEXACFileSetKeyValue(kFile.c_str(), "PRIMARY", "eth1", "%s=%s\n"), 1);
    EXPECT_EQ(Config("lbr0"), "3 eth1 1 10.1.14.1 255.255.255.0");
}

TEST(BridgeConfig, OfAnotherHandIsJudgedByItsFirstMember) {
    const struct {
        const char *file, *bridgeOfRadio, *config;
    } kRows[] = {
        {"PRIMARY=wlan0\nIPADDR=\"10.1.14.1\"\n", "", "3 wlan0 1 10.1.14.1 "},
        {"PRIMARY=eth0\n", "", "2 eth0 0  "},
        {"ONBOOT=no\n", "lbr0", "none"},
        {"IPADDR=10.1.14.1\n", "br0", "2  0 10.1.14.1 "},
        {"LOCAL_LAN=no\nPRIMARY=wlan0\n", "", "2 wlan0 0  "},
    };
    for (const auto& row : kRows) {
        WriteFile(kFile, row.file);
        WriteFile(kInterfaceFile + "wlan0", std::string("BRIDGE=") + row.bridgeOfRadio + "\n");
        EXPECT_EQ(Config("lbr0"), row.config) << row.file;
    }
}

// As on a disk with errors: what is there must not be made anew because it cannot be read now.
TEST(Settings, ThatCannotBeReadAreNotMissing) {
    TAVINetDhcpServer server;
    char gateway[TAVI_NET_ADDRESS_SIZE];
    MakeDirectories("/etc/sysconfig/network-scripts");
    MakeDirectories("/etc/dhcpd");
    WriteFile(kInterfaceFile + "eth7", "GATEWAY=10.7.0.1\n");
    const std::string dhcp = "/etc/dhcpd/dhcpd-lbr0-lbr0.info";
    const std::pair<std::string, std::function<int()>> kRows[] = {
        {kFile, [] { return Config("lbr0") == "none" ? -1 : 0; }},
        {kInterfaceFile + "eth8", [] { return Members("lbr0") == "-1" ? -1 : 0; }},
        {dhcp, [&] { return TAVINetGetDhcpServerConf("lbr0", "lbr0", &server); }},
        {"/etc/sysconfig/network",
         [&] { return TAVINetDefaultGatewayGetConf(gateway, sizeof gateway); }},
    };
    for (const auto& [file, read] : kRows) {
        ASSERT_EQ(symlink(file.c_str(), file.c_str()), 0);
        EXPECT_EQ(read(), -1) << file;
        EXPECT_EQ(VEXACErrGet(), VEXAC_ERR_IO) << file;
        ASSERT_EQ(unlink(file.c_str()), 0);
    }
}

TEST(BridgeMembers, AreSavedOnesUntilThereIsABridge) {
    EXPECT_EQ(Members("lbr0"), "-1");  // nothing is saved at all
    WriteFile(kInterfaceFile + "eth7", "BRIDGE=lbr0\n");
    WriteFile(kInterfaceFile + "wlan0", "BRIDGE=\"lbr0\"\n");
    WriteFile(kInterfaceFile + "eth8", "BRIDGE=lbr00\n");
    EXPECT_EQ(Members("lbr0"), "2 eth7 wlan0");
    EXPECT_EQ(Members("br0"), "0");
    Ip("link add lbr0 type bridge");
    Ip("link add eth8 type veth peer name eth9");
    const auto before = OpenDescriptors();
    EXPECT_EQ(Members("lbr0"), "0");
    Ip("link set eth8 master lbr0");
    EXPECT_EQ(Members("lbr0"), "1 eth8");
    EXPECT_EQ(OpenDescriptors(), before);
    EXPECT_EQ(Members("../lbr0"), "-1");
}

constexpr char kInfo[] = "/etc/dhcpd/dhcpd-lbr0-lbr0.info";
constexpr char kManual[] = "/etc/dhcpd/dhcpd-lbr0-lbr0.info.manual";
constexpr char kConf[] = "/etc/dhcpd/dhcpd-lbr0-lbr0.conf";

const TAVINetDhcpServer kServer = {1,      30,     86400,       "10.1.14.2", "10.1.14.254",
                                   "lbr0", "lbr0", "10.1.14.1", "10.1.14.1", "255.255.255.0"};

TEST(DhcpServer, PutAsideKeepsItsSettingsUntilThereAreOthersInForce) {
    TAVINetSetDhcpServerConfigFiles(&kServer, 1);
    VEXACSysRename(kInfo, kManual);
    TAVINetDhcpServer server;
    EXPECT_EQ(TAVINetGetDhcpServerConf("lbr0", "lbr0", &server), 0);
    EXPECT_STREQ(server.rangeEnd, "10.1.14.254");
    // It comes back by a rename alone, so its configuration stays.
    remove(kConf);
    EXPECT_EQ(TAVINetSetDhcpServerConfigFiles(&server, 0), 1);
    EXPECT_TRUE(Exists(kConf));
    EXPECT_FALSE(Exists(kInfo));
    strcpy(server.rangeStart, "10.1.14.100");
    EXPECT_EQ(TAVINetSetDhcpServerConfigFiles(&server, 1), 1);
    EXPECT_THAT(ReadFile(kConf), testing::HasSubstr("start 10.1.14.100\n"));
}

TEST(DhcpServer, BadSettingsOfOneBridgeDoNotKeepAnotherFromService) {
    const std::string kRows[] = {"interface=abr0\nbridge=abr0\nstart=$(reboot)\n", "",
                                 "interface=lbr0\nbridge=lbr0\n"};
    for (const std::string& bad : kRows) {
        WriteFile("/etc/dhcpd/dhcpd-abr0-abr0.info", bad);
        WriteFile("/etc/dhcpd/dhcpd-abr0-abr0.conf", "of better settings\n");
        EXPECT_EQ(TAVINetSetDhcpServerConfigFiles(&kServer, 1), 1);
        EXPECT_THAT(ReadFile(kConf), testing::HasSubstr("interface lbr0\n"));
        EXPECT_FALSE(Exists("/etc/dhcpd/dhcpd-abr0-abr0.conf")) << bad;
    }
    // Nor has a file a word in another bridge's service.
    WriteFile("/etc/dhcpd/dhcpd-zbr0-zbr0.info", "end=10.1.14.3\n" + ReadFile(kInfo));
    EXPECT_EQ(TAVINetSetDhcpServerConfigFiles(&kServer, 0), 1);
    EXPECT_THAT(ReadFile(kConf), testing::HasSubstr("end 10.1.14.254\n"));
}

}  // namespace
}  // namespace taviwireless::test
