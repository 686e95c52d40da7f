// SPDX-License-Identifier: MIT
// Settings of a DHCP server, set through the SDK or written by another hand: those that are taken
// read back, and what the server is given has the lines of its kind alone.
#include <arpa/inet.h>
#include <tavisdk/bridge.h>

#include <cstring>
#include <filesystem>
#include <regex>

#include "base/fixed_field.h"
#include "base/interface_name.h"
#include "tests/fuzz/fuzz.h"
#include "tests/support/files.h"

namespace taviwireless::fuzz {
namespace {

const std::string kFiles = "/etc/dhcpd/dhcpd-br0-br0";

const std::regex kConfiguration(
    "interface br0\nstart [0-9.]+\nend [0-9.]+\nmax_leases [0-9]+\nlease_file " + kFiles +
    ".leases\npidfile /var/run/udhcpd-br0.pid\noption subnet [0-9.]+\noption lease [0-9]+\n"
    "(option router [0-9.]+\n)?(option dns [0-9.]+\n)?");

}  // namespace

void Fuzz(Input input) {
    TAVINetDhcpServer server{}, read{};
    const bool isSet = input.Flag();
    server.enabled = input.Flag() ? 1 : 0;
    server.leaseTime = static_cast<int>(input.Choice(256)) - 1;
    CopyField(server.interface, input.Text());
    CopyField(server.bridge, input.Text());
    CopyField(server.rangeStart, input.Text());
    CopyField(server.rangeEnd, input.Text());
    CopyField(server.netmask, input.Text());
    CopyField(server.gateway, input.Text());
    CopyField(server.nameServer, input.Text());
    std::filesystem::remove_all("/etc/dhcpd");
    test::WriteFile(kFiles + ".info", input.Rest());
    const bool isDone = TAVINetSetDhcpServerConfigFiles(&server, isSet ? 1 : 0) == 1;
    Demand(isDone || isSet, "files of another hand refuse nothing");
    if (isDone && isSet) {
        TAVINetGetDhcpServerConf(server.interface, server.bridge, &read);
        Demand(memcmp(&server, &read, sizeof read) == 0, "they read back", server.bridge);
        Demand(inet_network(server.rangeStart) <= inet_network(server.rangeEnd), "it is a range");
        Demand(IsInterfaceName(server.interface) && IsInterfaceName(server.bridge), "of a bridge");
    }
    if (test::Exists(kFiles + ".conf")) {
        const std::string text = test::ReadFile(kFiles + ".conf");
        Demand(std::regex_match(text, kConfiguration), "the server is given its lines alone", text);
    }
}

}  // namespace taviwireless::fuzz
