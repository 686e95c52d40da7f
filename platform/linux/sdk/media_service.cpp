// SPDX-License-Identifier: MIT
// The media service.
#include <tavicore/file.h>
#include <tavicore/process.h>
#include <tavisdk/service.h>

#include "core/failure.h"

using namespace tavicore;

namespace {
constexpr char kScript[] = "/etc/rc.mediaservice";
}

int TAVIMediaService(int action) {
    return Guarded(-1, [&] {
        if (action != TAVI_MEDIA_SERVICE_RESTART) {
            throw Failure{VEXAC_ERR_BAD_PARAMETER};
        }
        if (VEXACFileExist(kScript) == 0) {
            throw Failure{VEXACErrGet()};
        }
        if (VEXACExec(kScript, "restart", nullptr) != 0) {
            throw Failure{VEXAC_ERR_IO};
        }
        return 0;
    });
}
