// SPDX-License-Identifier: MIT
// A table of any kind, as a scan reads it: each network is one line's, and reads the same when it is
// printed again.
#include <algorithm>
#include <cstring>

#include "tests/fuzz/fuzz.h"
#include "tests/fuzz/played_tool.h"
#include "tests/wireless/wifi_fixture.h"

namespace taviwireless::fuzz {
namespace {

std::string Line(const WirelessNetwork& network) {
    char bssid[18];
    std::string security = TAVIWirelessAuthStringGet(network.auth) + std::string("/") +
                           TAVIWirelessEncryptStringGet(network.encrypt, 0);
    security.erase(std::remove(security.begin(), security.end(), ' '), security.end());
    return test::ScanLine(network.channel % 1000, network.essid,
                          TAVIWirelessBssidStringGet(network.bssid, bssid, sizeof bssid),
                          network.signal, TAVIWirelessProtocolStringGet(network.protocol),
                          security);
}

// The ESSID's columns of the next line, which has 511 bytes at most. Zero bytes are its end.
std::string NextEssid(std::string& rest) {
    const size_t end = std::min<size_t>(rest.find('\n'), 511);
    const std::string line = rest.substr(0, end);
    rest.erase(0, end + (end < 511 ? 1 : 0));
    std::string essid = line.substr(0, line.find('\0'));
    essid = essid.size() > 5 ? essid.substr(5, 32) : "";
    return essid.substr(0, essid.find_last_not_of(" \t\r\v\f") + 1);
}

}  // namespace

void Fuzz(Input input) {
    std::string rest = input.Rest(), again, reread;
    for (const WirelessNetwork& network : Scanned(input.Rest())) {
        const std::string essid(network.essid, strnlen(network.essid, sizeof network.essid));
        Demand(!essid.empty() && essid.size() < sizeof network.essid, "an ESSID is a text", essid);
        bool isFound = false;
        while (!isFound && !rest.empty()) {
            isFound = NextEssid(rest) == essid;
        }
        Demand(isFound, "it stands in its columns of a line of its own", essid);
        again += Line(network);
    }
    for (const WirelessNetwork& network : Scanned(again)) {
        reread += Line(network);
    }
    Demand(reread == again, "what was read is read again", again + reread);
}

}  // namespace taviwireless::fuzz
