// SPDX-License-Identifier: MIT
// Changing a section of a section file: it reads back, and everything else is as it was.
#include <tavicore/section.h>

#include <algorithm>
#include <cstring>
#include <vector>

#include "base/split.h"
#include "common/sz_hash.h"
#include "common/sz_list.h"
#include "tests/fuzz/fuzz.h"
#include "tests/support/files.h"

namespace taviwireless::fuzz {
namespace {

constexpr char kFile[] = "/tmp/sections";
constexpr char kFormat[] = "\t%s=%s\n";

std::string Trimmed(std::string text) {
    text = text.substr(0, text.find('\0'));
    text.erase(0, text.find_first_not_of(" \t\r\f\v"));
    return text.substr(0, text.find_last_not_of(" \t\r\f\v") + 1);
}

// Name and lines of each section, by a reading of our own; the first one is above all headers.
using Section = std::pair<std::string, std::vector<std::string>>;

std::vector<Section> Read(const std::string& text) {
    std::vector<Section> sections(1);
    for (const std::string& line : Lines(text)) {
        const std::string shown = Trimmed(line);
        if (shown.size() > 1 && shown.front() == '[' && shown.back() == ']') {
            sections.push_back({shown.substr(1, shown.size() - 2), {}});
        }
        sections.back().second.push_back(line);
    }
    SzList names(8);
    VEXACFileEnumSection(kFile, names.Address());
    Demand(names.Count() + 1 == static_cast<int>(sections.size()), "all are found", text);
    for (int i = 0; i < names.Count(); ++i) {
        Demand(names[i] == sections[i + 1].first, "by their names", text);
    }
    return sections;
}

// Takes the lines of the key, or of all keys, out of the section, which is made if there is none.
// Returns the value of the first.
std::string Forget(std::vector<Section>& sections, const std::string& name,
                   const std::string* key) {
    auto found = sections.end();
    for (auto* compare : {strcmp, strcasecmp}) {
        if (found == sections.end()) {
            found = std::find_if(sections.begin() + 1, sections.end(), [&](const Section& section) {
                return compare(section.first.c_str(), name.c_str()) == 0;
            });
        }
    }
    if (found == sections.end()) {
        sections.push_back({name, {"[" + name + "]"}});
        return "";
    }
    const auto isOfKey = [&](const std::string& line) {
        const std::string shown = Trimmed(line);
        const size_t equals = shown.find('=');
        return equals != shown.npos && strchr("#;[=", shown[0]) == nullptr &&
               (key == nullptr || Trimmed(shown.substr(0, equals)) == *key);
    };
    auto& lines = found->second;
    const auto first = std::find_if(lines.begin() + 1, lines.end(), isOfKey);
    std::string value = first == lines.end() ? "" : first->substr(first->find('=') + 1);
    value.resize(value.size() - (!value.empty() && value.back() == '\r' ? 1 : 0));
    lines.erase(std::remove_if(first, lines.end(), isOfKey), lines.end());
    return value.substr(0, value.find('\0'));
}

std::string Value(const std::string& name, const std::string& key) {
    char value[8192];
    VEXACFileGetSectionValue(kFile, name.c_str(), key.c_str(), value, sizeof value);
    return value;
}

}  // namespace

void Fuzz(Input input) {
    const unsigned how = input.Choice(3);
    const std::string name = input.Text(), key = input.Text(), value = input.Text();
    const char *n = name.c_str(), *k = key.c_str(), *v = value.c_str();
    SzHash hash(8);
    hash.Set(k, value);
    test::WriteFile(kFile, input.Rest());
    auto before = Read(input.Rest()), copy = before;
    Demand(Value(name, key) == Forget(copy, name, &key), "the first line counts", input.Rest());
    const bool isDone = how == 0 ? VEXACFileSetSectionValue(kFile, n, k, v, kFormat) == 0
                        : how == 1
                            ? VEXACFileSetSection(kFile, n, nullptr, hash.Get(), kFormat) == 1
                            : VEXACFileAddSection(kFile, n, hash.Get(), kFormat) == 1;
    const std::string text = test::ReadFile(kFile);
    Demand(isDone || text == input.Rest(), "what is refused changes nothing", text);
    auto after = Read(text);
    if (isDone) {
        Demand(Value(name, key) == value, "the value reads back", text);
        Forget(before, name, how == 1 ? nullptr : &key);
        Forget(after, name, how == 1 ? nullptr : &key);
        Demand(before == after, "everything else is as it was", text);
    }
}

}  // namespace taviwireless::fuzz
