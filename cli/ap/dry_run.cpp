#include "cli/ap/dry_run.h"

#include <tavisdk/bridge.h>

#include <cstdio>
#include <cstring>
#include <memory>
#include <sstream>

#include "cli/command_line.h"

namespace taviwireless::cli {

namespace {

// The bridge as it is stored, or as the library makes one.
struct Bridge {
    bool isLocal;
    std::string member, address;  // of one that is not stored
};

Bridge BridgeOf(const char* name) {
    TAVINetBridge config;
    TAVINetBridgeMember member;
    if (TAVINetGetBridgeConfig(name, &config, &member) >= 0) {
        return {config.isLocal != 0, "", ""};
    }
    if (strcmp(name, "lbr0") == 0) {
        return {true, "", "10.1.14.1/24"};
    }
    return {false, "eth0", ""};
}

// Whether there will be a DHCP server: a server that its owner has switched off stays off.
bool ServesLeases(const char* bridge) {
    TAVINetDhcpServer server;
    return TAVINetGetDhcpServerConf(bridge, bridge, &server) < 0 || server.enabled != 0;
}

// The text as one word for the shell.
std::string Quoted(std::string text) {
    for (size_t place = 0; (place = text.find('\'', place)) != text.npos; place += 4) {
        text.replace(place, 1, "'\\''");
    }
    return " '" + text + '\'';
}

std::string YesNo(bool value) {
    return value ? "yes" : "no";
}

}  // namespace

std::vector<std::string> PlanOfEnabling(const WirelessAPConf& conf) {
    const Bridge bridge = BridgeOf(conf.bridge);
    std::string command = "/etc/rc.network --dry-run enable";
    for (const std::string& word :
         {std::string(TAVIWirelessAPInterfaceGet()), std::string(conf.bridge),
          YesNo(conf.guestEnabled != 0), bridge.member, bridge.address,
          YesNo(bridge.isLocal && ServesLeases(conf.bridge))}) {
        command += Quoted(word);
    }
    FILE* output = popen((command + " 2>&1").c_str(), "r");
    if (output == nullptr) {
        throw CommandError(kFailure, "cannot run /etc/rc.network");
    }
    std::vector<std::string> lines;
    char line[512];
    while (fgets(line, sizeof line, output) != nullptr) {
        line[strcspn(line, "\n")] = '\0';
        lines.emplace_back(line);
    }
    if (pclose(output) != 0) {
        throw CommandError(kFailure, "the access point cannot be switched on: " +
                                         (lines.empty() ? "/etc/rc.network fails" : lines.back()));
    }
    return lines;
}

}  // namespace taviwireless::cli
