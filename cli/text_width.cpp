// SPDX-License-Identifier: MIT
#include "cli/text_width.h"

#include <glib.h>

#include <algorithm>

#include "cli/terminal.h"

namespace taviwireless::cli {

namespace {

constexpr char kNoColour[] = "\033[0m";
constexpr char kEscape = '\033';

// The character of UTF-8, or the switch of colours, at a place of the text. A byte that is neither
// counts as a character.
struct Character {
    Character(const std::string& text, size_t place) {
        if (text[place] == kEscape) {
            bytes = std::min(text.find('m', place), text.size() - 1) + 1 - place;
            width = 0;
            return;
        }
        const char* const begin = &text[place];
        const gunichar code =
            g_utf8_get_char_validated(begin, static_cast<gssize>(text.size() - place));
        constexpr auto kIncomplete =
            static_cast<gunichar>(-2);  // the largest but that of a mistake
        if (code < kIncomplete) {
            bytes = static_cast<size_t>(g_utf8_next_char(begin) - begin);
            width = g_unichar_iszerowidth(code) != 0 ? 0 : g_unichar_iswide(code) != 0 ? 2 : 1;
        }
    }
    size_t bytes = 1;
    size_t width = 1;
};

// The bytes of the first characters that fit into these columns.
size_t BytesWithin(const std::string& text, size_t columns) {
    size_t place = 0;
    while (place < text.size()) {
        const Character next(text, place);
        if (next.width > columns) {
            break;
        }
        columns -= next.width;
        place += next.bytes;
    }
    return place;
}

}  // namespace

size_t TextWidth(const std::string& text) {
    size_t width = 0;
    for (size_t place = 0; place < text.size();) {
        const Character next(text, place);
        width += next.width;
        place += next.bytes;
    }
    return width;
}

std::string Cut(const std::string& text, size_t columns) {
    if (TextWidth(text) <= columns) {
        return text;
    }
    const std::string mark = ShowsUTF8() ? "\u2026" : "..";
    const size_t room = columns - std::min(columns, TextWidth(mark));
    const bool isColoured = text.find(kEscape) != std::string::npos;
    return text.substr(0, BytesWithin(text, room)) + mark + (isColoured ? kNoColour : "");
}

std::string Padded(const std::string& text, size_t columns) {
    return text + std::string(columns - std::min(columns, TextWidth(text)), ' ');
}

}  // namespace taviwireless::cli
