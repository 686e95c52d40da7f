// SPDX-License-Identifier: MIT
#ifndef TAVIWIRELESS_CLI_WIFI_CHANNELS_H
#define TAVIWIRELESS_CLI_WIFI_CHANNELS_H

#include <vector>

#include "cli/report.h"
#include "cli/wifi/station.h"

namespace taviwireless::cli {

// Who is on which channel: a picture per band, in which each network has a line and the channels
// are columns, as wide as the terminal allows. As a document, a list of channels that are in use.
Report DescribeChannels(const std::vector<NetworkInRange>& networks);

}  // namespace taviwireless::cli

#endif
