// SPDX-License-Identifier: MIT
#include <tavicore/error.h>

namespace {
thread_local int lastError = VEXAC_ERR_NONE;
}

void VEXACErrSet(int code) {
    lastError = code;
}

int VEXACErrGet() {
    return lastError;
}
