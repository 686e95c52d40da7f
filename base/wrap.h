// SPDX-License-Identifier: MIT
#ifndef TAVIWIRELESS_BASE_WRAP_H
#define TAVIWIRELESS_BASE_WRAP_H

#include <string>
#include <vector>

#include "base/split.h"

namespace taviwireless {

inline size_t Bytes(const std::string& text) {
    return text.size();
}

// The text in lines of at most these columns, broken at blanks; a word that is longer has a line of
// its own. `width` tells how many columns a word takes.
inline std::vector<std::string> Wrap(const std::string& text, size_t columns,
                                     size_t (*width)(const std::string&) = Bytes) {
    std::vector<std::string> lines = {""};
    for (const std::string& word : Split(text, ' ')) {
        std::string& line = lines.back();
        if (line.empty()) {
            line = word;
        } else if (width(line) + 1 + width(word) <= columns) {
            line += ' ' + word;
        } else {
            lines.push_back(word);
        }
    }
    return lines;
}

}  // namespace taviwireless

#endif
