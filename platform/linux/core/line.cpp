// SPDX-License-Identifier: MIT
// Lines of text files.
#include "line.h"

#include "failure.h"

namespace tavicore {

std::string_view TakeLine(std::string_view* rest) {
    const auto newline = rest->find('\n');
    const auto line = rest->substr(0, newline == rest->npos ? newline : newline + 1);
    rest->remove_prefix(line.size());
    return line;
}

std::string_view Readable(std::string_view line) {
    for (const char end : {'\n', '\r'}) {
        if (!line.empty() && line.back() == end) {
            line.remove_suffix(1);
        }
    }
    return line.substr(0, line.find('\0'));
}

std::string_view TrimLeft(std::string_view text) {
    const auto first = text.find_first_not_of(kBlanks);
    return first == text.npos ? std::string_view() : text.substr(first);
}

std::string_view TrimRight(std::string_view text) {
    return text.substr(0, text.find_last_not_of(kBlanks) + 1);
}

std::optional<Pair> ReadPair(std::string_view line, std::string_view marks) {
    const auto text = TrimLeft(Readable(line));
    const auto equals = text.find('=');
    if (equals == text.npos || equals == 0 || marks.find(text.front()) != marks.npos) {
        return std::nullopt;
    }
    return Pair{text.substr(0, equals), text.substr(equals + 1)};
}

bool HasLineBreak(std::string_view text) {
    return text.find_first_of("\r\n") != text.npos;
}

void EndLastLine(std::string* text) {
    if (!text->empty() && text->back() != '\n') {
        *text += '\n';
    }
}

void CopyOut(std::string_view value, char* buffer, size_t size) {
    if (value.size() >= size) {
        throw Failure{VEXAC_ERR_TOO_LONG};
    }
    buffer[value.copy(buffer, size)] = '\0';
}

PairFormat::PairFormat(std::string_view format) {
    const auto key = format.find("%s");
    const auto value = key == format.npos ? key : format.find("%s", key + 2);
    if (value == format.npos) {
        throw Failure{VEXAC_ERR_BAD_PARAMETER};
    }
    before_ = format.substr(0, key);
    between_ = format.substr(key + 2, value - key - 2);
    after_ = format.substr(value + 2);
    const bool oneLine = format.find('\n') == format.size() - 1;
    for (const auto text : {before_, between_, after_}) {
        if (!oneLine || text.find('%') != text.npos) {
            throw Failure{VEXAC_ERR_BAD_PARAMETER};
        }
    }
}

std::string PairFormat::Line(std::string_view key, std::string_view value) const {
    std::string line;
    for (const auto part : {before_, key, between_, value, after_}) {
        line += part;
    }
    return line;
}

}  // namespace tavicore
