// What the supplicant is given, read again by its own rules: one network with the values that the
// saved one has, and nothing else; or it is said that a line break stands in it.
#include <cstring>
#include <map>

#include "base/fixed_field.h"
#include "base/split.h"
#include "tests/fuzz/fuzz.h"
#include "wireless/rules/supplicant.h"

namespace taviwireless::fuzz {
namespace {

using Values = std::map<std::string, std::string>;

// A line without its comment and the blanks around it. From its first quote to the last one
// nothing is a comment.
std::string WithoutComment(std::string line) {
    const size_t first = line.find('"'), last = line.rfind('"');
    line = line.substr(0, line.find('#', first == last ? 0 : last));
    line.erase(0, line.find_first_not_of(" \t\r"));
    return line.substr(0, line.find_last_not_of(" \t\r") + 1);
}

// The values of the only network.
Values Read(const std::string& text) {
    Values values;
    std::string around;
    for (const std::string& each : Lines(text)) {
        const std::string line = WithoutComment(each);
        const size_t equals = line.find('=');
        if (around.empty() || around.back() != '{' || line == "}") {
            around += line;
        } else {
            Demand(values.emplace(line.substr(0, equals), line.substr(equals + 1)).second,
                   "a key has one value", text);
        }
    }
    Demand(around == "ctrl_interface=/var/run/wpa_supplicantnetwork={}", "one network", text);
    return values;
}

}  // namespace

void Fuzz(Input input) {
    WirelessConf conf{};
    conf.network.auth = static_cast<int>(input.Choice(10));
    conf.network.encrypt = static_cast<int>(input.Choice(14));
    CopyField(conf.network.essid, input.Text());
    CopyField(conf.key, input.Text());
    CopyField(conf.user, input.Text());
    WirelessConf tame = conf;
    for (char* text : {tame.network.essid, tame.key, tame.user}) {
        memset(text, 'x', strlen(text));
    }
    const auto rendered = wireless::RenderSupplicantConf(conf);
    if (rendered.isAuthUnknown) {
        return;
    }
    Values expected = Read(wireless::RenderSupplicantConf(tame).text);
    bool holdsLineBreak = false;
    for (auto& [key, value] : expected) {
        const char* text = key == "ssid"       ? conf.network.essid
                           : key == "identity" ? conf.user
                                               : conf.key;
        const bool isText = value[0] == '"', isForeign = isText || key == "wep_key0";
        value = isText ? std::string("\"") + text + "\"" : isForeign ? text : value;
        holdsLineBreak = holdsLineBreak || value.find_first_of("\r\n") != value.npos;
        value = WithoutComment("=" + value).substr(1);  // of a WEP key that is no digits
    }
    Demand(rendered.holdsLineBreak == holdsLineBreak, "a line break is noticed", rendered.text);
    Demand(holdsLineBreak || Read(rendered.text) == expected, "it reads back", rendered.text);
}

}  // namespace taviwireless::fuzz
