// SPDX-License-Identifier: MIT
#ifndef TAVIWIRELESS_WIRELESS_STATION_SAVED_NETWORKS_H
#define TAVIWIRELESS_WIRELESS_STATION_SAVED_NETWORKS_H

#include <taviwireless/wireless.h>

namespace taviwireless::wireless {

// Lists the saved networks that can be read, in the order of the file. Returns 0 or -1, with the
// list as far as it got; file and line are those of the log lines.
int ListSavedNetworks(WirelessLink* confs, const char* file, int line);

}  // namespace taviwireless::wireless

#endif
