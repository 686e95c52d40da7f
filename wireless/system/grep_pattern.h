// SPDX-License-Identifier: MIT
#ifndef TAVIWIRELESS_WIRELESS_SYSTEM_GREP_PATTERN_H
#define TAVIWIRELESS_WIRELESS_SYSTEM_GREP_PATTERN_H

#include <string>

namespace taviwireless::wireless {

// The basic regular expression that matches exactly the text: names hold dots, too.
inline std::string GrepPattern(const std::string& text) {
    std::string pattern;
    for (const char c : text) {
        if (c != '\0' && std::string(".*[^$\\").find(c) != std::string::npos) {
            pattern += '\\';
        }
        pattern += c;
    }
    return pattern;
}

}  // namespace taviwireless::wireless

#endif
