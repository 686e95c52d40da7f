// SPDX-License-Identifier: MIT
#include "platform/host_root/iwlist/scan_table.h"

#include <algorithm>
#include <cstdio>

#include "platform/host_root/iwlist/information_elements.h"

namespace taviwireless::iwlist {

namespace {

constexpr int kFirstOf5GHz = 4900;  // MHz
constexpr int kFirstOf6GHz = 5950;

int SignalPercent(const ScanResult& network) {
    constexpr int kWeakest = -110;  // dBm
    constexpr int kStrongest = -40;
    if (!network.signalDbm) {
        return network.signalPercent;
    }
    const int signal = std::clamp(*network.signalDbm, kWeakest, kStrongest);
    return (signal - kWeakest) * 100 / (kStrongest - kWeakest);
}

// A hidden network gives no name, or one of zero bytes.
std::string PrintableEssid(std::string essid) {
    if (essid.find_first_not_of('\0') == essid.npos) {
        return "";
    }
    std::replace_if(
        essid.begin(), essid.end(), [](unsigned char byte) { return byte < ' ' || byte == 0x7f; },
        '?');
    return essid;
}

const char* ProtocolWord(int frequency, const InformationElements& elements) {
    if (frequency >= kFirstOf6GHz) {
        return "unknown";  // nothing that the library has a name for
    }
    if (frequency >= kFirstOf5GHz) {
        return elements.hasHighThroughput ? "11a/n" : "11a";
    }
    if (elements.hasHighThroughput) {
        return "11b/g/n";
    }
    return elements.hasFastRates ? "11b/g" : "11b";
}

const char* CipherWord(int ciphers) {
    switch (ciphers) {
        case kTkip:
            return "TKIP";
        case kAes:
            return "AES";
        case kTkip | kAes:
            return "TKIPAES";
        default:
            return "UNKNOW";
    }
}

const char* AuthWord(const Protection& wpa, const Protection& rsn) {
    const bool both =
        wpa.keyManagement != kNoKeyManagement && rsn.keyManagement != kNoKeyManagement;
    if ((rsn.keyManagement & kPsk) != 0) {
        return both ? "WPA1PSKWPA2PSK" : "WPA2PSK";
    }
    if ((rsn.keyManagement & kEap) != 0) {
        return both ? "WPA1WPA2EAP" : "WPA2EAP";
    }
    if ((wpa.keyManagement & kPsk) != 0) {
        return "WPAPSK";
    }
    if ((wpa.keyManagement & kEap) != 0) {
        return "WPAEAP";
    }
    return (wpa.keyManagement & kWpaNone) != 0 ? "WPANONE" : "UNKNOW";
}

std::string SecurityWord(bool isPrivate, const InformationElements& elements) {
    const Protection& wpa = elements.wpa;
    const Protection& rsn = elements.rsn;
    if (!wpa.isOffered && !rsn.isOffered) {
        return isPrivate ? "WEP" : "NONE";
    }
    return std::string(AuthWord(wpa, rsn)) + '/' + CipherWord(wpa.ciphers | rsn.ciphers);
}

std::string BssidText(const std::array<unsigned char, 6>& bssid) {
    char text[sizeof "00:11:22:33:44:55"];
    snprintf(text, sizeof text, "%02X:%02X:%02X:%02X:%02X:%02X", bssid[0], bssid[1], bssid[2],
             bssid[3], bssid[4], bssid[5]);
    return text;
}

// channel and essid stand in their columns, whatever their length.
std::string Line(const std::string& channel, const std::string& essid, const std::string& rest) {
    char line[128];
    snprintf(line, sizeof line, "%-5.5s%-32.32s ", channel.c_str(), essid.c_str());
    return line + rest + '\n';
}

}  // namespace

int ChannelOf(int frequency) {
    if (frequency == 2484) {
        return 14;
    }
    if (frequency >= kFirstOf6GHz) {
        return (frequency - 5950) / 5;
    }
    if (frequency >= 5000) {
        return (frequency - 5000) / 5;
    }
    if (frequency >= kFirstOf5GHz) {
        return (frequency - 4000) / 5;
    }
    return frequency > 2407 ? (frequency - 2407) / 5 : 0;
}

std::string TableHeading() {
    const std::string heading = Line("CH", "ESSID", "BSSID             SIGNAL PROTOCOL SECURITY");
    return heading + std::string(heading.size() - 1, '-') + '\n';
}

std::string TableLine(const ScanResult& network) {
    const InformationElements elements = ParseInformationElements(network.elements);
    return Line(std::to_string(ChannelOf(network.frequency)), PrintableEssid(elements.essid),
                BssidText(network.bssid) + ' ' + std::to_string(SignalPercent(network)) + ' ' +
                    ProtocolWord(network.frequency, elements) + ' ' +
                    SecurityWord(network.isPrivate, elements));
}

}  // namespace taviwireless::iwlist
