// SPDX-License-Identifier: MIT
#include "common/log.h"

#include <cerrno>
#include <cstdarg>
#include <cstdio>
#include <cstring>

namespace taviwireless {

namespace {

// Long enough for every path and reply that is logged; longer messages are cut.
constexpr int kMaxMessage = 2048;

// How UTF-8 characters begin (RFC 3629): what the first two bytes may be, and how many there are.
// The control characters U+0080 to U+009F are left out.
constexpr struct {
    unsigned char first, last;
    unsigned char secondFirst, secondLast;
    size_t length;
} kCharacters[] = {
    {0xC2, 0xC2, 0xA0, 0xBF, 2}, {0xC3, 0xDF, 0x80, 0xBF, 2}, {0xE0, 0xE0, 0xA0, 0xBF, 3},
    {0xE1, 0xEC, 0x80, 0xBF, 3}, {0xED, 0xED, 0x80, 0x9F, 3}, {0xEE, 0xEF, 0x80, 0xBF, 3},
    {0xF0, 0xF0, 0x90, 0xBF, 4}, {0xF1, 0xF3, 0x80, 0xBF, 4}, {0xF4, 0xF4, 0x80, 0x8F, 4},
};

// Returns the number of bytes of the printable character that text begins with; 0 if there is none.
size_t CharacterLength(const unsigned char* text) {
    if (*text >= ' ' && *text <= '~') {
        return 1;
    }
    const auto isWithin = [](unsigned char byte, unsigned char first, unsigned char last) {
        return byte >= first && byte <= last;
    };
    for (const auto& kind : kCharacters) {
        // In this order, so that nothing behind the end of the text is looked at.
        if (isWithin(text[0], kind.first, kind.last) &&
            isWithin(text[1], kind.secondFirst, kind.secondLast) &&
            (kind.length < 3 || isWithin(text[2], 0x80, 0xBF)) &&
            (kind.length < 4 || isWithin(text[3], 0x80, 0xBF))) {
            return kind.length;
        }
    }
    return 0;
}

}  // namespace

void MakePrintable(char* text) {
    while (*text != '\0' && std::strcmp(text, "\n") != 0) {
        const size_t length = CharacterLength(reinterpret_cast<const unsigned char*>(text));
        if (length == 0) {
            *text = '?';
        }
        text += length == 0 ? 1 : length;
    }
}

void WriteLog(int priority, const char* file, int line, const char* format, ...) {
    const int savedErrno = errno;  // callers look at errno after they logged it
    char message[kMaxMessage];
    va_list arguments;
    va_start(arguments, format);
    vsnprintf(message, sizeof message, format, arguments);
    va_end(arguments);
    MakePrintable(message);
    syslog(priority, "%s:%d %s", file, line, message);
    errno = savedErrno;
}

}  // namespace taviwireless
