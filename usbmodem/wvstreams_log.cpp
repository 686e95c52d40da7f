// A file of its own because clang cannot read the header that it includes.
#include "usbmodem/wvstreams_log.h"

#include <syslog.h>
#include <wvlogrcv.h>

#include <string>

#include "common/log.h"

namespace taviwireless::usbmodem_lib {

namespace {

// WvStreams has a receiver for the system log, but that one opens the log anew for each line, and
// so changes where the messages of the whole program go.
class ToSystemLog : public WvLogRcv {
  protected:
    void _mid_line(const char* text, size_t size) override { line_.append(text, size); }
    void _end_line() override {
        MakePrintable(line_.data());
        syslog(LOG_DEBUG, "WvStreams: %s", line_.c_str());
        line_.clear();
    }

  private:
    std::string line_;
};

}  // namespace

void SendWvStreamsMessagesToLog() {
    static ToSystemLog log;
}

}  // namespace taviwireless::usbmodem_lib
