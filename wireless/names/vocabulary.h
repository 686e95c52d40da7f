#ifndef TAVIWIRELESS_WIRELESS_NAMES_VOCABULARY_H
#define TAVIWIRELESS_WIRELESS_NAMES_VOCABULARY_H

#include <strings.h>
#include <taviwireless/wireless.h>

namespace taviwireless::wireless {

// The value of a name of the table, whatever its case.
template <size_t N>
int ValueOf(const WirelessNameValue (&names)[N], const char* text, int unknown) {
    for (const WirelessNameValue& entry : names) {
        if (strcasecmp(text, entry.name) == 0) {
            return entry.value;
        }
    }
    return unknown;
}

}  // namespace taviwireless::wireless

#endif
