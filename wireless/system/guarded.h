// SPDX-License-Identifier: MIT
#ifndef TAVIWIRELESS_WIRELESS_SYSTEM_GUARDED_H
#define TAVIWIRELESS_WIRELESS_SYSTEM_GUARDED_H

#include <new>

#include "common/log.h"

namespace taviwireless::wireless {

// The result of the work of a C function, or `onFailure` when there is no memory for it: no
// exception may leave such a function. file and line are those of the log line.
template <typename Result, typename Work>
Result Guarded(Result onFailure, const char* file, int line, const Work& work) {
    try {
        return work();
    } catch (const std::bad_alloc&) {
        WriteLog(LOG_ERR, file, line, "Failed to alloc memory");
        return onFailure;
    }
}

}  // namespace taviwireless::wireless

#define TAVI_GUARDED(onFailure, work) \
    ::taviwireless::wireless::Guarded(onFailure, __FILE_NAME__, __LINE__, work)

#endif
