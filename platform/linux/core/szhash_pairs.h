// SPDX-License-Identifier: MIT
#ifndef TAVIWIRELESS_PLATFORM_LINUX_CORE_SZHASH_PAIRS_H
#define TAVIWIRELESS_PLATFORM_LINUX_CORE_SZHASH_PAIRS_H

#include <tavicore/szhash.h>

#include <deque>
#include <string>
#include <string_view>
#include <unordered_map>

struct VEXACSzHash {
    struct Pair {
        std::string key;
        std::string value;
    };
    std::deque<Pair> pairs;  // in the order in which keys were first set; a deque never moves them
    std::unordered_map<std::string_view, Pair*> byKey;
};

namespace tavicore {

// As VEXACSzHashSetValue; throws when there is no memory.
void SetPair(VEXACSzHash& hash, std::string_view key, std::string_view value);

}  // namespace tavicore

#endif
