// SPDX-License-Identifier: MIT
#include "sdk/interface_name.h"

#include <sys/stat.h>
#include <tavisdk/network.h>

#include <cstring>

#include "base/interface_name.h"
#include "core/failure.h"

namespace tavisdk {

bool IsInterfaceName(const char* name) {
    return taviwireless::IsInterfaceName({name, strnlen(name, TAVI_NET_IF_NAME_SIZE)});
}

void RequireInterfaceName(const char* name) {
    if (!IsInterfaceName(name)) {
        throw tavicore::Failure{VEXAC_ERR_BAD_PARAMETER};
    }
}

void MakeFolder(const char* path) {
    mkdir(path, 0755);
}

}  // namespace tavisdk
