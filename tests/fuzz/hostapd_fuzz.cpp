// What hostapd is given, read again by its own rules: two networks with the values that the
// settings have, and nothing else; or it is said that a line break stands in it.
#include <cstring>
#include <map>

#include "base/fixed_field.h"
#include "base/split.h"
#include "tests/fuzz/fuzz.h"
#include "wireless/rules/hostapd_conf.h"

namespace taviwireless::fuzz {
namespace {

using Values = std::map<std::string, std::string>;

// The values, by keys that tell which network's they are; "bss" begins the second one.
Values Read(const std::string& text) {
    Values values;
    std::string network;
    for (const std::string& line : Lines(text)) {
        const size_t equals = line.find('=');
        network += line.substr(0, equals) == "bss" ? "guests' " : "";
        const bool isNew =
            values.emplace(network + line.substr(0, equals), line.substr(equals + 1)).second;
        Demand(isNew && line[0] != '#', "a key has one value", text);
    }
    return values;
}

// Fills in a text, and `tame` with a harmless one of its length, of the next letter.
template <size_t kSize>
void Take(Input& input, char (&text)[kSize], char (&tame)[kSize], Values& texts) {
    CopyField(text, input.Text());
    const std::string harmless(strlen(text), static_cast<char>('A' + texts.size()));
    CopyField(tame, harmless);
    texts[harmless] = text;
}

void Take(Input& input, int32_t security, WirelessAPSecret& secret, WirelessAPSecret& tame,
          Values& texts) {
    if (security == WIRELESS_AP_WEP) {
        Take(input, secret.wepKey, tame.wepKey, texts);
    } else if (security == WIRELESS_AP_WPA) {
        Take(input, secret.wpa.passphrase, tame.wpa.passphrase, texts);
    } else if (security == WIRELESS_AP_WPA_ENTERPRISE) {
        Take(input, secret.enterprise.radiusAddr, tame.enterprise.radiusAddr, texts);
        Take(input, secret.enterprise.radiusSecret, tame.enterprise.radiusSecret, texts);
    }
}

}  // namespace

void Fuzz(Input input) {
    WirelessAPConf conf{};
    conf.security = static_cast<int>(input.Choice(5));
    conf.guestSecurity = static_cast<int>(input.Choice(5));
    WirelessAPConf tame = conf;
    Values texts;
    Take(input, conf.ssid, tame.ssid, texts);
    Take(input, conf.bridge, tame.bridge, texts);
    Take(input, conf.guestSsid, tame.guestSsid, texts);
    Take(input, conf.guestBssid, tame.guestBssid, texts);
    Take(input, conf.security, conf.secret, tame.secret, texts);
    Take(input, conf.guestSecurity, conf.guestSecret, tame.guestSecret, texts);
    const auto host = wireless::RenderHostConf("wlan0", conf);
    const auto guests = wireless::RenderGuestConf(conf);
    const std::string text = host.Text() + guests.Text();
    Values expected = Read(wireless::RenderHostConf("wlan0", tame).Text() +
                           wireless::RenderGuestConf(tame).Text());
    Values shown = expected;
    bool holdsLineBreak = false;
    for (auto& [key, value] : expected) {
        const size_t quote = value[0] == '"' ? 1 : 0;
        const auto found = texts.find(value.substr(quote, value.size() - 2 * quote));
        if (!value.empty() && found != texts.end()) {
            value.replace(quote, found->second.size(), found->second);
            holdsLineBreak = holdsLineBreak || value.find_first_of("\r\n") != value.npos;
        }
        const bool isSecret = key.find("pass") != key.npos || key.find("secret") != key.npos ||
                              key.find("wep_key0") != key.npos;
        shown[key] = isSecret ? "********" : value;
    }
    Demand((host.HoldsLineBreak() || guests.HoldsLineBreak()) == holdsLineBreak,
           "a line break is noticed", text);
    if (!holdsLineBreak) {
        Demand(Read(text) == expected, "it reads back", text);
        Demand(Read(host.Shown() + guests.Shown()) == shown, "no secret is shown", text);
    }
}

}  // namespace taviwireless::fuzz
