// SPDX-License-Identifier: MIT
#ifndef TAVIWIRELESS_WIRELESS_SYSTEM_LINK_QUALITY_H
#define TAVIWIRELESS_WIRELESS_SYSTEM_LINK_QUALITY_H

#include <optional>

namespace taviwireless::wireless {

// "Link Quality=40/70", as iwconfig prints it.
struct LinkQuality {
    int value;
    std::optional<int> maximum;
};

// Runs iwconfig. Nothing when it prints no quality.
std::optional<LinkQuality> ReadLinkQuality();

}  // namespace taviwireless::wireless

#endif
