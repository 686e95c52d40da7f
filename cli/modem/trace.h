// SPDX-License-Identifier: MIT
#ifndef TAVIWIRELESS_CLI_MODEM_TRACE_H
#define TAVIWIRELESS_CLI_MODEM_TRACE_H

#include <syslog.h>

#include <string>

#include "cli/terminal.h"
#include "usbmodem/rules/trace.h"

namespace taviwireless::cli {

// With --verbose, tells what is done; secrets are no part of that.
inline void Trace(const std::string& text) {
    if (usbmodem_lib::IsTraced()) {
        syslog(LOG_DEBUG, "%s", Printable(text).c_str());
    }
}

}  // namespace taviwireless::cli

#endif
