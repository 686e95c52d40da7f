// SPDX-License-Identifier: MIT
#ifndef TAVIWIRELESS_BASE_SPLIT_H
#define TAVIWIRELESS_BASE_SPLIT_H

#include <string>
#include <vector>

namespace taviwireless {

// The parts of text, each ended by the separator or by the end of the text: "a,b" and "a,b," have
// two parts, the empty text has none.
inline std::vector<std::string> Split(const std::string& text, char separator) {
    std::vector<std::string> parts;
    for (size_t begin = 0; begin < text.size(); begin += parts.back().size() + 1) {
        parts.push_back(text.substr(begin, text.find(separator, begin) - begin));
    }
    return parts;
}

inline std::vector<std::string> Lines(const std::string& text) {
    return Split(text, '\n');
}

}  // namespace taviwireless

#endif
