// Interfaces and the default route, on veth pairs in a network of the test's own.
#include <gmock/gmock.h>
#include <tavicore/error.h>
#include <tavisdk/network.h>

#include "tests/platform/veth.h"
#include "tests/support/descriptors.h"
#include "tests/support/files.h"

namespace taviwireless::test {
namespace {

std::string Gateway() {
    char gateway[TAVI_NET_ADDRESS_SIZE] = "unchanged";
    return TAVINetDefaultGatewayGet(gateway, sizeof gateway) == 0 ? gateway : "none";
}

TEST(Interface, GivesItsLocalAddress) {
    MakeInterface("eth7", "10.7.0.2/24");
    MakeInterface("ppp7", "10.64.64.64 peer 10.64.64.65");
    Ip("link add bare7 type veth peer name bare7-far");
    const struct {
        const char* name;
        int result;
        const char* address;
    } kRows[] = {{"eth7", 1, "10.7.0.2"},
                 {"ppp7", 1, "10.64.64.64"},
                 {"bare7", 0, ""},
                 {"none7", 0, ""},
                 {"", 0, ""},
                 {"a-name-longer-than-any-interface", 0, ""}};
    const auto before = OpenDescriptors();
    for (const auto& row : kRows) {
        SCOPED_TRACE(row.name);
        TAVINetIFInfo info{"unchanged"};
        EXPECT_EQ(TAVINetIFGetInfo(row.name, &info), row.result);
        EXPECT_STREQ(info.address, row.address);
    }
    EXPECT_EQ(TAVINetIFGetInfo(nullptr, nullptr), -1);
    EXPECT_EQ(OpenDescriptors(), before);
}

TEST(DefaultGateway, IsThatOfTheLowestMetric) {
    MakeInterface("eth7", "10.7.0.2/24");
    EXPECT_EQ(Gateway(), "none");
    EXPECT_EQ(VEXACErrGet(), VEXAC_ERR_NOT_FOUND);
    Ip("route add default via 10.7.0.9 metric 200");
    EXPECT_EQ(Gateway(), "10.7.0.9");
    Ip("route add default via 10.7.0.1 metric 100");
    EXPECT_EQ(Gateway(), "10.7.0.1");
    Ip("route add default via 10.7.0.3 table 77");
    Ip("route add unreachable default metric 5");
    EXPECT_EQ(Gateway(), "10.7.0.1");
    MakeInterface("ppp7", "10.64.64.64 peer 10.64.64.65");
    Ip("route add default dev ppp7");  // needs no gateway: the other end is it
    EXPECT_EQ(Gateway(), "10.64.64.65");
    char tooSmall[8];
    EXPECT_EQ(TAVINetDefaultGatewayGet(tooSmall, sizeof tooSmall), -1);
    EXPECT_EQ(VEXACErrGet(), VEXAC_ERR_TOO_LONG);
}

TEST(DefaultGateway, IsReplacedInItsPlace) {
    MakeInterface("eth7", "10.7.0.2/24");
    EXPECT_EQ(TAVINetDefaultGatewaySet("10.7.0.1"), 0);
    EXPECT_EQ(Ip("route show default"), "default via 10.7.0.1 dev eth7 \n");
    Ip("route delete default");
    Ip("route add default via 10.7.0.1 metric 100");
    EXPECT_EQ(TAVINetDefaultGatewaySet("10.7.0.9"), 0);
    EXPECT_EQ(Ip("route show default"), "default via 10.7.0.9 dev eth7 metric 100 \n");
}

TEST(DefaultGateway, ThatCannotBeSetLeavesTheOldOne) {
    MakeInterface("eth7", "10.7.0.2/24");
    Ip("route add default via 10.7.0.1");
    for (const char* gateway : {"192.168.99.1", "10.7.0", "10.7.0.1/24", "fe80::1", "host", ""}) {
        EXPECT_EQ(TAVINetDefaultGatewaySet(gateway), -1) << gateway;
    }
    EXPECT_EQ(TAVINetDefaultGatewaySet(nullptr), -1);
    EXPECT_EQ(Gateway(), "10.7.0.1");
}

TEST(DefaultGateway, IsReadFromTheSavedSettings) {
    char gateway[TAVI_NET_ADDRESS_SIZE];
    EXPECT_EQ(TAVINetDefaultGatewayGetConf(gateway, sizeof gateway), -1);
    const std::string scripts = "/etc/sysconfig/network-scripts/";
    WriteFile(scripts + "ifcfg-eth0", "ONBOOT=no\nGATEWAY=10.0.0.1\n");
    WriteFile(scripts + "ifcfg-eth1", "DEVICE=eth1\n");
    WriteFile(scripts + "ifcfg-eth2", "ONBOOT=\"yes\"\nGATEWAY=\"10.0.0.3\"\n");
    EXPECT_EQ(TAVINetDefaultGatewayGetConf(gateway, sizeof gateway), 0);
    EXPECT_STREQ(gateway, "10.0.0.3");
    WriteFile("/etc/sysconfig/network", "NETWORKING=yes\nGATEWAY=10.0.0.4\n");
    EXPECT_EQ(TAVINetDefaultGatewayGetConf(gateway, sizeof gateway), 0);
    EXPECT_STREQ(gateway, "10.0.0.4");
}

}  // namespace
}  // namespace taviwireless::test
