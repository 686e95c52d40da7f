#include "sim/user_text.h"

#include <sstream>
#include <stdexcept>

namespace taviwireless::sim {

std::vector<std::string> Split(const std::string& text, char separator) {
    std::vector<std::string> parts;
    std::istringstream stream(text);
    for (std::string part; std::getline(stream, part, separator);) {
        parts.push_back(part);
    }
    return parts;
}

unsigned ParseNumber(const std::string& text, const std::string& name) {
    if (text.empty() || text.size() > 6 ||
        text.find_first_not_of("0123456789") != std::string::npos) {
        throw std::invalid_argument(name + " is a number up to 999999, not '" + text + "'");
    }
    return static_cast<unsigned>(std::stoul(text));
}

}  // namespace taviwireless::sim
