// DHCP service: its saved settings, and what the real server makes of the configuration.
#include <gmock/gmock.h>
#include <tavicore/error.h>
#include <tavicore/file.h>
#include <tavisdk/bridge.h>

#include <cstdio>
#include <cstring>

#include "tests/platform/veth.h"
#include "tests/support/files.h"

namespace taviwireless::test {
namespace {

constexpr char kInfo[] = "/etc/dhcpd/dhcpd-lbr0-lbr0.info";
constexpr char kManual[] = "/etc/dhcpd/dhcpd-lbr0-lbr0.info.manual";
constexpr char kConf[] = "/etc/dhcpd/dhcpd-lbr0-lbr0.conf";

const TAVINetDhcpServer kServer = {1,      30,     86400,       "10.1.14.2", "10.1.14.254",
                                   "lbr0", "lbr0", "10.1.14.1", "10.1.14.1", "255.255.255.0"};

TEST(DhcpServer, SettingsAreReadAsTheyWereWritten) {
    TAVINetDhcpServer server;
    EXPECT_EQ(TAVINetGetDhcpServerConf("lbr0", "lbr0", &server), -1);
    EXPECT_EQ(VEXACErrGet(), VEXAC_ERR_NOT_FOUND);
    EXPECT_EQ(TAVINetSetDhcpServerConfigFiles(&kServer, 1), 1);
    EXPECT_EQ(TAVINetGetDhcpServerConf("lbr0", "lbr0", &server), 0);
    EXPECT_EQ(memcmp(&server, &kServer, sizeof server), 0);
    EXPECT_EQ(ReadFile(kConf),
              "interface lbr0\nstart 10.1.14.2\nend 10.1.14.254\nmax_leases 253\n"
              "lease_file /etc/dhcpd/dhcpd-lbr0-lbr0.leases\npidfile /var/run/udhcpd-lbr0.pid\n"
              "option subnet 255.255.255.0\noption lease 86400\noption router 10.1.14.1\n"
              "option dns 10.1.14.1\n");
}

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

TEST(DhcpServer, RecordThatIsWrongIsNotWritten) {
    TAVINetDhcpServer bad[6] = {kServer, kServer, kServer, kServer, kServer, kServer};
    strcpy(bad[0].bridge, "../lbr0");
    strcpy(bad[1].rangeStart, "10.1.14.255");  // behind the end
    strcpy(bad[2].netmask, "");
    strcpy(bad[3].gateway, "1.2.3.4\nx");
    strcpy(bad[4].nameServer, "dns");
    bad[5].leaseTime = 0;
    for (const auto& server : bad) {
        EXPECT_EQ(TAVINetSetDhcpServerConfigFiles(&server, 1), 0);
        EXPECT_EQ(VEXACErrGet(), VEXAC_ERR_BAD_PARAMETER);
    }
    EXPECT_EQ(TAVINetSetDhcpServerConfigFiles(nullptr, 0), 0);
    EXPECT_FALSE(Exists(kInfo));
}

TEST(Subnet, IsCompared) {
    const struct {
        const char *address, *netmask;
        bool same;
    } kRows[] = {
        {"10.1.14.254", "255.255.255.0", true}, {"10.1.15.1", "255.255.255.0", false},
        {"10.1.15.1", "255.255.254.0", true},   {"11.1.14.1", "0.0.0.0", true},
        {"", "255.255.255.0", false},           {"10.1.14.2", "24", false},
    };
    for (const auto& row : kRows) {
        EXPECT_EQ(TAVINetIsSameSubnet(row.address, "10.1.14.1", row.netmask) != 0, row.same)
            << row.address << '/' << row.netmask;
    }
    EXPECT_EQ(TAVINetIsSameSubnet(nullptr, "10.1.14.1", "255.255.255.0"), 0);
}

}  // namespace
}  // namespace taviwireless::test
