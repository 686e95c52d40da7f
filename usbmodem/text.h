// SPDX-License-Identifier: MIT
#ifndef TAVIWIRELESS_USBMODEM_TEXT_H
#define TAVIWIRELESS_USBMODEM_TEXT_H

#include <algorithm>
#include <climits>
#include <cstdlib>
#include <string>

namespace taviwireless::usbmodem_lib {

inline bool Contains(const std::string& text, const char* part) {
    return text.find(part) != std::string::npos;
}

// As atoi, which leaves numbers beyond int undefined: those become the nearest int.
inline int ToInt(const std::string& text) {
    const long number = std::strtol(text.c_str(), nullptr, 10);
    return static_cast<int>(std::clamp<long>(number, INT_MIN, INT_MAX));
}

}  // namespace taviwireless::usbmodem_lib

#endif
