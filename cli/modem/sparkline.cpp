#include "cli/modem/sparkline.h"

#include <algorithm>
#include <iterator>

namespace taviwireless::cli {

namespace {

constexpr size_t kLength = 16;  // values
constexpr const char* kBlocks[] = {"▁", "▂", "▃", "▄", "▅", "▆", "▇", "█"};
constexpr const char* kASCII[] = {"_", ".", ":", "-", "=", "+", "*", "#"};

}  // namespace

void Trend::Add(int percent) {
    values_.push_back(std::clamp(percent, 0, 100));
    if (values_.size() > kLength) {
        values_.erase(values_.begin());
    }
}

std::string Trend::Draw(bool isUTF8) const {
    constexpr int kLevels = std::size(kBlocks);
    std::string line;
    for (const int value : values_) {
        const int level = std::min(value * kLevels / 100, kLevels - 1);
        line += isUTF8 ? kBlocks[level] : kASCII[level];
    }
    return line;
}

}  // namespace taviwireless::cli
