// SPDX-License-Identifier: MIT
#ifndef TAVIWIRELESS_CLI_LEVEL_H
#define TAVIWIRELESS_CLI_LEVEL_H

#include <algorithm>
#include <string>

#include "cli/terminal.h"

namespace taviwireless::cli {

// One column that shows a percentage by its height, or by its ink where there are no letters beyond
// ASCII; a blank for 0.
inline std::string Level(int percent) {
    constexpr int kLevels = 8;
    constexpr const char* kBlocks[] = {" ", "▁", "▂", "▃", "▄", "▅", "▆", "▇", "█"};
    constexpr char kInk[] = " .:-=+*%#";
    const int level = (std::clamp(percent, 0, 100) * kLevels + 99) / 100;
    return ShowsUTF8() ? kBlocks[level] : std::string(1, kInk[level]);
}

}  // namespace taviwireless::cli

#endif
