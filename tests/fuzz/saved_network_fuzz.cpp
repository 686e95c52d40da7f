// SPDX-License-Identifier: MIT
// Saving a network in a store of any kind: it reads back, and is one more only if it is new; or it is
// refused for a line break.
#include <taviwireless/wireless.h>
#include <unistd.h>

#include <cstring>

#include "base/fixed_field.h"
#include "tests/fuzz/fuzz.h"
#include "tests/support/files.h"
#include "wireless/system/queue.h"

namespace taviwireless::fuzz {
namespace {

constexpr char kStore[] = "/usr/tavi/etc/wireless.conf";

int Count() {
    wireless::OwnedList<WirelessConf> confs;
    TAVIWirelessConfEnum(confs.Head());
    int count = 0;
    for (const WirelessConf& conf : confs) {
        count += conf.accessTime > INT32_MIN ? 1 : 0;
    }
    return count;
}

}  // namespace

void Fuzz(Input input) {
    constexpr int kModes[] = {0, 1, 2, 3, 4, 6, 7}, kEncrypts[] = {0, 1, 2, 4, 8, 12};
    WirelessConf conf{}, saved{};
    std::string texts;
    conf.network.auth = static_cast<int>(input.Choice(9));
    conf.network.encrypt = kEncrypts[input.Choice(6)];
    conf.network.opmode = kModes[input.Choice(7)];
    conf.network.bssid[5] = static_cast<unsigned char>(input.Choice(256));
    const auto take = [&](auto& field) {
        CopyField(field, input.Text());
        texts += field;
    };
    take(conf.network.essid);
    take(conf.key);
    take(conf.ipAddr);
    take(conf.netmask);
    take(conf.gateway);
    const bool hasUser = conf.network.auth >= WIRELESS_AUTH_WPA_EAP;
    hasUser ? take(conf.user) : void();
    char section[18];
    TAVIWirelessBssidStringGet(conf.network.bssid, section, sizeof section);
    test::WriteFile(kStore, input.Rest());
    const bool isNewFile = input.Rest().empty() && unlink(kStore) == 0;
    const bool wasSaved = TAVIWirelessConfGet(section, &saved) == 0;
    const int before = Count();
    const bool isSaved = TAVIWirelessConfSet(&conf) == 0;
    const std::string text = test::ReadFile(kStore);
    if (!isSaved) {
        Demand((texts + text).find_first_of("\r\n") != texts.npos, "it is saved", texts);
        Demand(text == input.Rest(), "or nothing changes", text);
        return;
    }
    Demand(!isNewFile || test::FileMode(kStore) == 0600, "others cannot read it");
    Demand(Count() == before + (wasSaved ? 0 : 1), "it is one network", text);
    if (!hasUser) {
        CopyField(conf.user, saved.user);  // is kept
    }
    Demand(TAVIWirelessConfGet(section, &saved) == 0, "it is found", text);
    conf.accessTime = saved.accessTime;
    Demand(memcmp(&conf, &saved, sizeof conf) == 0, "it reads back", text);
}

}  // namespace taviwireless::fuzz
