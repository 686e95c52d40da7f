// SPDX-License-Identifier: MIT
#ifndef TAVIWIRELESS_BASE_JOIN_H
#define TAVIWIRELESS_BASE_JOIN_H

#include <string>
#include <string_view>

namespace taviwireless {

// Adds an item to a list such as "wpa, wpa2".
inline void AddItem(std::string& list, std::string_view item, std::string_view separator = ", ") {
    if (!list.empty()) {
        list += separator;
    }
    list += item;
}

}  // namespace taviwireless

#endif
