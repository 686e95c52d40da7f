// SPDX-License-Identifier: MIT
// A beacon of any kind in the table of the host root's iwlist, as a scan reads that: it is one
// network of the name, channel, signal, protocol and protection that it tells, or none if it hides
// its name, and its neighbours stay what they are.
#include <algorithm>
#include <cctype>

#include "platform/host_root/iwlist/scan_table.h"
#include "tests/fuzz/fuzz.h"
#include "tests/fuzz/played_tool.h"

namespace taviwireless::fuzz {
namespace {

using namespace std::string_literals;
using iwlist::TableLine;

std::string Element(int number, const std::string& body) {
    return static_cast<char>(number) + (static_cast<char>(body.size()) + body);
}

// Takes the elements that are whole off the bytes. isOdd tells whether one of them is of what else
// the beacon tells.
std::string TakeWhole(std::string& bytes, bool& isOdd) {
    size_t end = 0, next = 0;
    while (end + 2 <= bytes.size() &&
           (next = end + 2 + static_cast<unsigned char>(bytes[end + 1])) <= bytes.size()) {
        isOdd = isOdd || "\x01\x2d\x30\x32\xdd"s.find(bytes[end]) != std::string::npos;
        end = next;
    }
    const std::string whole = bytes.substr(0, end);
    bytes.erase(0, end);
    return whole;
}

// WPA or WPA2, which have each their author, with a set of ciphers and a kind of key management.
// TKIP is the group's cipher, for which there is a suite, too.
std::string Protection(const std::string& author, unsigned ciphers, bool byGroup,
                       int keyManagement) {
    std::string pairwise = (ciphers & 4) != 0 ? author + (byGroup ? '\0' : '\2') : "";
    pairwise += (ciphers & 8) != 0 ? author + '\4' : "";
    return "\1\0"s + author + '\2' + static_cast<char>(pairwise.size() / 4) + '\0' + pairwise +
           "\1\0"s + author + static_cast<char>(keyManagement);
}

// The ESSID as the table has it; empty when it is hidden.
std::string Shown(std::string essid) {
    const bool isNamed = essid.find_first_not_of('\0') != essid.npos;
    for (char& byte : essid) {
        byte = iscntrl(static_cast<unsigned char>(byte)) != 0 ? '?' : byte;
    }
    essid = isNamed ? essid.substr(0, 32) : "";
    return essid.substr(0, essid.find_last_not_of(' ') + 1);
}

constexpr struct {
    int frequency, channel, slow, fast, highThroughput;  // the last three are protocols
} kChannels[] = {{2412, 1, 2, 1, 10},  {2484, 14, 2, 1, 10}, {5180, 36, 3, 3, 9},
                 {5825, 165, 3, 3, 9}, {5955, 1, 0, 0, 0},   {58320, 10474, 0, 0, 0}};

// Key management that cannot be joined, EAP, PSK and none; and what that is of WPA2 and of WPA.
constexpr int kKeyManagement[] = {8, 1, 2, 0};
constexpr int kAuths[][4] = {{0, 7, 4, 6}, {8, 8, 8, 8}, {5, 5, 5, 5}};

}  // namespace

void Fuzz(Input input) {
    std::string essid = input.Text();
    std::replace(essid.begin(), essid.end(), '\xff', '\0');
    essid.resize(std::min<size_t>(essid.size(), 255));
    const auto& channel = kChannels[input.Choice(6)];
    const int dBm = 50 - static_cast<int>(input.Choice(256));
    const bool isPrivate = input.Flag(), isFast = input.Flag(), isWide = input.Flag();
    const bool hasWpa = input.Flag(), hasRsn = input.Flag(), byGroup = input.Flag();
    const unsigned wpa = input.Choice(4), rsn = input.Choice(3), ciphers = input.Choice(4) * 4;
    bool isOdd = false;
    std::string rest = input.Rest();
    std::string elements = TakeWhole(rest, isOdd) + Element(0, essid) +
                           Element(1, isFast ? "\x6c" : "\x02") + (isWide ? Element(45, "") : "");
    if (hasRsn) {
        const int withSha256 = byGroup && rsn > 0 ? 4 : 0;
        elements += Element(
            48, Protection("\0\x0f\xac"s, ciphers, byGroup, kKeyManagement[rsn] + withSha256));
    }
    if (hasWpa) {
        const std::string author = "\0\x50\xf2"s;
        elements +=
            Element(221, author + '\1' + Protection(author, ciphers, byGroup, kKeyManagement[wpa]));
    }
    const std::string neighbour = TableLine({{}, 2412, -40, 0, false, Element(0, "near")});
    const auto networks = Scanned(
        neighbour + TableLine({{1, 2, 3}, channel.frequency, dBm, 0, isPrivate, elements + rest}) +
        neighbour);

    essid = Shown(essid);
    Demand(networks.size() == (essid.empty() ? 2 : 3), "it is one network", essid);
    for (const WirelessNetwork& network : {networks.front(), networks.back()}) {
        Demand(network.essid == "near"s && network.auth == 1, "others stay what they are", essid);
    }
    const WirelessNetwork& network = networks[1];
    if (!essid.empty()) {
        const int signal = (std::clamp(dBm, -110, -40) + 110) * 10 / 7;
        Demand(network.essid == essid && network.bssid[2] == 3, "it has its name", essid);
        Demand(network.channel == channel.channel, "it has its channel", essid);
        Demand(network.signal == signal, "it has its signal", essid);
    }
    if (!essid.empty() && !isOdd) {
        const bool isProtected = hasWpa || hasRsn;
        const int auth = isProtected ? kAuths[hasRsn ? rsn : 0][hasWpa ? wpa : 0]
                         : isPrivate ? 3
                                     : 1;
        const int encrypt = isProtected ? static_cast<int>(ciphers) : isPrivate ? 2 : 1;
        const int protocol = isWide ? channel.highThroughput : isFast ? channel.fast : channel.slow;
        Demand(network.auth == auth, "it is joined as it tells", essid);
        Demand(network.encrypt == encrypt, "it is protected as it tells", essid);
        Demand(network.protocol == protocol, "it has its protocol", essid);
    }
}

}  // namespace taviwireless::fuzz
