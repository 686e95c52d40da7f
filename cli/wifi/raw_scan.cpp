// SPDX-License-Identifier: MIT
#include "cli/wifi/raw_scan.h"

#include <cstring>

#include "base/fixed_field.h"
#include "cli/adapter/requirements.h"
#include "wireless/system/shell.h"

namespace taviwireless::cli {

namespace {

// What stands behind the text in the line; null when the line does not hold it.
const char* Behind(const char* text, const char* line) {
    const char* place = strstr(line, text);
    return place == nullptr ? nullptr : place + strlen(text);
}

// A name that is hidden may be given as zero bytes, which the tool writes as "\x00".
std::string ReadEssid(const std::string& quoted) {
    const std::string essid = quoted.substr(0, quoted.rfind('"'));
    for (size_t i = 0; i < essid.size(); i += 4) {
        if (essid.compare(i, 4, "\\x00") != 0) {
            return essid;
        }
    }
    return "";
}

// The name of a suite of key management that is newer than WPA2; empty for others, which are rare.
const char* NewerWord(int suite) {
    switch (suite) {
        case 8:  // SAE
        case 9:
        case 24:
        case 25:
            return "WPA3";
        case 11:  // Suite B
        case 12:
        case 13:
            return "WPA3EAP";
        case 18:
            return "OWE";
        default:
            return "";
    }
}

// Reads a suite of key management, by name, or by number where the tool has no name for it.
void ReadSuites(const char* suites, bool isWpa1, RawNetwork& raw) {
    int32_t& auth = raw.network.auth;
    if (strstr(suites, "PSK") != nullptr) {
        auth = isWpa1 && auth != WIRELESS_AUTH_WPA2_PSK ? WIRELESS_AUTH_WPA_PSK
                                                        : WIRELESS_AUTH_WPA2_PSK;
    } else if (strstr(suites, "802.1x") != nullptr) {
        auth = isWpa1 && auth != WIRELESS_AUTH_WPA2_EAP ? WIRELESS_AUTH_WPA_EAP
                                                        : WIRELESS_AUTH_WPA2_EAP;
    } else if (const char* number = Behind("unknown (", suites); number != nullptr) {
        auth = WIRELESS_AUTH_UNKNOWN;
        raw.newerSecurity = NewerWord(atoi(number));
    }
}

// One line about the access point whose lines these are.
void ReadLine(const char* line, bool& isWpa1, RawNetwork& raw) {
    WirelessNetwork& network = raw.network;
    int quality = 0;
    int best = 0;
    if (const char* channel = Behind("(Channel ", line); channel != nullptr) {
        network.channel = atoi(channel);
    } else if (sscanf(line, " Channel:%d", &network.channel) == 1) {
    } else if (sscanf(line, " Quality%*1[=:]%d/%d", &quality, &best) == 2 && best > 0) {
        network.signal = quality * 100 / best;
    } else if (const char* essid = Behind("ESSID:\"", line); essid != nullptr) {
        CopyField(network.essid, ReadEssid(essid));
    } else if (strstr(line, "Encryption key:") != nullptr) {
        const bool isOn = strstr(line, ":on") != nullptr;
        network.auth = isOn ? WIRELESS_AUTH_WEP_AUTO : WIRELESS_AUTH_OPEN;
        network.encrypt = isOn ? WIRELESS_ENCRYPT_WEP : WIRELESS_ENCRYPT_NONE;
    } else if (strstr(line, "IE: ") != nullptr) {
        isWpa1 = strstr(line, "IE: WPA Version 1") != nullptr;
    } else if (const char* suites = Behind("Authentication Suites", line); suites != nullptr) {
        network.encrypt = WIRELESS_ENCRYPT_UNKNOWN;
        ReadSuites(suites, isWpa1, raw);
    }
}

}  // namespace

std::vector<RawNetwork> LastRawScan() {
    constexpr size_t kCommandSize = 128;
    const wireless::Pipe pipe(wireless::Command(
        kCommandSize,
        {"/sbin/iwlist ", wireless::Argument{WifiInterface()}, " scanning last 2> /dev/null"}));
    std::vector<RawNetwork> all;
    bool isWpa1 = false;
    char line[512];
    while (pipe && fgets(line, sizeof line, pipe.get()) != nullptr) {
        if (const char* address = Behind(" - Address: ", line); address != nullptr) {
            all.emplace_back();
            TAVIWirelessBssidParse(address, all.back().network.bssid);
        } else if (!all.empty()) {
            ReadLine(line, isWpa1, all.back());
        }
    }
    return all;
}

}  // namespace taviwireless::cli
