// SPDX-License-Identifier: MIT
// What hostapd is given: it has the texts of the settings and nothing else of them, each as the
// whole value of a line, and shows no secret; or it is said that a line break stands in it.
#include <cstring>

#include "base/split.h"
#include "tests/fuzz/foreign_texts.h"
#include "wireless/rules/hostapd_conf.h"

namespace taviwireless::fuzz {
namespace {

struct Printed {
    explicit Printed(const WirelessAPConf& conf) {
        for (const auto& part :
             {wireless::RenderHostConf("wlan0", conf), wireless::RenderGuestConf(conf)}) {
            text += part.Text();
            shown += part.Shown();
            holdsLineBreak = holdsLineBreak || part.HoldsLineBreak();
        }
    }
    std::string text, shown;
    bool holdsLineBreak = false;
};

void Take(Input& input, int32_t security, WirelessAPSecret& secret, WirelessAPSecret& harmless,
          ForeignTexts& texts) {
    if (security == WIRELESS_AP_WEP) {
        texts.Take(input, secret.wepKey, harmless.wepKey);
    } else if (security == WIRELESS_AP_WPA) {
        texts.Take(input, secret.wpa.passphrase, harmless.wpa.passphrase);
    } else if (security == WIRELESS_AP_WPA_ENTERPRISE) {
        texts.Take(input, secret.enterprise.radiusSecret, harmless.enterprise.radiusSecret);
    }
}

}  // namespace

void Fuzz(Input input) {
    WirelessAPConf conf{};
    conf.security = static_cast<int>(input.Choice(5));
    conf.guestSecurity = static_cast<int>(input.Choice(5));
    WirelessAPConf harmless = conf;
    ForeignTexts texts;
    texts.Take(input, conf.ssid, harmless.ssid);
    texts.Take(input, conf.bridge, harmless.bridge);
    texts.Take(input, conf.guestSsid, harmless.guestSsid);
    texts.Take(input, conf.guestBssid, harmless.guestBssid);
    Take(input, conf.security, conf.secret, harmless.secret, texts);
    Take(input, conf.guestSecurity, conf.guestSecret, harmless.guestSecret, texts);
    const Printed printed(conf), pattern(harmless);
    const std::string& text = printed.text;
    Demand(text == texts.PutInto(pattern.text), "texts stand where they belong", text);
    Demand(printed.shown == texts.PutInto(pattern.shown), "as they do for others", printed.shown);
    Demand(pattern.shown.find_first_of("\x12\x13") == text.npos, "no secret is shown", text);
    const bool holdsLineBreak =
        text.find('\r') != text.npos || Lines(text).size() > Lines(pattern.text).size();
    Demand(printed.holdsLineBreak == holdsLineBreak, "a line break is noticed", text);
    if (conf.security == WIRELESS_AP_WEP) {
        const size_t size = strlen(conf.secret.wepKey);
        const std::string host = pattern.text.substr(0, pattern.text.find("bss="));
        const bool isText = size == 5 || size == 13, isNumber = size == 10 || size == 26;
        Demand((host.find("\nwep_key0=\"") != host.npos) == isText, "a text has quotes", text);
        Demand((host.find("\nwep_key0=") != host.npos) == (isText || isNumber), "a key is one",
               text);
    }
}

}  // namespace taviwireless::fuzz
