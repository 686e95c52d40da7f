// SPDX-License-Identifier: MIT
#include "wireless/station/saved_networks.h"

#include <syslog.h>
#include <tavicore/section.h>

#include <cstdlib>

#include "common/log.h"
#include "common/sz_list.h"
#include "wireless/rules/paths.h"
#include "wireless/system/queue.h"

namespace taviwireless::wireless {

int ListSavedNetworks(WirelessLink* confs, const char* file, int line) {
    if (confs == nullptr) {
        WriteLog(LOG_ERR, file, line, "Bad parameters");
        return -1;
    }
    MakeEmpty(*confs);
    SzList sections(1024);
    if (!sections) {
        WriteLog(LOG_ERR, file, line, "Failed to alloc memory");
        return -1;
    }
    if (VEXACFileEnumSection(kSavedNetworks, sections.Address()) < 0) {
        WriteLog(LOG_ERR, file, line, "Failed to enumerate sections in '%s'", kSavedNetworks);
        return -1;
    }
    for (int i = 0; i < sections.Count(); ++i) {
        auto* conf = static_cast<WirelessConf*>(calloc(1, sizeof(WirelessConf)));
        if (conf == nullptr) {
            WriteLog(LOG_ERR, file, line, "Failed to alloc memory");
            return -1;
        }
        if (TAVIWirelessConfGet(sections[i], conf) != 0) {
            free(conf);
            continue;
        }
        InsertBefore(*confs, conf->link);
    }
    return 0;
}

}  // namespace taviwireless::wireless
