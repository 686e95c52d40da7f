// SPDX-License-Identifier: MIT
// Interfaces going up and down, their addresses, and the default route, on veth pairs.
#include <gmock/gmock.h>
#include <tavicore/error.h>
#include <tavisdk/network.h>

#include "tests/platform/veth.h"
#include "tests/support/files.h"

namespace taviwireless::test {
namespace {

TEST(Link, FailsWithoutAnInterface) {
    EXPECT_EQ(TAVINetIsIFUp("none7"), 0);
    EXPECT_EQ(VEXANetIfUp("none7"), 0);
    EXPECT_EQ(VEXANetIfDown("a-name-longer-than-any-interface"), 0);
    EXPECT_EQ(VEXACErrGet(), VEXAC_ERR_NOT_FOUND);
    VEXANetInterfaceInfo infos[2] = {{"", 0}, {"untouched", 0}};  // the room there is, and more
    MakeInterface("eth7", "10.7.0.2/24");
    EXPECT_EQ(VEXANetGetInterfaceInfo(infos, 1, VEXA_NET_ALL_INTERFACES), 1);
    EXPECT_STREQ(infos[1].name, "untouched");
}

std::string AddressesOf(const std::string& interface) {
    return Ip("-4 -oneline address show " + interface + " | sed 's/.*inet \\(.*\\) scope.*/\\1/'");
}

TEST(Card, HasNoOtherAddressThanItsOwnAndKeepsThatWhereverItStood) {
    MakeInterface("eth7", "10.7.0.2/24");
    const struct {
        TAVINetCard card;
        const char* addresses;
    } kRows[] = {
        {{"eth7", 1, "10.9.0.5", "255.255.0.0"}, "10.9.0.5/16 brd 10.9.255.255\n"},
        {{"eth7", 1, "10.9.0.5", "255.255.255.128"}, "10.9.0.5/25 brd 10.9.0.127\n"},
        {{"eth7", 1, "10.9.0.5", "255.255.255.255"}, "10.9.0.5/32\n"},
        {{"eth7", 0, "10.9.0.6", "255.255.255.0"}, "10.9.0.6/24 brd 10.9.0.255\n"},
    };
    for (const auto& row : kRows) {
        EXPECT_EQ(TAVINetSetCard1(&row.card, 0), 0);
        EXPECT_EQ(AddressesOf("eth7"), row.addresses);
    }
    for (const char* address : {"10.7.0.2/24", "10.7.0.3/24", "10.7.0.4/24"}) {
        Ip(std::string("address add dev eth7 ") + address);
    }
    const TAVINetCard second = {"eth7", 1, "10.7.0.3", "255.255.255.0"};
    EXPECT_EQ(TAVINetSetCard1(&second, 0), 0);
    EXPECT_EQ(AddressesOf("eth7"), "10.7.0.3/24 brd 10.7.0.255\n");
}

std::string Gateway() {
    char gateway[TAVI_NET_ADDRESS_SIZE] = "unchanged";
    return TAVINetDefaultGatewayGet(gateway, sizeof gateway) == 0 ? gateway : "none";
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
    for (const char* gateway : {"192.168.99.1", "10.7.0", "10.7.0.1/24", "fe80::1", ""}) {
        EXPECT_EQ(TAVINetDefaultGatewaySet(gateway), -1) << gateway;
    }
    EXPECT_EQ(Ip("route show default"), "default via 10.7.0.9 dev eth7 metric 100 \n");
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
