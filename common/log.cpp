#include "common/log.h"

#include <cerrno>
#include <cstdarg>
#include <cstdio>

namespace taviwireless {

// Long enough for every path and reply that is logged; longer messages are cut.
constexpr int kMaxMessage = 2048;

void WriteLog(int priority, const char* file, int line, const char* format, ...) {
    const int savedErrno = errno;  // callers look at errno after they logged it
    char message[kMaxMessage];
    va_list arguments;
    va_start(arguments, format);
    vsnprintf(message, sizeof message, format, arguments);
    va_end(arguments);
    syslog(priority, "%s:%d %s", file, line, message);
    errno = savedErrno;
}

}  // namespace taviwireless
