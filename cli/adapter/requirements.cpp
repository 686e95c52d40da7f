// SPDX-License-Identifier: MIT
#include "cli/adapter/requirements.h"

#include <taviwireless/wireless.h>
#include <unistd.h>

#include <fstream>

#include "cli/adapter/rfkill.h"
#include "cli/command_error.h"
#include "cli/terminal.h"
#include "wireless/rules/paths.h"
#include "wireless/system/flag_file.h"
#include "wireless/system/interface.h"

namespace taviwireless::cli {

namespace {

void RequireProgram(const char* path, const char* package) {
    if (access(path, X_OK) != 0) {
        throw CommandError(kFailure,
                           std::string("there is no program ") + path + "; install " + package);
    }
}

constexpr char kSwitchOn[] = "taviwireless wifi radio on switches it on";

// The word as a shell is to be given it.
std::string ShellWord(const std::string& word) {
    constexpr char kHarmless[] =
        "ABCDEFGHIJKLMNOPQRSTUVWXYZabcdefghijklmnopqrstuvwxyz0123456789-_=./,:@%+";
    if (!word.empty() && word.find_first_not_of(kHarmless) == std::string::npos) {
        return word;
    }
    std::string quoted = "'";
    for (const char c : word) {
        quoted += c == '\'' ? std::string("'\\''") : std::string(1, c);
    }
    return quoted + "'";
}

}  // namespace

std::string WifiInterface() {
    return wireless::WirelessInterface();
}

void RequireWifiSupport() {
    if (TAVIWirelessIsSupported() == 0) {
        throw CommandError(kFailure, std::string("this model does not support Wi-Fi: ") +
                                         wireless::kModelInfo +
                                         " does not say support_wireless=yes");
    }
}

void RequireRoot() {
    if (geteuid() == 0) {
        return;
    }
    std::ifstream commandLine("/proc/self/cmdline");
    std::string word;
    std::getline(commandLine, word, '\0');  // however the program was called
    std::string command = "taviwireless";
    while (std::getline(commandLine, word, '\0')) {
        command += " " + ShellWord(word);
    }
    throw CommandError(kFailure, "needs root; try sudo " + Printable(command));
}

void RequireWifiSettings() {
    RequireWifiSupport();
    RequireRoot();
}

void RequireAdapter() {
    RequireWifiSettings();
    if (TAVIWirelessConnStatusGet() == WIRELESS_STATUS_NO_ADAPTER) {
        throw CommandError(kFailure, "there is no Wi-Fi adapter: no interface " + WifiInterface());
    }
}

void RequireRadio() {
    const int mayBeUsed = TAVIWirelessCheckBlock();
    if (mayBeUsed == 0) {
        throw CommandError(kFailure,
                           std::string("the radio is switched off: unblock=no is set for this "
                                       "adapter in ") +
                               wireless::kAPSettings + "; " + kSwitchOn);
    }
    if (LookAtRadioSwitch() == RadioSwitch::kOff) {
        throw CommandError(kFailure, std::string("the radio is switched off; ") + kSwitchOn);
    }
    if (LookAtRadioSwitch() == RadioSwitch::kOffHard) {
        throw CommandError(kFailure, "a switch or a key of this machine keeps the radio off");
    }
    if (mayBeUsed < 0) {
        throw CommandError(kFailure, std::string("cannot tell whether the radio may be used: ") +
                                         wireless::kAdapterInfo +
                                         " does not name the adapter, or its section in " +
                                         wireless::kAPSettings + " has no unblock");
    }
}

void RequireScanner() {
    RequireProgram("/sbin/iwlist", "wireless-tools");
}

void RequireSupplicant() {
    RequireProgram("/usr/sbin/wpa_supplicant", "wpasupplicant");
    RequireProgram("/usr/sbin/wpa_cli", "wpasupplicant");
}

void RequireNobodyJoins() {
    if (!wireless::FlagFile::IsRaised(wireless::kConnectingFlag)) {
        return;
    }
    const wireless::FlagFile lowered(wireless::kConnectingFlag);
    throw CommandError(kBusy,
                       "a network is being joined already; if that was interrupted, try again");
}

}  // namespace taviwireless::cli
