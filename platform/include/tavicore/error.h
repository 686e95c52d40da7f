/* SPDX-License-Identifier: MIT */
/*
 * The SDK's error code: why the last SDK call of this thread failed.
 *
 * A call that fails sets the code; a call that succeeds leaves it alone, so it is only meaningful
 * right after a failure. Users of the SDK set it too, for failures of their own.
 */
#ifndef TAVIWIRELESS_PLATFORM_INCLUDE_TAVICORE_ERROR_H
#define TAVIWIRELESS_PLATFORM_INCLUDE_TAVICORE_ERROR_H

#include <tavicore/export.h>

#ifdef __cplusplus
extern "C" {
#endif

enum {
    VEXAC_ERR_NONE = 0x0000,
    VEXAC_ERR_OUT_OF_MEMORY = 0x0200, /* for the call's own copies or its result */
    VEXAC_ERR_NOT_FOUND = 0x0700,     /* no such file, section, key or process */
    VEXAC_ERR_IO = 0x0800,            /* the file cannot be opened, read, written or replaced */
    VEXAC_ERR_TOO_LONG = 0x0900,      /* the value does not fit into the caller's buffer */
    VEXAC_ERR_LOCKED = 0x0A00,        /* another process has kept the file's lock for 2 s */
    VEXAC_ERR_BAD_PARAMETER = 0x0D00, /* a null argument, or text that the file cannot hold */
    VEXAC_ERR_FORK_FAILED = 0x2A00    /* the system makes no further process */
};

/* Records code, one of the above, as the calling thread's error code; other threads keep theirs. */
TAVI_SDK_API void VEXACErrSet(int code);

/*
 * Returns the calling thread's error code; VEXAC_ERR_NONE before the first failure. Asking does not
 * change it.
 */
TAVI_SDK_API int VEXACErrGet(void);

#ifdef __cplusplus
}
#endif

#endif
