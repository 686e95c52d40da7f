// SPDX-License-Identifier: MIT
#ifndef TAVIWIRELESS_CLI_WIFI_JOINING_H
#define TAVIWIRELESS_CLI_WIFI_JOINING_H

#include <taviwireless/wireless.h>

#include <optional>
#include <string>

#include "cli/options.h"

namespace taviwireless::cli {

// Joins the network of conf, with its address, gateway and name servers. Returns why not, the end
// of a sentence: "could not join ..."; empty when it is joined.
std::string Join(WirelessConf& conf, const std::string& nameServers);

// The connection that there is when another one is to take its place.
class FormerConnection {
  public:
    FormerConnection();

    // Ends a failed attempt, and goes back on the network that was left for it. Returns what became
    // of that, to be added to the sentence of the failure.
    std::string ComeBack();
    // When the attempt is cut off: no connection, and a sentence that says why and so.
    void Undo(const Options& options, const std::string& why) const;

  private:
    std::string name_;                   // of a network that was left; empty: there was none
    std::optional<WirelessConf> saved_;  // how to join it again
};

}  // namespace taviwireless::cli

#endif
