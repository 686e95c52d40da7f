// SPDX-License-Identifier: MIT
#include "sim/user_text.h"

#include <stdexcept>

namespace taviwireless::sim {

unsigned ParseNumber(const std::string& text, const std::string& name) {
    if (text.empty() || text.size() > 6 ||
        text.find_first_not_of("0123456789") != std::string::npos) {
        throw std::invalid_argument(name + " is a number up to 999999, not '" + text + "'");
    }
    return static_cast<unsigned>(std::stoul(text));
}

}  // namespace taviwireless::sim
