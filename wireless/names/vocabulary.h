// SPDX-License-Identifier: MIT
#ifndef TAVIWIRELESS_WIRELESS_NAMES_VOCABULARY_H
#define TAVIWIRELESS_WIRELESS_NAMES_VOCABULARY_H

#include <strings.h>
#include <taviwireless/wireless.h>

#include "common/log.h"

namespace taviwireless::wireless {

// Returns the value of a name of the table, whatever its case. file and line are those of the log
// line.
template <size_t kSize>
int ValueOf(const WirelessNameValue (&names)[kSize], const char* text, int unknown,
            const char* file, int line) {
    if (text == nullptr) {
        WriteLog(LOG_ERR, file, line, "Bad parameters");
        return unknown;
    }
    for (const WirelessNameValue& entry : names) {
        if (strcasecmp(text, entry.name) == 0) {
            return entry.value;
        }
    }
    return unknown;
}

}  // namespace taviwireless::wireless

#endif
