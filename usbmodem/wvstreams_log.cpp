// SPDX-License-Identifier: MIT
#include "usbmodem/wvstreams_log.h"

#include <syslog.h>
#include <wvlog.h>

#include <string>

#include "base/split.h"
#include "common/log.h"

namespace taviwireless::usbmodem_lib {

namespace {

// WvStreams has receivers of its own: the one for the system log opens that anew for each line, and
// so changes where the messages of the whole program go; clang cannot read the header of the others.
class ToSystemLog : public WvLogRcvBase {
  protected:
    void log(WvStringParm, int level, const char* text, size_t size) override {
        if (level >= WvLog::Debug) {
            return;  // about settings of a serial port that no pseudo-terminal has, for example
        }
        for (std::string line : Lines(std::string(text, size))) {
            MakePrintable(line.data());
            syslog(LOG_DEBUG, "WvStreams: %s", line.c_str());
        }
    }
};

}  // namespace

void SendWvStreamsMessagesToLog() {
    static ToSystemLog log;
}

}  // namespace taviwireless::usbmodem_lib
