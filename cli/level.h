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

// The first columns of a text, of which the last tells that there is more.
inline std::string Cut(const std::string& text, size_t columns) {
    std::string cut;
    size_t width = 0;
    for (size_t i = 0; i < text.size(); ++i) {
        const bool isStart = (static_cast<unsigned char>(text[i]) & 0xC0) != 0x80;
        width += isStart ? 1 : 0;
        if (isStart && width == columns && i + 1 < text.size()) {
            return cut + "~";
        }
        cut += text[i];
    }
    return cut;
}

}  // namespace taviwireless::cli

#endif
