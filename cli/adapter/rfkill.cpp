// SPDX-License-Identifier: MIT
#include "cli/adapter/rfkill.h"

#include <filesystem>
#include <fstream>
#include <string>
#include <vector>

#include "cli/adapter/requirements.h"

namespace taviwireless::cli {

namespace {

std::vector<std::filesystem::path> Switches() {
    std::vector<std::filesystem::path> found;
    std::error_code none;
    const std::string radio = "/sys/class/net/" + WifiInterface() + "/phy80211";
    for (const auto& entry : std::filesystem::directory_iterator(radio, none)) {
        if (entry.path().filename().string().rfind("rfkill", 0) == 0) {
            found.push_back(entry.path());
        }
    }
    return found;
}

bool IsBlocked(const std::filesystem::path& file) {
    std::ifstream stream(file);
    int isBlocked = 0;
    return stream >> isBlocked && isBlocked != 0;
}

}  // namespace

RadioSwitch LookAtRadioSwitch() {
    RadioSwitch state = RadioSwitch::kNone;
    for (const auto& one : Switches()) {
        if (IsBlocked(one / "hard")) {
            return RadioSwitch::kOffHard;
        }
        state = IsBlocked(one / "soft") || state == RadioSwitch::kOff ? RadioSwitch::kOff
                                                                      : RadioSwitch::kOn;
    }
    return state;
}

bool SetRadioSwitch(bool isOn) {
    bool isSet = true;
    for (const auto& one : Switches()) {
        std::ofstream stream(one / "soft");
        stream << (isOn ? 0 : 1);
        isSet = stream.flush() && isSet;
    }
    return isSet;
}

}  // namespace taviwireless::cli
