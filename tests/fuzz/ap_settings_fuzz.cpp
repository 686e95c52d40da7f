// SPDX-License-Identifier: MIT
// Storing an access point's settings in a store of any kind: they read back; or they are refused and
// nothing changes.
#include <taviwireless/wireless.h>
#include <unistd.h>

#include <algorithm>
#include <cstring>

#include "base/fixed_field.h"
#include "tests/fuzz/fuzz.h"
#include "tests/support/files.h"
#include "wireless/rules/ap_settings.h"

namespace taviwireless::fuzz {
namespace {

constexpr char kStore[] = "/usr/tavi/etc/wireless_ap.conf";

// Fills all settings from the input, numbers with different ones.
struct Filler {
    void Flag(const std::string&, int32_t& field, int32_t) { field = input.Flag() ? 1 : 0; }
    void Number(const std::string& key, int32_t& field, int32_t) {
        const bool isKind = key.find("encryption") != key.npos;
        field = isKind ? static_cast<int32_t>(input.Choice(5)) : ++number;
    }
    template <size_t kSize>
    void Text(const std::string&, char (&field)[kSize], const std::string&) {
        CopyField(field, input.Text());
        texts += field;
    }
    template <size_t kSize>
    void WriteOnly(const std::string&, const char (&)[kSize]) {}

    Input& input;
    int32_t number;
    std::string texts;
};

// Whether a value may be taken for the section's header, which is then not there to be replaced; or
// the name is none.
bool IsListedElsewhere(const std::string& name, const std::string& text, bool isStored) {
    const bool isPlain = std::all_of(text.begin(), text.end(), [](char c) { return c > 0; }) &&
                         std::all_of(name.begin(), name.end(), [](char c) { return c > 0; });
    return name.empty() ||
           (!isStored &&
            (!isPlain || strcasestr(text.c_str(), ("[" + name + "]").c_str()) != nullptr));
}

}  // namespace

void Fuzz(Input input) {
    setenv("LC_ALL", input.Flag() ? "C.UTF-8" : "C", 1);
    WirelessAPSettings settings{}, stored{};
    Filler filler{input, -20, ""};
    filler.Text("", settings.name, "");
    wireless::VisitMainNetwork(filler, settings);
    wireless::VisitGuestNetwork(filler, settings);
    if (settings.ap.security == WIRELESS_AP_WEP && settings.ap.secret.wepKey[0] == '\0') {
        CopyField(settings.ap.secret.wepKey, "abcde");  // whatever the table of keys says
    }
    const bool isOn = settings.enabled != 0;
    test::WriteFile(kStore, input.Rest());
    const bool isNewFile = input.Rest().empty() && unlink(kStore) == 0;
    const bool wasStored = TAVIWirelessGetAPConfig(settings.name, &stored) > 0;
    const bool isDone = TAVIWirelessSetAPConfig(&settings) == 1;
    const std::string text = test::ReadFile(kStore), needed = isOn ? filler.texts : settings.name;
    const bool isSound = needed.find_first_of("\r\n") == needed.npos &&
                         (!isOn || (settings.ap.security < 4 && settings.ap.guestSecurity < 3));
    Demand(isSound || !isDone, "no line is forged", filler.texts);
    Demand(isDone || !isSound || IsListedElsewhere(settings.name, input.Rest(), wasStored),
           "what can be stored is stored", filler.texts);
    Demand(isDone || text == input.Rest(), "what is refused changes nothing", text);
    Demand(!test::Exists("/tmp/x"), "a name runs nothing", settings.name);
    Demand(!isNewFile || test::FileMode(kStore) == 0600, "others cannot read it");
    if (isDone && (isOn || wasStored)) {
        WirelessAPSettings expected = isOn ? settings : stored;
        expected.enabled = settings.enabled;
        Demand(TAVIWirelessGetAPConfig(settings.name, &stored) > 0, "they are found", text);
        Demand(memcmp(&stored, &expected, sizeof stored) == 0, "they read back", text);
    }
}

}  // namespace taviwireless::fuzz
