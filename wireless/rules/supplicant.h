// SPDX-License-Identifier: MIT
#ifndef TAVIWIRELESS_WIRELESS_RULES_SUPPLICANT_H
#define TAVIWIRELESS_WIRELESS_RULES_SUPPLICANT_H

#include <taviwireless/wireless.h>

#include <string>

namespace taviwireless::wireless {

constexpr char kTerminateSupplicant[] = "/usr/sbin/wpa_cli terminate > /dev/null 2>&1";

struct SupplicantConf {
    std::string text;
    bool isWepKeyLeftOut = false;  // because no WEP key has its length
    bool isAuthUnknown = false;    // the text ends before what would depend on it
    // A value in the text holds a line break; what follows it would be a setting of its own.
    bool holdsLineBreak = false;
};

// Whether the supplicant takes a part of the text, as it stands in quotes, for a comment: one that
// holds a "#" behind one quote, or behind three. There are forms of other digits for such texts, but
// this system writes none of them.
bool IsCutBySupplicant(const std::string& text);

// What wpa_supplicant is given to join the network of conf.
SupplicantConf RenderSupplicantConf(const WirelessConf& conf);

}  // namespace taviwireless::wireless

#endif
