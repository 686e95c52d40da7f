// SPDX-License-Identifier: MIT
// Key/value files: KEY=value lines, as shell scripts source them.
#include <tavicore/keyvalue.h>

#include "failure.h"
#include "line.h"
#include "text_file.h"

using namespace tavicore;

namespace {

constexpr char kDefaultFormat[] = "%s=\"%s\"\n";
constexpr char kCommentMarks[] = "#";

std::string_view Unquoted(std::string_view value) {
    const bool quoted = value.size() >= 2 && value.front() == value.back() &&
                        (value.front() == '"' || value.front() == '\'');
    return quoted ? value.substr(1, value.size() - 2) : value;
}

// Throws when the key is not there. The value is a part of text.
std::string_view FindValue(std::string_view text, std::string_view key) {
    while (!text.empty()) {
        const auto pair = ReadPair(TakeLine(&text), kCommentMarks);
        if (pair && pair->key == key) {
            return Unquoted(TrimRight(pair->value));
        }
    }
    throw Failure{VEXAC_ERR_NOT_FOUND};
}

void CheckPair(std::string_view key, std::string_view value) {
    if (key.empty() || key.front() == '#' || key.find('=') != key.npos ||
        key.find_first_of(kBlanks) != key.npos || HasLineBreak(key) || HasLineBreak(value)) {
        throw Failure{VEXAC_ERR_BAD_PARAMETER};
    }
}

// The text with the key's first line replaced by newLine and its further lines removed, or with
// newLine at its end.
std::string WithLine(std::string_view text, std::string_view key, const std::string& newLine) {
    std::string result;
    result.reserve(text.size() + newLine.size() + 1);
    bool written = false;
    while (!text.empty()) {
        const auto line = TakeLine(&text);
        const auto pair = ReadPair(line, kCommentMarks);
        if (!pair || pair->key != key) {
            result += line;
        } else if (!written) {
            result += newLine;
            written = true;
        }
    }
    if (!written) {
        EndLastLine(&result);
        result += newLine;
    }
    return result;
}

}  // namespace

int VEXACFileGetKeyValue(const char* file, const char* key, char* value, size_t size) {
    if (value != nullptr && size > 0) {
        *value = '\0';
    }
    return Guarded(-1, [&] {
        RequireAll(file, key, value);
        if (*key == '\0' || size == 0) {
            throw Failure{VEXAC_ERR_BAD_PARAMETER};
        }
        const std::string text = ReadText(file);
        const auto found = FindValue(text, key);
        CopyOut(found, value, size);
        return static_cast<int>(found.size());
    });
}

int VEXACFileSetKeyValue(const char* file, const char* key, const char* value, const char* format) {
    return Guarded(-1, [&] {
        RequireAll(file, key, value);
        CheckPair(key, value);
        const std::string line =
            PairFormat(format != nullptr ? format : kDefaultFormat).Line(key, value);
        ChangeText(file, IfMissing::kCreate,
                   [&](std::string* text) { *text = WithLine(*text, key, line); });
        return 1;
    });
}

int VEXACFileCheckKeyValue(const char* file, const char* key, const char* value, int /*flags*/) {
    return Guarded(0, [&] {
        RequireAll(file, key, value);
        const std::string text = ReadText(file);
        if (FindValue(text, key) != value) {
            throw Failure{VEXAC_ERR_NOT_FOUND};
        }
        return 1;
    });
}
