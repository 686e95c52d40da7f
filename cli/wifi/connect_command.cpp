// SPDX-License-Identifier: MIT
// taviwireless wifi connect: joins a network, and remembers it.
#include <algorithm>
#include <optional>

#include "base/fixed_field.h"
#include "cli/adapter/credentials.h"
#include "cli/adapter/requirements.h"
#include "cli/deadline.h"
#include "cli/interrupt.h"
#include "cli/terminal.h"
#include "cli/wifi/ip_address.h"
#include "cli/wifi/joining.h"
#include "cli/wifi/network_name.h"
#include "cli/wifi/saved_networks.h"
#include "cli/wifi/station.h"
#include "cli/wifi/wifi_commands.h"
#include "cli/wifi/wifi_report.h"
#include "wireless/rules/supplicant.h"

namespace taviwireless::cli {

namespace {

// One connection that is asked for: what is known of the network, then the attempt.
class Connecting {
  public:
    explicit Connecting(const Options& options)
        : options_(options),
          wanted_(options.network),
          name_(Printable(options.network)),
          saved_(SavedNetworks()) {}

    void Run() {
        WirelessConf conf = Describe(options_.hidden ? HiddenNetwork() : NetworkInReach());
        FormerConnection former;
        const UndoneBySignal guard([&](const auto& why) { former.Undo(options_, why); },
                                   options_.timeout);
        LeaveNetwork();
        const std::string fault = Join(conf, nameServers_);
        if (!fault.empty()) {
            const std::string comeBack = former.ComeBack();
            throw CommandError(
                kFailure,
                fault + (isSavedKey_ ? "; --new-key asks for another key" : "") + comeBack);
        }
        Save(conf);
    }

  private:
    WirelessNetwork NetworkInReach() const {
        ShowProgress("Looking for " + name_ + " ...");
        WirelessNetwork network{};
        const int count = Deadline(options_).Limit(
            [&] { return TAVIWirelessNetworkGet(wanted_.Key(), wanted_.KeyKind(), &network); });
        if (count < 0) {
            throw ScanError();
        }
        if (count == 0) {
            throw CommandError(kNotFound,
                               "there is no network " + name_ +
                                   " in range; taviwireless wifi scan shows those that are, and "
                                   "--hidden joins one that does not show");
        }
        return network;
    }

    WirelessNetwork HiddenNetwork() const {
        WirelessNetwork network{};
        if (wanted_.IsBssid()) {
            throw CommandError(kUsage, "a hidden network is joined by its name");
        }
        CopyField(network.essid, options_.network);
        if (!options_.security.empty()) {
            SetSecurity(network, options_.security);
            return network;
        }
        const auto saved = std::find_if(saved_.begin(), saved_.end(), [&](const auto& conf) {
            return wanted_.IsOf(conf.network);
        });
        if (saved == saved_.end()) {
            throw CommandError(kUsage, "--hidden needs --security for a network that is not saved");
        }
        return saved->network;
    }

    WirelessConf Describe(const WirelessNetwork& network) {
        const Security security = SecurityOf(network);
        if (security == Security::kUnknown) {
            throw CommandError(kFailure, WhyNotJoinable(network));
        }
        const WirelessConf* saved = FindSaved(saved_, network);
        WirelessConf conf = saved != nullptr ? *saved : WirelessConf{};
        conf.network = network;
        conf.network.opmode = WIRELESS_OPMODE_MANAGED;
        conf.anyBssid = wanted_.IsBssid() ? 0 : 1;
        DescribeAddress(conf, saved);
        DescribeUser(conf, security);
        isSavedKey_ = saved != nullptr && HasUsableKey(*saved);
        if (security != Security::kOpen && !isSavedKey_) {
            CopyField(conf.key, ReadKey(security, network.essid));
        }
        CheckReadable(conf);
        return conf;
    }

    std::string WhyNotJoinable(const WirelessNetwork& network) const {
        const std::string newer = NewerSecurityOf(network);
        return name_ + " wants " +
               (newer.empty() ? "protection of a kind that has no name here: WPA3, OWE, or another "
                                "newer than WPA2"
                              : newer) +
               "; the adapter is driven by the wireless extensions, which know WPA2 at most, so "
               "its access point has to offer WPA2 as well";
    }

    // Whether the saved key can be used. An EAP password belongs to its user.
    bool HasUsableKey(const WirelessConf& saved) const {
        const bool isOfUser = options_.user.empty() || options_.user == saved.user;
        return saved.key[0] != '\0' && isOfUser && !options_.newKey;
    }

    void DescribeAddress(WirelessConf& conf, const WirelessConf* saved) {
        if (!options_.staticAddress.empty()) {
            SetStaticAddress(conf, options_.staticAddress);
        } else if (options_.dhcp || conf.ipAddr[0] == '\0') {
            SetDHCP(conf);
        } else if (saved != nullptr) {
            nameServers_ = SavedNameServers(*saved);
        }
        if (!options_.nameServers.empty()) {
            nameServers_ = options_.nameServers;
        }
        CheckAddress(conf, nameServers_);
    }

    void DescribeUser(WirelessConf& conf, Security security) const {
        if (!options_.user.empty()) {
            CopyField(conf.user, options_.user);
        }
        if (security == Security::kEAP && conf.user[0] == '\0') {
            throw CommandError(kUsage, name_ + " wants a user name; add --user NAME");
        }
    }

    // The supplicant would be given other texts than were meant, and the key be blamed.
    static void CheckReadable(const WirelessConf& conf) {
        const Security security = SecurityOf(conf.network);
        const struct {
            const char* what;
            const char* text;
            bool isUsed;
        } kTexts[] = {{"the name", conf.network.essid, true},
                      {"the user name", conf.user, security == Security::kEAP},
                      {"the key", conf.key, security != Security::kOpen}};
        for (const auto& [what, text, isUsed] : kTexts) {
            if (isUsed && wireless::IsCutBySupplicant(text)) {
                throw CommandError(kUsage, std::string(what) +
                                               " of this network holds a # behind a quote (\"), "
                                               "where wpa_supplicant takes it for a comment, so it "
                                               "cannot be joined; nothing was tried");
            }
        }
    }

    // A network is saved under the address of its access point. A hidden one tells it once it was
    // joined.
    static void FindBssid(WirelessNetwork& network) {
        if (BssidText(network.bssid).empty()) {
            const WirelessStatus status = LookAtWifi();
            std::copy(std::begin(status.network.bssid), std::end(status.network.bssid),
                      network.bssid);
        }
    }

    void Save(WirelessConf& conf) const {
        ShowProgress("Saving " + name_ + " ...");
        FindBssid(conf.network);
        if (TAVIWirelessConfSet(&conf) != 0) {
            throw CommandError(kFailure, "connected to " + name_ +
                                             " but could not save it; the system log tells why");
        }
        if (SavedNameServers(conf) != nameServers_) {
            SaveValues(conf, AddressValues(conf, nameServers_));
        }
    }

    const Options& options_;
    const NetworkName wanted_;
    const std::string name_;
    const std::vector<WirelessConf> saved_;
    std::string nameServers_;
    bool isSavedKey_ = false;
};

}  // namespace

void ConnectWifi(const Options& options) {
    CheckEssid(options.network);
    WirelessConf ignored{};
    if (!options.staticAddress.empty()) {
        SetStaticAddress(ignored, options.staticAddress);
    }
    CheckNameServers(options.nameServers);
    CheckUser(options.user);
    RequireAdapter();
    RequireRadio();
    RequireScanner();
    RequireSupplicant();
    RequireNobodyJoins();
    Connecting(options).Run();
    PrintConnection(options);
}

}  // namespace taviwireless::cli
