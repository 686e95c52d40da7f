// SPDX-License-Identifier: MIT
#include "cli/ap/dry_run.h"

#include <cstdio>
#include <cstring>

#include "cli/command_error.h"
#include "wireless/rules/bridge_names.h"
#include "wireless/rules/paths.h"
#include "wireless/system/bridge.h"
#include "wireless/system/shell.h"

namespace taviwireless::cli {

namespace {

// Whether there will be a DHCP server: a server that its owner has switched off stays off.
bool ServesLeases(const char* bridge) {
    TAVINetDhcpServer server;
    return TAVINetGetDhcpServerConf(bridge, bridge, &server) < 0 || server.enabled != 0;
}

const char* YesNo(bool value) {
    return value ? "yes" : "no";
}

}  // namespace

std::vector<std::string> PlanOfEnabling(const WirelessAPConf& conf) {
    const char* interface = TAVIWirelessAPInterfaceGet();
    const auto stored = wireless::StoredBridge(conf.bridge);
    const wireless::Bridge bridge = stored.value_or(wireless::NewBridge(interface, conf.bridge));
    const bool isLocal = bridge.config.isLocal != 0;
    // What a bridge that is still to be made gets; the access point is a member of any.
    const std::string member = stored || isLocal ? "" : bridge.member.interface;
    const std::string address =
        stored || !isLocal ? "" : std::string(bridge.config.address) + wireless::kLocalPrefix;
    wireless::Pipe output(wireless::Command(
        512,
        {wireless::kNetworkScript, " --dry-run enable ", interface, " ",
         wireless::Argument{conf.bridge}, " ", YesNo(conf.guestEnabled != 0), " '", member.c_str(),
         "' '", address.c_str(), "' ", YesNo(isLocal && ServesLeases(conf.bridge)), " 2>&1"}));
    std::vector<std::string> lines;
    char line[512];
    while (output && fgets(line, sizeof line, output.get()) != nullptr) {
        line[strcspn(line, "\n")] = '\0';
        lines.emplace_back(line);
    }
    if (output.Close() != 0) {
        throw CommandError(
            kFailure,
            "the access point cannot be switched on: " +
                (lines.empty() ? wireless::kNetworkScript + std::string(" fails") : lines.back()));
    }
    return lines;
}

}  // namespace taviwireless::cli
