// SPDX-License-Identifier: MIT
#include "platform/host_root/network/origins.h"

#include <unistd.h>

#include <sstream>

#include "base/split.h"
#include "base/trusted_file.h"
#include "platform/host_root/network/paths.h"
#include "platform/host_root/network/programs.h"

namespace taviwireless::network {

Origins ReadOrigins(const std::string& bridge) {
    Origins origins;
    for (const std::string& line : Lines(ReadTrusted(OriginsFile(bridge)).value_or(""))) {
        std::istringstream words(line);
        std::string interface, address;
        words >> interface >> address;
        origins.emplace(interface, address);
    }
    return origins;
}

void WriteOrigins(const std::string& bridge, const Origins& origins) {
    const std::string file = OriginsFile(bridge);
    if (origins.empty()) {
        unlink(file.c_str());
        return;
    }
    std::ostringstream lines;
    for (const auto& [interface, address] : origins) {
        lines << interface << ' ' << address << '\n';
    }
    ReplaceText(file, lines.str());
}

}  // namespace taviwireless::network
