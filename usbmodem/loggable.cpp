// SPDX-License-Identifier: MIT
#include "usbmodem/loggable.h"

#include <strings.h>

#include <algorithm>
#include <cctype>
#include <cstring>
#include <iterator>
#include <utility>
#include <vector>

#include "base/split.h"

namespace taviwireless::usbmodem_lib {

namespace {

constexpr char kMask[] = "***";

// The commands that carry codes, and how many commas stand in front of the first one.
constexpr struct {
    const char* name;
    int commas;
} kWithCodes[] = {{"CPIN", 0}, {"CPIN2", 0}, {"CPWD", 1}, {"CLCK", 2}};

// How lines begin in which a modem says what went wrong, with numbers that are worth reading.
constexpr const char* kDiagnostics[] = {"ERROR", "+CME ERROR", "+CMS ERROR", "+CPIN:", "+CLCK:"};

bool IsDiagnostic(const std::string& line) {
    return std::any_of(std::begin(kDiagnostics), std::end(kDiagnostics), [&line](const char* text) {
        return strncasecmp(line.c_str(), text, std::strlen(text)) == 0;
    });
}

// Returns what stands behind "NAME=" in the line, in whatever case and with whatever blanks a person
// may write it; npos if that is not there.
size_t FindArguments(const std::string& line, const std::string& name) {
    const auto isSame = [](unsigned char a, char b) { return std::toupper(a) == b; };
    for (auto from = line.begin();;) {
        const auto found = std::search(from, line.end(), name.begin(), name.end(), isSame);
        if (found == line.end()) {
            return std::string::npos;
        }
        from = found + static_cast<std::ptrdiff_t>(name.size());
        const size_t next = line.find_first_not_of(" \t", static_cast<size_t>(from - line.begin()));
        if (next != std::string::npos && line[next] == '=') {
            return next + 1;
        }
    }
}

// Returns where the first code stands in the line; npos if it holds none.
size_t FindCode(const std::string& line) {
    size_t first = std::string::npos;
    for (const auto& command : kWithCodes) {
        size_t code = FindArguments(line, command.name);
        for (int i = 0; i < command.commas && code < line.size(); ++i) {
            const size_t comma = line.find(',', code);
            code = comma == std::string::npos ? comma : comma + 1;
        }
        if (code < line.size()) {
            first = std::min(first, code);
        }
    }
    return first;
}

std::string MaskCommand(const std::string& line) {
    const size_t code = FindCode(line);
    return code == std::string::npos ? line : line.substr(0, code) + kMask;
}

std::string MaskCodes(std::string line, const std::vector<std::string>& codes) {
    for (const std::string& code : codes) {
        for (size_t at = line.find(code); !code.empty() && at != std::string::npos;
             at = line.find(code, at + std::strlen(kMask))) {
            line.replace(at, code.size(), kMask);
        }
    }
    if (!IsDiagnostic(line)) {
        std::replace_if(
            line.begin(), line.end(), [](unsigned char c) { return std::isdigit(c) != 0; }, '*');
    }
    return line;
}

// Returns the lines of text, each changed by mask, with separator between them.
template <typename Mask>
std::string MaskLines(const std::string& text, char separator, Mask mask) {
    std::string masked;
    for (std::string line : Lines(text)) {
        line.erase(0, line.find_first_not_of('\r'));  // left over from the end of an echo
        if (!masked.empty()) {
            masked += separator;
        }
        masked += mask(line);
    }
    const bool isEnded = !text.empty() && text.back() == '\n';
    return isEnded ? masked + '\n' : masked;
}

}  // namespace

std::string LoggableCommand(const std::string& text) {
    return MaskLines(text, '\n', MaskCommand);
}

std::string LoggableReply(const std::string& reply) {
    return MaskLines(reply, ' ', MaskCommand);
}

std::string LoggableReply(const std::string& reply, std::initializer_list<std::string> codes) {
    return MaskLines(reply, ' ', [&codes](const std::string& line) {
        return MaskCodes(MaskCommand(line), codes);
    });
}

std::string LoggableReplyTo(const std::string& command, const std::string& reply) {
    const size_t begin = FindCode(command);
    if (begin == std::string::npos) {
        return LoggableReply(reply);
    }
    std::vector<std::string> codes;
    std::string code;
    for (const char c : command.substr(begin) + ' ') {
        if (std::isdigit(static_cast<unsigned char>(c)) != 0) {
            code += c;
        } else if (!code.empty()) {
            codes.push_back(std::exchange(code, ""));
        }
    }
    return MaskLines(reply, ' ', [&codes](const std::string& line) {
        return MaskCodes(MaskCommand(line), codes);
    });
}

}  // namespace taviwireless::usbmodem_lib
