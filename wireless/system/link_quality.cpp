// SPDX-License-Identifier: MIT
#include "wireless/system/link_quality.h"

#include "wireless/system/interface.h"
#include "wireless/system/shell.h"

namespace taviwireless::wireless {

std::optional<LinkQuality> ReadLinkQuality() {
    constexpr size_t kCommandSize = 128;
    const std::string interface = WirelessInterface();
    if (interface.empty()) {
        return std::nullopt;
    }
    const Pipe pipe(
        Command(kCommandSize, {"/sbin/iwconfig ", interface.c_str(), " | grep 'Link Quality'"}));
    if (!pipe) {
        return std::nullopt;
    }
    int value = 0;
    int maximum = 0;
    const int items = fscanf(pipe.get(), " Link Quality=%d/%d", &value, &maximum);
    if (items < 1) {
        return std::nullopt;
    }
    return LinkQuality{value, items == 2 ? std::make_optional(maximum) : std::nullopt};
}

}  // namespace taviwireless::wireless
