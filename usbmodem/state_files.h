// SPDX-License-Identifier: MIT
#ifndef TAVIWIRELESS_USBMODEM_STATE_FILES_H
#define TAVIWIRELESS_USBMODEM_STATE_FILES_H

#include <sys/types.h>

#include <string>

namespace taviwireless::usbmodem_lib {

// A profile holds a password, a dialler's log whom the user calls.
inline constexpr mode_t kStateFileMode = 0600;

// Puts an empty file that only its owner may read in the place of whatever file path names.
bool MakeEmptyFile(const std::string& path);

}  // namespace taviwireless::usbmodem_lib

#endif
