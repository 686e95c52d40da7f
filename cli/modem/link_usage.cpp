// SPDX-License-Identifier: MIT
#include "cli/modem/link_usage.h"

#include <sys/stat.h>

#include <array>
#include <cstdio>
#include <fstream>

#include "usbmodem/rules/paths.h"

namespace taviwireless::cli {

namespace {

std::optional<std::uint64_t> CountOf(const std::string& interface, const char* counter) {
    std::uint64_t count = 0;
    std::ifstream file("/sys/class/net/" + interface + "/statistics/" + counter);
    return file >> count ? std::optional(count) : std::nullopt;
}

}  // namespace

LinkUsage UsageOf(const std::string& id, const std::string& interface) {
    if (interface.empty()) {
        return {};
    }
    LinkUsage usage{CountOf(interface, "tx_bytes"), CountOf(interface, "rx_bytes"), std::nullopt};
    const int number = usbmodem_lib::InterfaceIdIn(id, "usbmodem").value_or(-1);
    const std::string path = usbmodem_lib::kPidFilePrefix + std::to_string(number);
    struct stat pidFile {};
    if (stat(path.c_str(), &pidFile) == 0) {
        usage.since = pidFile.st_mtime;
    }
    return usage;
}

std::string BytesCell(const std::optional<std::uint64_t>& bytes) {
    if (!bytes) {
        return "-";
    }
    constexpr std::array kUnits = {"B", "kB", "MB", "GB", "TB"};
    auto amount = static_cast<double>(*bytes);
    size_t unit = 0;
    for (; amount >= 1000 && unit + 1 < kUnits.size(); ++unit) {
        amount /= 1000;
    }
    char text[32];
    snprintf(text, sizeof text, "%.*f %s", unit == 0 ? 0 : 1, amount, kUnits[unit]);
    return text;
}

std::string TimeCell(const std::optional<time_t>& time) {
    char text[32] = "-";
    struct tm local {};
    if (time && localtime_r(&*time, &local) != nullptr) {
        strftime(text, sizeof text, "%F %T", &local);
    }
    return text;
}

}  // namespace taviwireless::cli
