// SPDX-License-Identifier: MIT
// Section files: "[name]" headers, each followed by its key=value lines.
#include <tavicore/section.h>

#include <algorithm>
#include <optional>
#include <set>
#include <string>
#include <vector>

#include "failure.h"
#include "line.h"
#include "section_index.h"
#include "szhash_pairs.h"
#include "text_file.h"

using namespace tavicore;

namespace {

// A "[" that is no header lacks its closing bracket and is passed over.
constexpr char kPassedOver[] = "#;[";

using Lines = std::vector<std::string>;

Lines Split(std::string_view text) {
    Lines lines;
    while (!text.empty()) {
        lines.emplace_back(TakeLine(&text));
    }
    return lines;
}

std::string Join(const Lines& lines) {
    std::string text;
    for (const std::string& line : lines) {
        text += line;
    }
    return text;
}

std::optional<Pair> ReadKey(std::string_view line) {
    auto pair = ReadPair(line, kPassedOver);
    if (pair) {
        pair->key = TrimRight(pair->key);
    }
    return pair;
}

void CheckSectionName(std::string_view name) {
    if (name.empty() || HasLineBreak(name)) {
        throw Failure{VEXAC_ERR_BAD_PARAMETER};
    }
}

// The pair as a line that reads back as this pair.
std::string FormatPair(const PairFormat& format, std::string_view key, std::string_view value) {
    if (key.empty() || key.find_first_of("=") != key.npos || key.find_first_of("[#;") == 0 ||
        key != TrimLeft(TrimRight(key)) || HasLineBreak(key) || HasLineBreak(value)) {
        throw Failure{VEXAC_ERR_BAD_PARAMETER};
    }
    return format.Line(key, value);
}

Lines FormatPairs(const VEXACSzHash& hash, const char* format) {
    RequireAll(format);
    const PairFormat lineFormat(format);
    Lines lines;
    for (const auto& [key, value] : hash.pairs) {
        lines.push_back(FormatPair(lineFormat, key, value));
    }
    return lines;
}

// Inserts behind the last pair of a section's lines: the comments and blank lines below it mostly
// belong to the section that follows.
void InsertAtEnd(Lines& lines, const Lines& newLines) {
    size_t place = 0;
    for (size_t i = 0; i < lines.size(); ++i) {
        if (ReadKey(lines[i])) {
            place = i + 1;
        }
    }
    if (place > 0) {
        EndLastLine(&lines[place - 1]);
    }
    lines.insert(lines.begin() + static_cast<std::ptrdiff_t>(place), newLines.begin(),
                 newLines.end());
}

void AppendSection(std::string* text, const std::string& name, const Lines& pairs) {
    EndLastLine(text);
    *text += "[" + name + "]\n" + Join(pairs);
}

// Puts newPairs in the place of a section's first pair and takes its old pairs away; comments and
// blank lines stay.
void ReplacePairs(Lines& lines, const Lines& newPairs) {
    const auto isPair = [](const std::string& line) { return ReadKey(line).has_value(); };
    const auto first = std::find_if(lines.begin(), lines.end(), isPair);
    if (first == lines.end()) {
        InsertAtEnd(lines, newPairs);
        return;
    }
    const auto place = first - lines.begin();
    lines.erase(std::remove_if(first, lines.end(), isPair), lines.end());
    lines.insert(lines.begin() + place, newPairs.begin(), newPairs.end());
}

// Puts newLine in the place of the key's first line, or at the end of a section's lines; the key's
// further lines go.
void SetLine(Lines& lines, std::string_view key, const std::string& newLine) {
    bool written = false;
    for (std::string& line : lines) {
        const auto pair = ReadKey(line);
        if (pair && pair->key == key) {
            line = written ? "" : newLine;
            written = true;
        }
    }
    if (!written) {
        InsertAtEnd(lines, {newLine});
    }
}

// Lets `change` have the lines of a section. False when the text has no such section.
bool ChangeSection(std::string* text, const char* name,
                   const std::function<void(Lines& lines)>& change) {
    const SectionIndex index(*text);
    const Section* section = index.Find(name);
    if (section == nullptr) {
        return false;
    }
    const size_t size = section->end - section->begin;
    Lines lines = Split(std::string_view(*text).substr(section->begin, size));
    change(lines);
    const bool isHeaderEnded = (*text)[section->begin - 1] == '\n';  // it may be the last line
    text->replace(section->begin, size, (isHeaderEnded ? "" : "\n") + Join(lines));
    return true;
}

// Takes a section away: its header and the lines up to its last pair, since what stands below
// mostly belongs to the section that follows. False when the text has no such section.
bool RemoveSection(std::string* text, const char* name) {
    const SectionIndex index(*text);
    const Section* section = index.Find(name);
    if (section == nullptr) {
        return false;
    }
    const size_t header = text->rfind('\n', section->begin - 2) + 1;
    Lines lines =
        Split(std::string_view(*text).substr(section->begin, section->end - section->begin));
    const auto lastPair = std::find_if(lines.rbegin(), lines.rend(), [](const std::string& line) {
        return ReadKey(line).has_value();
    });
    lines.erase(lines.begin(), lastPair.base());
    text->replace(header, section->end - header, Join(lines));
    return true;
}

// Sets the section's pairs in *hash. False when the file has no such section.
bool ReadSection(const char* file, const char* name, VEXACSzHash** hash) {
    const TextFile text(file);
    const Section* section = IndexOf(text).Find(name);
    if (section == nullptr) {
        return false;
    }
    const std::string lines = text.Read(section->begin, section->end);
    std::set<std::string_view> seen;
    for (std::string_view rest = lines; !rest.empty();) {
        const auto pair = ReadKey(TakeLine(&rest));
        if (pair && seen.insert(pair->key).second) {
            SetPair(**hash, pair->key, pair->value);
        }
    }
    return true;
}

}  // namespace

int VEXACFileEnumSection(const char* file, VEXACSzList** list) {
    return Guarded(-1, [&] {
        RequireAll(file, list);
        const auto& sections = IndexOf(TextFile(file)).Sections();
        for (const Section& section : sections) {
            if (VEXACSzListPush(list, section.name.c_str()) < 0) {
                return -1;
            }
        }
        return static_cast<int>(sections.size());
    });
}

int VEXACFileGetSection(const char* file, const char* section, VEXACSzHash** hash) {
    return Guarded(-1, [&] {
        RequireAll(file, section, hash);
        RequireAll(*hash);
        if (!ReadSection(file, section, hash)) {
            VEXACErrSet(VEXAC_ERR_NOT_FOUND);
            return 0;
        }
        return 1;
    });
}

int VEXACFileAddSection(const char* file, const char* section, const VEXACSzHash* hash,
                        const char* format) {
    return Guarded(-1, [&] {
        RequireAll(file, section, hash);
        CheckSectionName(section);
        const Lines pairs = FormatPairs(*hash, format);
        ChangeText(file, IfMissing::kCreate, [&](std::string* text) {
            if (SectionIndex(*text).Find(section) != nullptr) {
                throw Failure{VEXAC_ERR_BAD_PARAMETER};
            }
            AppendSection(text, section, pairs);
        });
        return 1;
    });
}

int VEXACFileSetSection(const char* file, const char* section, const char* newName,
                        const VEXACSzHash* hash, const char* format) {
    bool exists = true;
    const int result = Guarded(-1, [&] {
        RequireAll(file, section, hash);
        if (newName != nullptr) {
            throw Failure{VEXAC_ERR_BAD_PARAMETER};
        }
        const Lines pairs = FormatPairs(*hash, format);
        ChangeText(file, IfMissing::kFail, [&](std::string* text) {
            exists =
                ChangeSection(text, section, [&](Lines& lines) { ReplacePairs(lines, pairs); });
            if (!exists) {
                throw Failure{VEXAC_ERR_NOT_FOUND};
            }
        });
        return 1;
    });
    return exists ? result : 0;
}

int VEXACFileRemoveSection(const char* file, const char* section) {
    bool exists = true;
    const int result = Guarded(-1, [&] {
        RequireAll(file, section);
        ChangeText(file, IfMissing::kFail, [&](std::string* text) {
            exists = RemoveSection(text, section);
            if (!exists) {
                throw Failure{VEXAC_ERR_NOT_FOUND};
            }
            while (RemoveSection(text, section)) {  // or the next one of this name would count
            }
        });
        return 1;
    });
    return exists ? result : 0;
}

int VEXACFileGetSectionValue(const char* file, const char* section, const char* key, char* value,
                             size_t size) {
    if (value != nullptr && size > 0) {
        *value = '\0';
    }
    return Guarded(-1, [&] {
        RequireAll(file, section, key, value);
        VEXACSzHash pairs;
        VEXACSzHash* hash = &pairs;
        const char* found =
            ReadSection(file, section, &hash) ? VEXACSzHashGetValue(hash, key) : nullptr;
        if (found == nullptr) {
            throw Failure{VEXAC_ERR_NOT_FOUND};
        }
        CopyOut(found, value, size);
        return 0;
    });
}

int VEXACFileSetSectionValue(const char* file, const char* section, const char* key,
                             const char* value, const char* format) {
    return Guarded(-1, [&] {
        RequireAll(file, section, key, value, format);
        CheckSectionName(section);
        const std::string line = FormatPair(PairFormat(format), key, value);
        ChangeText(file, IfMissing::kCreate, [&](std::string* text) {
            if (!ChangeSection(text, section, [&](Lines& lines) { SetLine(lines, key, line); })) {
                AppendSection(text, section, {line});
            }
        });
        return 0;
    });
}
