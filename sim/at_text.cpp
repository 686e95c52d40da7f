// SPDX-License-Identifier: MIT
#include "sim/at_text.h"

#include <algorithm>
#include <cctype>

namespace taviwireless::sim {
namespace {

bool IsDigit(char c) {
    return std::isdigit(static_cast<unsigned char>(c)) != 0;
}

bool IsLetter(char c) {
    return std::isalpha(static_cast<unsigned char>(c)) != 0;
}

// Where the extended command (+CSQ, ^CPIN?) that begins at `begin` ends: a semicolon or the end.
size_t ExtendedEnd(const std::string& line, size_t begin) {
    bool quoted = false;
    size_t end = begin;
    for (; end < line.size() && (quoted || line[end] != ';'); ++end) {
        quoted ^= line[end] == '"';
    }
    return end;
}

// Where the basic command (E1, &C1, S0=0) that begins at `begin` ends.
size_t BasicEnd(const std::string& line, size_t begin) {
    const auto skipDigits = [&line](size_t at) {
        while (at < line.size() && IsDigit(line[at])) {
            ++at;
        }
        return at;
    };
    if (line[begin] == 'D') {
        return line.size();
    }
    size_t end = skipDigits(begin + (line[begin] == '&' ? 2 : 1));
    if (end < line.size() && line[end] == '=') {
        return skipDigits(end + 1);
    }
    return end < line.size() && line[end] == '?' ? end + 1 : std::min(end, line.size());
}

std::string WithoutQuotes(std::string text) {
    text.erase(std::remove(text.begin(), text.end(), '"'), text.end());
    return text;
}

}  // namespace

std::string Normalise(const std::string& line) {
    std::string result;
    bool quoted = false;
    for (const char c : line) {
        quoted ^= c == '"';
        if (quoted) {
            result += c;
        } else if (c != ' ') {
            result += static_cast<char>(std::toupper(static_cast<unsigned char>(c)));
        }
    }
    return result;
}

std::vector<std::string> SplitCommands(const std::string& line) {
    std::vector<std::string> commands;
    for (size_t at = 2; at < line.size();) {
        if (line[at] == ';') {
            ++at;
            continue;
        }
        const bool basic = IsLetter(line[at]) || line[at] == '&';
        const size_t end = basic ? BasicEnd(line, at) : ExtendedEnd(line, at);
        commands.push_back("AT" + line.substr(at, end - at));
        at = end;
    }
    return commands;
}

std::vector<std::string> Arguments(const std::string& command) {
    const size_t equals = command.find('=');
    if (equals == std::string::npos) {
        return {};
    }
    std::vector<std::string> arguments(1);
    bool quoted = false;
    for (const char c : command.substr(equals + 1)) {
        if (c == '"') {
            quoted = !quoted;
        } else if (c == ',' && !quoted) {
            arguments.emplace_back();
        } else {
            arguments.back() += c;
        }
    }
    return arguments;
}

bool MatchesPattern(const std::string& pattern, const std::string& command) {
    const std::string wanted = WithoutQuotes(pattern);
    const std::string given = WithoutQuotes(command);
    if (!wanted.empty() && wanted.back() == '*') {
        return given.compare(0, wanted.size() - 1, wanted, 0, wanted.size() - 1) == 0;
    }
    return wanted == given;
}

}  // namespace taviwireless::sim
