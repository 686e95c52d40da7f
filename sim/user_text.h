// SPDX-License-Identifier: MIT
#ifndef TAVIWIRELESS_SIM_USER_TEXT_H
#define TAVIWIRELESS_SIM_USER_TEXT_H

#include <string>

// What a person writes, on the command line and in control commands.
namespace taviwireless::sim {

// A decimal number. Throws std::invalid_argument with a sentence that calls it `name`.
unsigned ParseNumber(const std::string& text, const std::string& name);

}  // namespace taviwireless::sim

#endif
