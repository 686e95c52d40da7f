// SPDX-License-Identifier: MIT
#include "sdk/settings_files.h"

#include <tavicore/file.h>
#include <tavicore/keyvalue.h>

#include "core/failure.h"

using namespace tavicore;

namespace tavisdk {
namespace {

// Throws, unless the SDK call that has just failed found nothing, or a value that is too long.
void RequireMissing() {
    const int code = VEXACErrGet();
    if (code != VEXAC_ERR_NOT_FOUND && code != VEXAC_ERR_TOO_LONG) {
        throw Failure{code};
    }
}

}  // namespace

StringList NewList() {
    StringList list(VEXACSzListAlloc(1024), VEXACSzListFree);
    if (!list) {
        throw Failure{VEXAC_ERR_OUT_OF_MEMORY};
    }
    return list;
}

StringList ListFiles(const char* folder, const char* prefix) {
    StringList files = NewList();
    VEXACSzList* list = files.release();  // it may move as it grows
    const int result = VEXACFileEnumDir(folder, prefix, &list, VEXAC_ENUM_FILES);
    files.reset(list);
    if (result < 0) {
        RequireMissing();
    }
    return files;
}

bool ReadSetting(const std::string& file, const char* key, char* value, size_t size) {
    const int length = VEXACFileGetKeyValue(file.c_str(), key, value, size);
    if (length < 0) {
        RequireMissing();
    }
    return length > 0;
}

bool HasSetting(const std::string& file, const char* key, const char* value) {
    const bool isEqual = VEXACFileCheckKeyValue(file.c_str(), key, value, 0) == 1;
    if (!isEqual) {
        RequireMissing();
    }
    return isEqual;
}

}  // namespace tavisdk
