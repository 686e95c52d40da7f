// SPDX-License-Identifier: MIT
// What the supplicant is given: it has the texts of the saved network and nothing else of it, and
// its own rules read them as they are; or it is said that a line break stands in it.
#include <cstring>

#include "base/split.h"
#include "tests/fuzz/foreign_texts.h"
#include "wireless/rules/supplicant.h"

namespace taviwireless::fuzz {
namespace {

// A line as the supplicant takes it: without blanks around it and its comment, which nothing is
// that stands between quotes.
std::string WithoutComment(std::string line) {
    size_t end = 0;
    for (bool isQuoted = false; end < line.size() && (isQuoted || line[end] != '#'); ++end) {
        isQuoted = isQuoted != (line[end] == '"');
    }
    line.resize(end);
    line.erase(0, line.find_first_not_of(" \t\r"));
    return line.substr(0, line.find_last_not_of(" \t\r") + 1);
}

}  // namespace

void Fuzz(Input input) {
    WirelessConf conf{};
    conf.network.auth = static_cast<int>(input.Choice(10));
    conf.network.encrypt = static_cast<int>(input.Choice(14));
    WirelessConf harmless = conf;
    ForeignTexts texts;
    texts.Take(input, conf.network.essid, harmless.network.essid);
    texts.Take(input, conf.key, harmless.key);
    texts.Take(input, conf.user, harmless.user);
    const auto rendered = wireless::RenderSupplicantConf(conf);
    const std::string pattern = wireless::RenderSupplicantConf(harmless).text,
                      &text = rendered.text;
    Demand(text == texts.PutInto(pattern), "texts stand where they belong", text);
    const auto lines = Lines(text);
    const bool holdsLineBreak =
        text.find('\r') != text.npos || lines.size() > Lines(pattern).size();
    Demand(rendered.holdsLineBreak == holdsLineBreak, "a line break is noticed", text);
    for (const std::string& line : holdsLineBreak ? std::vector<std::string>() : lines) {
        const std::string value = line.substr(line.find('=') + 1);
        // Else it is of our own, or a WEP key that by its length is of digits.
        const bool isNumber =
            line.find("\twep_key0=") == 0 && (value.size() == 10 || value.size() == 26);
        const bool isText = value[0] == '"' && !isNumber;
        const bool isWhole = WithoutComment(line) == line.substr(1);
        const bool isCut = isText && wireless::IsCutBySupplicant(value.substr(1, value.size() - 2));
        Demand(!isText || isWhole != isCut, "a text is read whole, or known to be cut", text);
        Demand(!isText || (value.size() > 1 && value.back() == '"'), "a text has an end", text);
    }
    const bool isClosed = text.size() > 2 && text.substr(text.size() - 3) == "\n}\n";
    Demand(isClosed != rendered.isAuthUnknown, "the network is closed", text);
    if (pattern.find("\n\twep_tx_keyidx=0\n") != pattern.npos) {
        const size_t size = strlen(conf.key);
        const bool isText = size == 5 || size == 13, isNumber = size == 10 || size == 26;
        Demand((pattern.find("\twep_key0=\"") != text.npos) == isText, "a text has quotes", text);
        Demand((pattern.find("\twep_key0=") != text.npos) == (isText || isNumber) &&
                   rendered.isWepKeyLeftOut != (isText || isNumber),
               "what is no key is left out", text);
    }
}

}  // namespace taviwireless::fuzz
