// Settings of a DHCP server, set through the SDK or written by another hand: those that are taken
// read back, and what the server is given has the lines of its kind alone.
#include <arpa/inet.h>
#include <tavisdk/bridge.h>

#include <cstring>
#include <filesystem>
#include <set>

#include "base/fixed_field.h"
#include "base/interface_name.h"
#include "base/split.h"
#include "tests/fuzz/fuzz.h"
#include "tests/support/files.h"

namespace taviwireless::fuzz {
namespace {

const std::string kFolder = "/etc/dhcpd/dhcpd-";

bool IsAddress(const std::string& text) {
    in_addr address;
    return inet_pton(AF_INET, text.c_str(), &address) == 1;
}

// Whether the server of the bridge may have the line.
bool IsAllowed(const std::string& line, const std::string& bridge) {
    const size_t blank = line.rfind(' ');
    const std::string key = line.substr(0, blank), value = line.substr(blank + 1);
    if (key == "interface") {
        return value == bridge && IsInterfaceName(value);
    }
    if (key == "lease_file" || key == "pidfile") {
        return value == kFolder + bridge + "-" + bridge + ".leases" ||
               value == "/var/run/udhcpd-" + bridge + ".pid";
    }
    if (key == "max_leases" || key == "option lease") {
        return value.find_first_not_of("0123456789") == value.npos;
    }
    const std::set<std::string> kAddresses{"start", "end", "option subnet", "option router",
                                           "option dns"};
    return IsAddress(value) && kAddresses.count(key) == 1;
}

}  // namespace

void Fuzz(Input input) {
    TAVINetDhcpServer server{}, read;
    const bool isSet = input.Flag();
    server.enabled = input.Flag() ? 1 : 0;
    server.leaseTime = static_cast<int>(input.Choice(256)) - 1;
    CopyField(server.bridge, input.Text());
    CopyField(server.interface, server.bridge);
    CopyField(server.rangeStart, input.Text());
    CopyField(server.rangeEnd, input.Text());
    CopyField(server.netmask, input.Text());
    CopyField(server.gateway, input.Text());
    CopyField(server.nameServer, input.Text());
    std::filesystem::remove_all("/etc/dhcpd");
    test::WriteFile(kFolder + "br0-br0.info", input.Rest());
    const bool isDone = TAVINetSetDhcpServerConfigFiles(&server, isSet ? 1 : 0) == 1;
    Demand(isDone || isSet, "files of another hand refuse nothing");
    const std::string bridge = isSet ? server.bridge : "br0";
    if (isDone && isSet) {
        TAVINetGetDhcpServerConf(server.bridge, server.bridge, &read);
        Demand(memcmp(&server, &read, sizeof read) == 0, "they read back", bridge);
    }
    const std::string file = kFolder + bridge + "-" + bridge + ".conf";
    const std::string text =
        IsInterfaceName(bridge) && test::Exists(file) ? test::ReadFile(file) : "";
    Demand(!text.empty() || !isDone || !isSet, "the server is configured", bridge);
    for (const std::string& line : Lines(text)) {
        Demand(IsAllowed(line, bridge), "no other line is given", text);
    }
}

}  // namespace taviwireless::fuzz
