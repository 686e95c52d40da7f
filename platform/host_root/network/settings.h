// SPDX-License-Identifier: MIT
#ifndef TAVIWIRELESS_PLATFORM_HOST_ROOT_NETWORK_SETTINGS_H
#define TAVIWIRELESS_PLATFORM_HOST_ROOT_NETWORK_SETTINGS_H

#include <optional>
#include <string>
#include <vector>

// What the saved settings say, as the SDK reads them.
namespace taviwireless::network {

// The guests' bridge: the access point's configuration puts them there.
constexpr char kGuestBridge[] = "gbr";

// Addresses of an interface or a bridge.
struct Card {
    bool byDhcp = false;
    std::string address;  // "10.1.14.1/24", or empty
    bool IsEmpty() const { return !byDhcp && address.empty(); }
};

struct BridgeSettings {
    std::string name;
    bool isOn = false;                 // there is to be such a bridge
    std::vector<std::string> members;  // the first one first
    Card card;                         // its own, or where it has none, that of a wired member
    bool servesLeases = false;         // a DHCP server runs on it
};

struct Settings {
    std::string interface;
    bool accessPoint = false;
    bool guests = false;
    std::vector<BridgeSettings>
        bridges;          // the one that is asked for, if one is, and that of guests
    std::string gateway;  // empty where none is configured
};

// What switching the access point on will have added to the settings.
struct Enabled {
    bool guests = false;
    std::string member;   // of a bridge without settings
    std::string address;  // "10.1.14.1/24", of a bridge without settings
    bool leases = false;  // the bridge has a DHCP server
};

// Throws Error when the names are none, or the settings cannot be made sense of. An empty bridge
// is the one that the interface is in, if it is in one: whoever took its name from the settings may
// have been killed before the network followed.
Settings ReadSettings(const std::string& interface, const std::string& bridge,
                      const std::optional<Enabled>& enabled = std::nullopt);

// What an interface has when it is on its own: the card of its file when that says ONBOOT=yes, else
// an empty one. HasFile tells whether there is one at all.
Card OwnCard(const std::string& interface);
bool HasFile(const std::string& interface);

// The settings of a bridge's DHCP server.
std::string DhcpServerInfo(const std::string& bridge);

}  // namespace taviwireless::network

#endif
