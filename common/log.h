#ifndef TAVIWIRELESS_COMMON_LOG_H
#define TAVIWIRELESS_COMMON_LOG_H

// Writes one line at error priority to the system log: "FILE:LINE message". FILE is the source file
// without its folder. The format is printf's; it is always a literal, and foreign text is only ever
// an argument.
#define TAVI_LOG_ERROR(...) ::taviwireless::WriteLog(LOG_ERR, __FILE_NAME__, __LINE__, __VA_ARGS__)

// The same at debug priority.
#define TAVI_LOG_DEBUG(...) \
    ::taviwireless::WriteLog(LOG_DEBUG, __FILE_NAME__, __LINE__, __VA_ARGS__)

#include <syslog.h>

namespace taviwireless {

void WriteLog(int priority, const char* file, int line, const char* format, ...)
    __attribute__((format(printf, 4, 5)));

}  // namespace taviwireless

#endif
