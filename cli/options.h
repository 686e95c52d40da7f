// SPDX-License-Identifier: MIT
#ifndef TAVIWIRELESS_CLI_OPTIONS_H
#define TAVIWIRELESS_CLI_OPTIONS_H

#include <optional>
#include <string>
#include <vector>

namespace taviwireless::cli {

// What the command line says.
struct Options {
    bool json = false;

    // modem
    bool direct = false;         // ask the modems themselves, not the service
    std::string id;              // device id; empty when none was given
    std::string atCommand;       // at
    std::optional<int> timeout;  // seconds
    bool showSecrets = false;
    bool force = false;                 // use up the last attempt without a question
    bool noWait = false;                // connect: return as soon as the dialler runs
    std::vector<std::string> settings;  // profile set, ap set: KEY=VALUE or KEY

    // ap
    bool dryRun = false;       // enable: show what would be done
    bool guest = false;        // qr: of the network for guests
    bool openNetwork = false;  // enable: without settings, a network that everybody can join

    // wifi
    std::string network;        // SSID, or BSSID
    std::string user;           // EAP identity
    std::string staticAddress;  // ADDRESS/PREFIX[,GATEWAY]
    std::string nameServers;    // ADDRESS[,ADDRESS]
    std::string security;       // of a hidden network
    std::string mode;           // "ap" or "client"; "on" or "off"
    bool dhcp = false;          // also where a static address is saved
    bool newKey = false;        // ask for the key although one is saved
    bool hidden = false;        // the network does not show in a scan
    bool wep = false;           // adhoc: with a WEP key
    bool channels = false;      // scan: draw who is on which channel
};

}  // namespace taviwireless::cli

#endif
