// SPDX-License-Identifier: MIT
// Leases, from a real DHCP server at the other end of a veth pair, by the real client.
#include <gmock/gmock.h>
#include <tavicore/process.h>
#include <tavisdk/network.h>

#include "tests/platform/veth.h"
#include "tests/support/files.h"

namespace taviwireless::test {
namespace {

constexpr char kPidFile[] = "/etc/dhcpc/dhcpcd-eth7.pid";
constexpr char kLease[] = "/etc/dhcpc/dhcpcd-eth7.info";

void InstallLeaseScript() {
    WriteProgram("/usr/tavi/bin/dhcp-lease",
                 ReadFile(TAVI_SOURCE_DIR "/platform/host_root/dhcp-lease"));
}

// A server that knows one address, 10.7.0.20.
void StartServer(const std::string& router) {
    Ip("address add 10.7.0.1/24 dev eth7-far");
    WriteFile("/tmp/leases", "");
    WriteFile("/tmp/server.conf",
              "interface eth7-far\nstart 10.7.0.20\nend 10.7.0.20\nlease_file /tmp/leases\n"
              "pidfile /tmp/server.pid\noption subnet 255.255.255.128\noption dns 10.7.0.8\n" +
                  router);
    // Asks 10 ms long whether somebody else has the address.
    ASSERT_EQ(RunProgram({"udhcpd", "-a", "10", "/tmp/server.conf"}).status, 0);
}

struct Dhcp : testing::Test {
    void SetUp() override {
        InstallLeaseScript();
        std::filesystem::remove("/etc/resolv.conf");  // somebody else's, where this is not root
        MakeInterface("eth7", "192.168.9.9/24");
    }
    TAVINetCard card_ = {"eth7", 1, "1.2.3.4", "255.0.0.0"};
};

TEST_F(Dhcp, LeaseIsTakenAndKept) {
    StartServer("option router 10.7.0.1\n");
    EXPECT_EQ(BlTAVILnxIsDHCP("eth7"), 0);
    ASSERT_EQ(TAVIIGetDHCPTestNetInfo(&card_), 0);
    EXPECT_STREQ(card_.address, "10.7.0.20");
    EXPECT_STREQ(card_.netmask, "255.255.255.128");
    EXPECT_EQ(card_.isStatic, 0);
    EXPECT_EQ(ReadFile(kLease),
              "IPADDR=\"10.7.0.20\"\nNETMASK=\"255.255.255.128\"\nGATEWAY=\"10.7.0.1\"\n");
    EXPECT_EQ(ReadFile("/etc/resolv.conf"), "nameserver 10.7.0.8\n");
    EXPECT_EQ(BlTAVILnxIsDHCP("eth7"), 1);
    EXPECT_EQ(BlTAVILnxIsDHCP("eth7-far"), 0);

    const pid_t client = VEXACReadPidFile(kPidFile);
    const std::string pidFile = ReadFile(kPidFile);
    WriteFile(kPidFile, std::to_string(getpid()) + pidFile.substr(pidFile.find('\n')));
    EXPECT_EQ(VEXACReadPidFile(kPidFile), 0);  // after a restart, another program's number
    WriteFile(kPidFile, pidFile);
    EXPECT_EQ(TAVINetSetCard1(&card_, 0), 0);
    EXPECT_THAT(Ip("address show eth7"), testing::HasSubstr("10.7.0.20/25"));
    EXPECT_EQ(VEXACReadPidFile(kPidFile), client);
    ASSERT_EQ(TAVIIGetDHCPTestNetInfo(&card_), 0);  // in place of the first one
    EXPECT_NE(kill(client, 0), 0);
    EXPECT_EQ(BlTAVILnxIsDHCP("eth7"), 1);

    card_ = {"eth7", 1, "10.9.0.5", "255.255.0.0"};
    EXPECT_EQ(TAVINetSetCard1(&card_, 0), 0);
    EXPECT_EQ(BlTAVILnxIsDHCP("eth7"), 0);
    EXPECT_FALSE(Exists(kPidFile));
}

TEST_F(Dhcp, LeaseMayLackAGateway) {
    StartServer("");
    EXPECT_EQ(TAVIIGetDHCPTestNetInfo(&card_), 0);
    EXPECT_EQ(ReadFile(kLease), "IPADDR=\"10.7.0.20\"\nNETMASK=\"255.255.255.128\"\n");
}

TEST_F(Dhcp, ProgramThatGotTheClientsNumberIsSpared) {
    Process other({"sleep", "60"});
    WriteFile(kPidFile, std::to_string(other.Pid()) + "\n");
    EXPECT_EQ(BlTAVILnxIsDHCP("eth7"), 0);
    const TAVINetCard card = {"eth7", 1, "10.9.0.5", "255.255.0.0"};
    EXPECT_EQ(TAVINetSetCard1(&card, 0), 0);
    EXPECT_EQ(other.Wait(Process::Milliseconds(50)), std::nullopt);  // it runs on
}

}  // namespace
}  // namespace taviwireless::test
