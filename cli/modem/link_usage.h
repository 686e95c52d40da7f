// SPDX-License-Identifier: MIT
#ifndef TAVIWIRELESS_CLI_MODEM_LINK_USAGE_H
#define TAVIWIRELESS_CLI_MODEM_LINK_USAGE_H

#include <cstdint>
#include <ctime>
#include <optional>
#include <string>

#include "cli/report.h"

namespace taviwireless::cli {

// What went over the interface of a connection since it was dialled.
struct LinkUsage {
    std::optional<std::uint64_t> sent;  // bytes
    std::optional<std::uint64_t> received;
    std::optional<time_t> since;
};

// Of the modem's connection over this interface; nothing is known without one. Asks no modem.
LinkUsage UsageOf(const std::string& id, const std::string& interface);

// "1.5 MB", "-" when it is not known.
std::string BytesCell(const std::optional<std::uint64_t>& bytes);
std::string TimeCell(const std::optional<time_t>& time);
template <typename Number>
Json::Value NumberOrNull(const std::optional<Number>& number) {
    return number ? Json::Value(static_cast<Json::UInt64>(*number)) : Json::Value();
}

}  // namespace taviwireless::cli

#endif
