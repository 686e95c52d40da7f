// SPDX-License-Identifier: MIT
#ifndef TAVIWIRELESS_BASE_INTERFACE_NAME_H
#define TAVIWIRELESS_BASE_INTERFACE_NAME_H

#include <string_view>

namespace taviwireless {

// Whether the text is a name that a network interface can have here: 1 to 15 letters, digits, "_",
// "." and "-", beginning with a letter or a digit. The kernel takes more; but names become parts of
// paths, of settings files and of other programs' arguments, where "..", "#" or "--help" mean
// something else.
inline bool IsInterfaceName(std::string_view text) {
    constexpr size_t kLongest = 15;
    constexpr std::string_view kAllowed =
        "ABCDEFGHIJKLMNOPQRSTUVWXYZabcdefghijklmnopqrstuvwxyz0123456789_.-";
    constexpr std::string_view kNotFirst = "_.-";
    return !text.empty() && text.size() <= kLongest &&
           text.find_first_not_of(kAllowed) == text.npos && kNotFirst.find(text[0]) == text.npos;
}

}  // namespace taviwireless

#endif
