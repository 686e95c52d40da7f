// SPDX-License-Identifier: MIT
#ifndef TAVIWIRELESS_USBMODEM_RULES_TRACE_H
#define TAVIWIRELESS_USBMODEM_RULES_TRACE_H

#include <cstdlib>

// For whoever looks for a fault: a process that has this in its environment, whatever the value,
// logs its dialogue with the modems at debug priority, with PINs and PUKs masked.
namespace taviwireless::usbmodem_lib {

inline constexpr char kTraceVariable[] = "TAVIWIRELESS_TRACE";

inline bool IsTraced() {
    return std::getenv(kTraceVariable) != nullptr;
}
inline void SwitchTraceOn() {
    setenv(kTraceVariable, "1", 1);
}

}  // namespace taviwireless::usbmodem_lib

#endif
