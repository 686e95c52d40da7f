// SPDX-License-Identifier: MIT
#include "wireless/system/section_store.h"

#include <tavicore/error.h>
#include <tavicore/section.h>

#include "base/unique_fd.h"
#include "common/log.h"
#include "wireless/rules/paths.h"
#include "wireless/system/files.h"

namespace taviwireless::wireless {

Found FindStore(const char* store, const char* file, int line) {
    constexpr mode_t kMode = 0600;
    if (!IsMissing(store)) {
        return Found::kExisting;
    }
    if (!UniqueFd(open(store, O_WRONLY | O_CREAT | O_CLOEXEC, kMode))) {
        WriteLog(LOG_ERR, file, line, "Failed to touch %s", store);
        return Found::kFailed;
    }
    return Found::kNew;
}

bool SaveSection(const char* store, Found found, const char* section, const SzHash& values,
                 const char* file, int line) {
    const bool isNew = found == Found::kNew;
    const int result =
        isNew ? VEXACFileAddSection(store, section, values.Get(), kSectionLine)
              : VEXACFileSetSection(store, section, nullptr, values.Get(), kSectionLine);
    if (result < 1) {
        WriteLog(LOG_ERR, file, line, "Failed to %s section: %s from %s, errno=0x%X",
                 isNew ? "add" : "set", section, store, VEXACErrGet());
    }
    return result >= 1;
}

}  // namespace taviwireless::wireless
