// SPDX-License-Identifier: MIT
#ifndef TAVIWIRELESS_BASE_TERMINAL_COLUMNS_H
#define TAVIWIRELESS_BASE_TERMINAL_COLUMNS_H

#include <sys/ioctl.h>
#include <unistd.h>

namespace taviwireless {

// Columns of the terminal that a descriptor is; 0 when it is none. A serial line does not know its
// own: the usual 80.
inline int ColumnsOf(int descriptor) {
    if (isatty(descriptor) == 0) {
        return 0;
    }
    winsize size{};
    const bool isKnown = ioctl(descriptor, TIOCGWINSZ, &size) == 0 && size.ws_col > 0;
    return isKnown ? size.ws_col : 80;
}

}  // namespace taviwireless

#endif
