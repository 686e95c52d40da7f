// SPDX-License-Identifier: MIT
// taviwireless wifi saved, forget: the networks that were joined before.
#include <algorithm>

#include "base/fixed_field.h"
#include "cli/adapter/credentials.h"
#include "cli/adapter/requirements.h"
#include "cli/command_error.h"
#include "cli/terminal.h"
#include "cli/wifi/ip_address.h"
#include "cli/wifi/network_name.h"
#include "cli/wifi/saved_networks.h"
#include "cli/wifi/wifi_commands.h"
#include "cli/wifi/wifi_report.h"

namespace taviwireless::cli {

namespace {

// A saved network with the changes that are asked for.
struct EditedNetwork {
    WirelessConf conf;
    std::string nameServers;
    SavedValues values;  // to be written beside its address
};

void EditKey(EditedNetwork& network, const std::string&) {
    const WirelessNetwork& of = network.conf.network;
    if (SecurityOf(of) == Security::kOpen) {
        throw CommandError(kUsage, Printable(of.essid) + " is an open network, which has no key");
    }
    network.values.emplace_back("KEY", ReadKey(SecurityOf(of), of.essid));
}

void EditUser(EditedNetwork& network, const std::string& value) {
    CheckUser(value);
    if (SecurityOf(network.conf.network) != Security::kEAP) {
        throw CommandError(kUsage, Printable(network.conf.network.essid) + " wants no user name");
    }
    network.values.emplace_back("USER", value);
}

void EditDHCP(EditedNetwork& network, const std::string& value) {
    if (value == "yes") {
        SetDHCP(network.conf);
        network.nameServers.clear();
    } else if (value != "no") {
        throw CommandError(kUsage, "dhcp is yes or no");
    } else if (IsDHCP(network.conf)) {
        throw CommandError(kUsage, "dhcp=no needs an address before it: address=ADDRESS/PREFIX");
    }
}

void EditAddress(EditedNetwork& network, const std::string& value) {
    SetOwnAddress(network.conf, value);
}

void EditGateway(EditedNetwork& network, const std::string& value) {
    SetGateway(network.conf, value);
}

void EditNameServers(EditedNetwork& network, const std::string& value) {
    CheckNameServers(value);
    network.nameServers = value;
}

struct Setting {
    const char* key;
    void (*edit)(EditedNetwork& network, const std::string& value);
    bool isSecret = false;
};
constexpr Setting kSettings[] = {{"key", EditKey, true},   {"user", EditUser},
                                 {"dhcp", EditDHCP},       {"address", EditAddress},
                                 {"gateway", EditGateway}, {"dns", EditNameServers}};

void Edit(EditedNetwork& network, const std::string& text) {
    const size_t equals = text.find('=');
    const bool hasValue = equals != std::string::npos;
    const std::string key = text.substr(0, equals);
    for (const Setting& setting : kSettings) {
        if (key != setting.key) {
            continue;
        }
        if (setting.isSecret && hasValue) {
            throw CommandError(kUsage, key +
                                           " is not taken on the command line, where others "
                                           "see it; say " +
                                           key + " alone, and it is read from standard input");
        }
        if (!setting.isSecret && !hasValue) {
            throw CommandError(kUsage, key + " needs a value: " + key + "=VALUE");
        }
        setting.edit(network, hasValue ? text.substr(equals + 1) : "");
        return;
    }
    throw CommandError(kUsage, "there is no setting " + Printable(key) +
                                   "; there are key, user, dhcp, address, gateway and dns");
}

}  // namespace

void ListSavedNetworks(const Options& options) {
    RequireWifiSettings();
    Print(options, DescribeAll(SavedNetworks()));
}

// Shows, of several access points with one name, the one that was used last.
void ShowSavedNetwork(const Options& options) {
    RequireWifiSettings();
    Print(options, Describe(SavedNetworksCalled(options.network).front(), options.showSecrets));
}

std::vector<std::string> SavedSettingWords() {
    std::vector<std::string> words;
    for (const Setting& setting : kSettings) {
        words.push_back(setting.key + std::string(setting.isSecret ? "" : "="));
    }
    return words;
}

void EditSavedNetwork(const Options& options) {
    RequireWifiSettings();
    EditedNetwork network{SavedNetworksCalled(options.network).front(), "", {}};
    network.nameServers = SavedNameServers(network.conf);
    for (const std::string& text : options.settings) {
        Edit(network, text);
    }
    CheckAddress(network.conf, network.nameServers);
    for (auto& value : AddressValues(network.conf, network.nameServers)) {
        network.values.push_back(std::move(value));
    }
    SaveValues(network.conf, network.values);
    PrintOutcome(options,
                 Printable(network.conf.network.essid) +
                     ": saved; it counts when the network is joined the next time",
                 [&] { return Describe(SavedNetworksCalled(options.network).front()); });
}

// By its name, all of its access points.
void ForgetNetwork(const Options& options) {
    RequireWifiSettings();
    for (const WirelessConf& conf : SavedNetworksCalled(options.network)) {
        RemoveSaved(conf);
    }
    PrintOutcome(options,
                 Printable(options.network) + " is forgotten; a connection that there is stays",
                 [] { return DescribeAll(SavedNetworks()); });
}

}  // namespace taviwireless::cli
