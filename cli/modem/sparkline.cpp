// SPDX-License-Identifier: MIT
#include "cli/modem/sparkline.h"

#include <algorithm>

#include "cli/level.h"

namespace taviwireless::cli {

namespace {

constexpr size_t kLength = 16;  // values

}  // namespace

void Trend::Add(int percent) {
    values_.push_back(std::clamp(percent, 0, 100));
    if (values_.size() > kLength) {
        values_.erase(values_.begin());
    }
}

std::string Trend::Draw() const {
    std::string line;
    for (const int value : values_) {
        line += Level(value);
    }
    return line;
}

}  // namespace taviwireless::cli
