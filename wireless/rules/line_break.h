// SPDX-License-Identifier: MIT
#ifndef TAVIWIRELESS_WIRELESS_RULES_LINE_BREAK_H
#define TAVIWIRELESS_WIRELESS_RULES_LINE_BREAK_H

#include <string>

namespace taviwireless::wireless {

// Whether the text cannot be the value of a line of settings. Some readers take a carriage return
// for the end of a line, others for a part of the value.
inline bool HoldsLineBreak(const std::string& text) {
    return text.find_first_of("\r\n") != text.npos;
}

}  // namespace taviwireless::wireless

#endif
