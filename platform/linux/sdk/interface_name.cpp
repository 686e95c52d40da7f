#include "sdk/interface_name.h"

#include <sys/stat.h>
#include <tavisdk/network.h>

#include <cstring>

#include "core/failure.h"

namespace tavisdk {

bool IsInterfaceName(const char* name) {
    const size_t length = strnlen(name, TAVI_NET_IF_NAME_SIZE);
    return length > 0 && length < TAVI_NET_IF_NAME_SIZE &&
           strpbrk(name, "/ \t\r\n\v\f") == nullptr && strcmp(name, ".") != 0 &&
           strcmp(name, "..") != 0;
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
