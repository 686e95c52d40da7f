// SPDX-License-Identifier: MIT
#include "platform/host_root/network/hostapd.h"

#include <unistd.h>

#include "base/split.h"
#include "platform/host_root/network/error.h"
#include "platform/host_root/network/programs.h"

namespace taviwireless::network {

namespace {

constexpr char kKeyFile[] = "/etc/hostapd.psk";  // hostapd insists on it

std::string Read(const std::string& path) {
    const auto text = ReadText(path);
    if (!text) {
        throw Error("cannot read " + path);
    }
    return *text;
}

// The capabilities of 802.11n that the radio has in all of its bands, as the bits of nl80211; all
// bits where that cannot be told.
unsigned int Capabilities(const std::string& interface) {
    std::string phy = ReadText("/sys/class/net/" + interface + "/phy80211/name").value_or("");
    phy = phy.substr(0, phy.find('\n'));
    unsigned int capabilities = ~0U;
    const std::string info = phy.empty() ? "" : Run({"iw", "phy", phy, "info"}, 10).output;
    for (const std::string& line : Lines(info)) {
        unsigned int bits = 0;
        if (sscanf(line.c_str(), " Capabilities: 0x%x", &bits) == 1) {
            capabilities &= bits;
        }
    }
    return capabilities;
}

void Erase(std::string& line, const std::string& part) {
    const size_t place = line.find(part);
    if (place != std::string::npos) {
        line.erase(place, part.size());
    }
}

// hostapd refuses to start with any capability that the radio lacks in one of its bands, and hardly
// a radio has all that are asked for.
std::string WithoutMissing(std::string line, unsigned int capabilities) {
    const struct {
        unsigned int bit;
        const char* name;
    } kNames[] = {{0x0002, "[HT40+]"},       {0x0002, "[HT40-]"},
                  {0x0020, "[SHORT-GI-20]"}, {0x0040, "[SHORT-GI-40]"},
                  {0x0400, "[DELAYED-BA]"},  {0x0800, "[MAX-AMSDU-7935]"}};
    for (const auto& [bit, name] : kNames) {
        if ((capabilities & bit) == 0) {
            Erase(line, name);
        }
    }
    return line;
}

}  // namespace

void WriteHostapdConf(const std::string& interface, bool withGuests) {
    const std::string source = "/etc/hostapd/hostapd-" + interface;
    const unsigned int capabilities = Capabilities(interface);
    std::string text;
    for (const std::string& line : Lines(Read(source + "-host.conf"))) {
        text +=
            (line.rfind("ht_capab=", 0) == 0 ? WithoutMissing(line, capabilities) : line) + '\n';
    }
    for (const std::string& line : Lines(withGuests ? Read(source + "-guest.conf") : "")) {
        // Without a BSSID hostapd derives one; an empty one it refuses.
        text += line == "bssid=" ? "" : line + '\n';
    }
    if (access(kKeyFile, F_OK) != 0) {
        WriteText(kKeyFile, "");
    }
    WriteText(Hostapd(interface).conf, text);
}

}  // namespace taviwireless::network
