// SPDX-License-Identifier: MIT
#ifndef TAVIWIRELESS_COMMON_LOG_H
#define TAVIWIRELESS_COMMON_LOG_H

#include <syslog.h>

#include "base/file_name.h"

// Writes one line at error priority to the system log: "FILE:LINE message". FILE is the source file
// without its folder. The format is printf's; it is always a literal, and foreign text is only ever
// an argument.
//
// Lines end up on terminals, and much of what stands in them was sent by modems, radios and bus
// clients. So every line is printable: see MakePrintable.
#define TAVI_LOG_ERROR(...) ::taviwireless::WriteLog(LOG_ERR, __FILE_NAME__, __LINE__, __VA_ARGS__)

// Writes such a line at debug priority.
#define TAVI_LOG_DEBUG(...) \
    ::taviwireless::WriteLog(LOG_DEBUG, __FILE_NAME__, __LINE__, __VA_ARGS__)

namespace taviwireless {

void WriteLog(int priority, const char* file, int line, const char* format, ...)
    __attribute__((format(printf, 4, 5)));

// Puts "?" in place of every byte of text that is neither printable ASCII nor part of a UTF-8
// character. Control characters, line breaks and those beyond ASCII among them, are not printable;
// only a line feed at the end stays, since it ends the line in any case.
void MakePrintable(char* text);

}  // namespace taviwireless

#endif
