// SPDX-License-Identifier: MIT
#include <algorithm>
#include <vector>

#include "common/log.h"
#include "wireless/station/saved_networks.h"
#include "wireless/system/guarded.h"
#include "wireless/system/queue.h"

namespace taviwireless::wireless {

namespace {

// Puts the last used first; networks of one time stay in the order of the file. False, with the
// list as it was, when there is no memory for that.
bool SortByTime(WirelessLink& head) {
    std::vector<WirelessConf*> confs;
    WIRELESS_FOR_EACH(conf, &head, WirelessConf) {
        confs.push_back(conf);
    }
    std::stable_sort(confs.begin(), confs.end(), [](WirelessConf* a, WirelessConf* b) {
        return a->accessTime > b->accessTime;
    });
    MakeEmpty(head);
    for (WirelessConf* conf : confs) {
        InsertBefore(head, conf->link);
    }
    return true;
}

}  // namespace

}  // namespace taviwireless::wireless

int TAVIWirelessConfEnumByAtime(WirelessLink* confs) {
    using namespace taviwireless::wireless;
    const int result = ListSavedNetworks(confs, __FILE_NAME__, __LINE__);
    if (confs == nullptr) {
        return result;
    }
    return TAVI_GUARDED(false, [confs] { return SortByTime(*confs); }) ? result : -1;
}
