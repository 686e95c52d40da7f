// SPDX-License-Identifier: MIT
#include "wireless/system/bridge.h"

#include <sys/stat.h>
#include <taviwireless/wireless.h>

#include "base/fixed_field.h"
#include "base/interface_name.h"
#include "wireless/rules/bridge_names.h"

namespace taviwireless::wireless {

namespace {

bool IsThere(const std::string& path) {
    struct stat status {};
    return stat(path.c_str(), &status) == 0;
}

// Whether the name is one of an interface of another kind: of the wired one, which is a member of
// bridges, of the access point or of guests, whether these are there now or not.
bool IsTaken(const std::string& name) {
    const std::string device = "/sys/class/net/" + name;
    return name == kWiredInterface || name == kGuestBridge || name == kGuestInterface ||
           name == TAVIWirelessAPInterfaceGet() ||
           (IsThere(device) && !IsThere(device + "/bridge"));
}

}  // namespace

std::string WhyNoBridge(const std::string& name) {
    if (!IsInterfaceName(name)) {
        return "is the name of an interface, 1 to 15 letters, digits, \"_\", \".\" and \"-\", of "
               "which the first is a letter or a digit";
    }
    if (IsTaken(name)) {
        return "cannot be " + name + ", an interface that is no bridge of the main network";
    }
    return "";
}

std::optional<Bridge> StoredBridge(const char* name) {
    Bridge bridge{};
    const bool isStored = TAVINetGetBridgeConfig(name, &bridge.config, &bridge.member) >= 0;
    return isStored ? std::make_optional(bridge) : std::nullopt;
}

Bridge NewBridge(const char* interface, const char* name) {
    Bridge bridge{};
    CopyField(bridge.config.name, name);
    if (std::string(name) != kLocalBridge) {
        bridge.member.kind = TAVI_NET_MEMBER_WIRED;
        CopyField(bridge.member.interface, kWiredInterface);
        return bridge;
    }
    bridge.member.kind = TAVI_NET_MEMBER_WIRELESS;
    CopyField(bridge.member.interface, interface);
    bridge.config.isLocal = 1;
    CopyField(bridge.config.address, kLocalAddress);
    CopyField(bridge.config.netmask, kLocalNetmask);
    return bridge;
}

}  // namespace taviwireless::wireless
