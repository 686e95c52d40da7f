// Interfaces going up and down, their links' states and their addresses.
#include <gmock/gmock.h>
#include <tavicore/error.h>
#include <tavicore/process.h>
#include <tavisdk/network.h>

#include <cstring>

#include "tests/platform/veth.h"
#include "tests/support/descriptors.h"
#include "tests/support/files.h"

namespace taviwireless::test {
namespace {

// "eth7:2 eth7-far:2", without the tunnels that some kernels put into every network.
std::string LinkStates() {
    VEXANetInterfaceInfo infos[32];
    const int count = VEXANetGetInterfaceInfo(infos, 32, VEXA_NET_ALL_INTERFACES);
    std::string states;
    for (int i = 0; i < count; ++i) {
        if (strncmp(infos[i].name, "eth", 3) == 0 || strcmp(infos[i].name, "lo") == 0) {
            states += infos[i].name + (":" + std::to_string(infos[i].linkState)) + ' ';
        }
    }
    return states;
}

TEST(Link, IsSwitchedAndTellsItsState) {
    Ip("link add eth7 type veth peer name eth7-far");
    const auto before = OpenDescriptors();
    EXPECT_EQ(TAVINetIsIFUp("eth7"), 0);
    EXPECT_EQ(VEXANetIfUp("eth7"), 1);
    EXPECT_EQ(TAVINetIsIFUp("eth7"), 1);
    EXPECT_EQ(LinkStates(), "eth7-far:0 eth7:1 ");
    EXPECT_EQ(VEXANetIfUp("eth7-far"), 1);
    EXPECT_EQ(LinkStates(), "eth7-far:2 eth7:2 ");
    EXPECT_EQ(VEXANetIfUp("eth7"), 1);  // again
    EXPECT_EQ(VEXANetIfDown("eth7"), 1);
    EXPECT_EQ(TAVINetIsIFUp("eth7"), 0);
    EXPECT_EQ(LinkStates(), "eth7-far:1 eth7:0 ");
    EXPECT_EQ(OpenDescriptors(), before);
}

TEST(Link, FailsWithoutAnInterface) {
    for (const char* name : {"none7", "", "a-name-longer-than-any-interface"}) {
        EXPECT_EQ(TAVINetIsIFUp(name), 0);
        EXPECT_EQ(VEXANetIfUp(name), 0);
        EXPECT_EQ(VEXANetIfDown(name), 0);
        EXPECT_EQ(VEXACErrGet(), VEXAC_ERR_NOT_FOUND);
    }
    EXPECT_EQ(VEXANetIfUp(nullptr), 0);
    EXPECT_EQ(VEXACErrGet(), VEXAC_ERR_BAD_PARAMETER);
}

TEST(Interfaces, AreCutOffAtTheRoomThereIs) {
    MakeInterface("eth7", "10.7.0.2/24");
    VEXANetInterfaceInfo infos[2] = {{"", 0}, {"untouched", 0}};
    EXPECT_EQ(VEXANetGetInterfaceInfo(infos, 1, VEXA_NET_ALL_INTERFACES), 1);
    EXPECT_STREQ(infos[1].name, "untouched");
    EXPECT_EQ(VEXANetGetInterfaceInfo(infos, 1, 1), -1);
    EXPECT_EQ(VEXANetGetInterfaceInfo(nullptr, 1, VEXA_NET_ALL_INTERFACES), -1);
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

TEST(Card, ThatIsWrongChangesNothing) {
    MakeInterface("eth7", "10.7.0.2/24");
    const struct {
        TAVINetCard card;
        int flags, error;
    } kRows[] = {
        {{"eth7", 1, "dhcp", "255.255.255.0"}, 0, VEXAC_ERR_BAD_PARAMETER},
        {{"eth7", 1, "", ""}, 0, VEXAC_ERR_BAD_PARAMETER},
        {{"eth7", 1, "10.9.0.5", "255.0.255.0"}, 0, VEXAC_ERR_BAD_PARAMETER},
        {{"eth7", 1, "10.9.0.5", "24"}, 0, VEXAC_ERR_BAD_PARAMETER},
        {{"eth7", 1, "10.9.0.5", "255.255.255.0"}, 1, VEXAC_ERR_BAD_PARAMETER},
        {{"none7", 1, "10.9.0.5", "255.255.255.0"}, 0, VEXAC_ERR_NOT_FOUND},
        {{"eth7", 0, "", ""}, 0, VEXAC_ERR_NOT_FOUND},  // no lease
    };
    for (const auto& row : kRows) {
        EXPECT_EQ(TAVINetSetCard1(&row.card, row.flags), -1);
        EXPECT_EQ(VEXACErrGet(), row.error);
    }
    EXPECT_EQ(TAVINetSetCard1(nullptr, 0), -1);
    EXPECT_THAT(AddressesOf("eth7"), testing::StartsWith("10.7.0.2/24"));
}

}  // namespace
}  // namespace taviwireless::test
