// SPDX-License-Identifier: MIT
#ifndef TAVIWIRELESS_PLATFORM_LINUX_CORE_FAILURE_H
#define TAVIWIRELESS_PLATFORM_LINUX_CORE_FAILURE_H

#include <tavicore/error.h>

#include <cerrno>
#include <exception>
#include <stdexcept>

namespace tavicore {

// Why an SDK function fails. Thrown where the cause is found; Guarded() makes it the error code.
struct Failure {
    int code;  // VEXAC_ERR_...
};

// What errno says about a file. Missing is only what the system calls so; every other error is a
// failure, so that nobody makes settings anew that he could not read. ESRCH is of a process's file
// in "/proc" when that process has ended.
inline Failure FileFailure() {
    const bool isMissing = errno == ENOENT || errno == ENOTDIR || errno == ESRCH;
    return {isMissing ? VEXAC_ERR_NOT_FOUND : VEXAC_ERR_IO};
}

// Throws when one of the pointers is null.
template <typename... Pointers>
void RequireAll(const Pointers*... pointers) {
    if (!(... && (pointers != nullptr))) {
        throw Failure{VEXAC_ERR_BAD_PARAMETER};
    }
}

// Runs the body of an SDK function, whose callers are C: an exception becomes the error code and
// the result `failed`.
template <typename Result, typename Body>
Result Guarded(Result failed, Body body) {
    try {
        return body();
    } catch (const Failure& failure) {
        VEXACErrSet(failure.code);
    } catch (const std::out_of_range&) {  // a file that ends too early
        VEXACErrSet(VEXAC_ERR_IO);
    } catch (const std::exception&) {  // bad_alloc, or length_error of a container
        VEXACErrSet(VEXAC_ERR_OUT_OF_MEMORY);
    }
    return failed;
}

}  // namespace tavicore

#endif
