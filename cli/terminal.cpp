// SPDX-License-Identifier: MIT
#include "cli/terminal.h"

#include <glib.h>
#include <strings.h>
#include <unistd.h>

#include <algorithm>
#include <cstdlib>

#include "base/terminal_columns.h"

namespace taviwireless::cli {

namespace {

std::string Environment(const char* name) {
    const char* value = getenv(name);
    return value == nullptr ? "" : value;
}

// Whether the character moves the cursor, or the text behind it to its front.
bool Steers(gunichar code) {
    const GUnicodeType type = g_unichar_type(code);
    const bool isDirection = (code >= 0x200E && code <= 0x200F) ||
                             (code >= 0x202A && code <= 0x202E) ||
                             (code >= 0x2066 && code <= 0x2069);
    return type == G_UNICODE_CONTROL || type == G_UNICODE_LINE_SEPARATOR ||
           type == G_UNICODE_PARAGRAPH_SEPARATOR || isDirection;
}

bool ShowsMoreThanASCII() {
    return isatty(STDOUT_FILENO) == 0 || ShowsUTF8();
}

}  // namespace

std::string Printable(const std::string& text) {
    std::string printable;
    for (size_t place = 0; place < text.size();) {
        const char* next = &text[place];
        const auto left = static_cast<gssize>(text.size() - place);
        const gunichar code = g_utf8_get_char_validated(next, left);
        const bool isValid = code < static_cast<gunichar>(-2);  // else one of two mistakes
        const auto bytes = isValid ? static_cast<size_t>(g_utf8_next_char(next) - next) : 1;
        const bool isShown = isValid && !Steers(code) && (bytes == 1 || ShowsMoreThanASCII());
        printable += isShown ? text.substr(place, bytes) : "?";
        place += bytes;
    }
    return printable;
}

int TerminalWidth() {
    return ColumnsOf(STDOUT_FILENO);
}

// The name of the locale tells, as the appliance may not have the one that a remote user has set. It
// has set none itself, and then the terminal is most likely one that does.
bool ShowsUTF8() {
    std::string locale;
    for (const char* name : {"LC_ALL", "LC_CTYPE", "LANG"}) {
        locale = locale.empty() ? Environment(name) : locale;
    }
    std::string codeset = locale.substr(std::min(locale.find('.'), locale.size()));
    codeset.erase(std::remove(codeset.begin(), codeset.end(), '-'), codeset.end());
    return locale.empty() || strncasecmp(codeset.c_str(), ".utf8", 5) == 0;
}

bool TakesEscapes(int descriptor) {
    const std::string terminal = Environment("TERM");
    return isatty(descriptor) != 0 && !terminal.empty() && terminal != "dumb" &&
           terminal != "unknown";
}

std::string Coloured(Colour colour, const std::string& text) {
    constexpr const char* kCodes[] = {"32", "33", "31", "2", "1"};
    if (!TakesEscapes(STDOUT_FILENO) || !Environment("NO_COLOR").empty()) {
        return text;
    }
    return std::string("\033[") + kCodes[static_cast<int>(colour)] + "m" + text + "\033[0m";
}

}  // namespace taviwireless::cli
