// SPDX-License-Identifier: MIT
#include "cli/ap/hostapd.h"

#include <net/if.h>
#include <tavicore/keyvalue.h>

#include <algorithm>
#include <cstdio>
#include <cstring>
#include <fstream>
#include <iterator>

#include "wireless/rules/paths.h"
#include "wireless/system/guest_network.h"
#include "wireless/system/shell.h"

namespace taviwireless::cli {

namespace {

bool Holds(const ConfFile& file) {
    std::ifstream text(file.path);
    return text && std::string(std::istreambuf_iterator<char>(text), {}) == file.conf.Text();
}

bool GuestsAreAsStored(const WirelessAPConf& conf, const std::string& interface) {
    return !wireless::OffersGuestNetwork() ||
           VEXACFileCheckKeyValue(wireless::HostapdGuestInfo(interface).c_str(), "enable",
                                  conf.guestEnabled != 0 ? "yes" : "no", 0) == 1;
}

}  // namespace

std::vector<ConfFile> RenderConfFiles(const WirelessAPConf& conf) {
    const std::string interface = TAVIWirelessAPInterfaceGet();
    std::vector<ConfFile> files{
        {wireless::HostapdHostConf(interface), wireless::RenderHostConf(interface, conf)}};
    if (wireless::OffersGuestNetwork() && conf.guestEnabled != 0) {
        files.push_back({wireless::HostapdGuestConf(interface), wireless::RenderGuestConf(conf)});
    }
    return files;
}

std::vector<std::string> AskHostapd(const std::string& interface, const char* question) {
    const wireless::Pipe answer(
        wireless::Command(256, {"hostapd_cli -p ", wireless::kHostapdSockets, " -i ",
                                wireless::Argument{interface}, " ", question, " 2> /dev/null"}));
    std::vector<std::string> lines;
    char line[512];
    while (answer && fgets(line, sizeof line, answer.get()) != nullptr) {
        line[strcspn(line, "\n")] = '\0';
        lines.emplace_back(line);
    }
    return lines;
}

bool ServesHostapd(const std::string& interface) {
    const std::vector<std::string> answer = AskHostapd(interface, "ping");
    return !answer.empty() && answer.back() == "PONG";
}

bool IsServed(const WirelessAPConf& conf) {
    const std::string interface = TAVIWirelessAPInterfaceGet();
    if (TAVIWirelessOpmodeGet() != WIRELESS_OPMODE_MASTER || if_nametoindex(conf.bridge) == 0 ||
        !ServesHostapd(interface)) {
        return false;
    }
    const std::vector<ConfFile> files = RenderConfFiles(conf);
    return std::all_of(files.begin(), files.end(), Holds) && GuestsAreAsStored(conf, interface);
}

}  // namespace taviwireless::cli
