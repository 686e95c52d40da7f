// SPDX-License-Identifier: MIT
// Setting a key of a key/value file: it reads back, and everything else is as it was.
#include <tavicore/keyvalue.h>

#include <climits>
#include <map>
#include <sstream>

#include "tests/fuzz/fuzz.h"
#include "tests/support/files.h"

namespace taviwireless::fuzz {
namespace {

constexpr char kFile[] = "/tmp/settings";

std::string Trimmed(const std::string& text) {
    const size_t begin = text.find_first_not_of(" \t\r\f\v");
    return begin == text.npos ? ""
                              : text.substr(begin, text.find_last_not_of(" \t\r\f\v") + 1 - begin);
}

// The keys by a reading of our own, with the values that the SDK has for them; and, under "", the
// text without the lines of `left`.
std::map<std::string, std::string> Read(const std::string& text, const std::string& left) {
    std::map<std::string, std::string> values;
    std::istringstream lines(text);
    for (std::string line; std::getline(lines, line);) {
        const std::string key = Trimmed(line.substr(0, line.find('=')));
        const bool isPair = line.find('=') != line.npos && !key.empty() && key[0] != '#';
        char value[4096];
        if (isPair && key != left && key.find('\0') == key.npos &&
            VEXACFileGetKeyValue(kFile, key.c_str(), value, sizeof value) >= 0) {
            values[key] = value;
        }
        if (!isPair || key != left) {
            values[""] += line + "\n";
        }
    }
    return values;
}

}  // namespace

void Fuzz(Input input) {
    const std::string key = input.Text();
    const std::string value = input.Text();
    const bool isPlain = input.Flag();
    test::WriteFile(kFile, input.Rest());
    const auto before = Read(input.Rest(), key);
    const int result =
        VEXACFileSetKeyValue(kFile, key.c_str(), value.c_str(), isPlain ? "%s=%s\n" : nullptr);
    const std::string text = test::ReadFile(kFile);
    if (result != 1) {
        Demand(text == input.Rest(), "a refused value changes nothing", text);
        return;
    }
    char read[4096];
    Demand(VEXACFileGetKeyValue(kFile, key.c_str(), read, sizeof read) >= 0, "the key is there",
           text);
    Demand(isPlain || read == value || value.size() >= sizeof read, "the value reads back", text);
    Demand(Read(text, key) == before, "other lines are as they were", text);
}

}  // namespace taviwireless::fuzz
