// taviwireless wifi connect: joins a network, and remembers it.
#include <tavisdk/wireless.h>

#include <algorithm>
#include <optional>

#include "base/fixed_field.h"
#include "cli/adapter/credentials.h"
#include "cli/adapter/requirements.h"
#include "cli/terminal.h"
#include "cli/wifi/ip_address.h"
#include "cli/wifi/station.h"
#include "cli/wifi/wifi_commands.h"
#include "cli/wifi/wifi_report.h"

namespace taviwireless::cli {

namespace {

// One connection that is asked for: what is known of the network, then the attempt.
class Joining {
  public:
    explicit Joining(const Options& options)
        : options_(options), name_(Printable(options.network)), saved_(SavedNetworks()) {}

    void Run() {
        WirelessConf conf = Describe(options_.hidden ? HiddenNetwork() : NetworkInRange());
        ShowProgress("Joining " + name_ + " ...");
        LeaveNetwork();
        if (TAVIWirelessNetworkConnect(&conf) != 0) {
            GiveUp(WhyNotJoined(conf));
        }
        SetAddress(conf);
        Save(conf);
    }

  private:
    using Conf = std::optional<WirelessConf>;

    Conf FindSaved(std::optional<Security> security) const {
        const auto found = std::find_if(saved_.begin(), saved_.end(), [&](const auto& conf) {
            return options_.network == conf.network.essid &&
                   (!security || *security == SecurityOf(conf.network));
        });
        return found == saved_.end() ? Conf() : Conf(*found);
    }

    WirelessNetwork NetworkInRange() const {
        ShowProgress("Looking for " + name_ + " ...");
        WirelessNetwork network{};
        const int count =
            TAVIWirelessNetworkGet(options_.network.c_str(), WIRELESS_KEY_ESSID, &network);
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
        CopyField(network.essid, options_.network);
        if (!options_.security.empty()) {
            SetSecurity(network, options_.security);
            return network;
        }
        const Conf saved = FindSaved(std::nullopt);
        if (!saved) {
            throw CommandError(kUsage, "--hidden needs --security for a network that is not saved");
        }
        return saved->network;
    }

    WirelessConf Describe(const WirelessNetwork& network) {
        const Security security = SecurityOf(network);
        if (security == Security::kUnknown) {
            throw CommandError(kFailure,
                               "the security of " + name_ + " is of a kind that cannot be joined");
        }
        const Conf saved = FindSaved(security);
        WirelessConf conf = saved.value_or(WirelessConf{});
        conf.network = network;
        conf.network.opmode = WIRELESS_OPMODE_MANAGED;
        conf.anyBssid = 1;
        DescribeAddress(conf);
        DescribeUser(conf, security);
        isSavedKey_ = saved && HasUsableKey(*saved);
        if (security != Security::kOpen && !isSavedKey_) {
            CopyField(conf.key, ReadKey(security, options_.network));
        }
        return conf;
    }

    // Whether the saved key can be used. An EAP password belongs to its user.
    bool HasUsableKey(const WirelessConf& saved) const {
        const bool isOfUser = options_.user.empty() || options_.user == saved.user;
        return saved.key[0] != '\0' && isOfUser && !options_.newKey;
    }

    void DescribeAddress(WirelessConf& conf) const {
        if (!options_.staticAddress.empty()) {
            SetStaticAddress(conf, options_.staticAddress);
        } else if (options_.dhcp || conf.ipAddr[0] == '\0') {
            SetDHCP(conf);
        }
    }

    void DescribeUser(WirelessConf& conf, Security security) const {
        if (!options_.user.empty()) {
            CopyField(conf.user, options_.user);
        }
        if (security == Security::kEAP && conf.user[0] == '\0') {
            throw CommandError(kUsage, name_ + " wants a user name; add --user NAME");
        }
    }

    std::string WhyNotJoined(const WirelessConf& conf) const {
        const bool isOpen = SecurityOf(conf.network) == Security::kOpen;
        const std::string sentence =
            "could not join " + name_ +
            (isOpen ? ": its access point may be too far away"
                    : ": the key may be wrong, or its access point too far away");
        return sentence +
               (isSavedKey_ ? "; --new-key asks for another key" : "; the system log tells more");
    }

    void SetAddress(const WirelessConf& conf) const {
        ShowProgress("Setting the address ...");
        const bool isSet = TAVIWirelessIfconfigSet(WifiInterface().c_str(), &conf) == 0;
        // The library may report success although there was no lease.
        if (IsDHCP(conf) && (!isSet || WifiAddress().empty())) {
            GiveUp("joined " + name_ + " but got no address by DHCP; --static sets one");
        }
        if (!isSet) {
            GiveUp("joined " + name_ + " but could not set the address " + conf.ipAddr);
        }
        if (IsDHCP(conf) && !UseLeasedGateway()) {
            GiveUp("joined " + name_ + " but could not make " + ConnectionGateway() +
                   " the gateway");
        }
        if (!IsDHCP(conf) && conf.gateway[0] != '\0' && !SetDefaultGateway(conf.gateway)) {
            GiveUp("joined " + name_ + " but could not make " + conf.gateway + " the gateway");
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
    }

    [[noreturn]] static void GiveUp(const std::string& sentence) {
        TAVIWirelessNetworkDisconnect();
        throw CommandError(kFailure, sentence);
    }

    const Options& options_;
    const std::string name_;
    const std::vector<WirelessConf> saved_;
    bool isSavedKey_ = false;
};

}  // namespace

void ConnectWifi(const Options& options) {
    CheckEssid(options.network);
    if (!options.staticAddress.empty()) {
        WirelessConf ignored{};
        SetStaticAddress(ignored, options.staticAddress);
    }
    CheckUser(options.user);
    RequireAdapter();
    RequireRadio();
    RequireNobodyJoins();
    Joining(options).Run();
    PrintConnection(options);
}

}  // namespace taviwireless::cli
