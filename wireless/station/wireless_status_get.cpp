// SPDX-License-Identifier: MIT
// The connection status, and of a connection what is known of its network.
#include <tavisdk/wireless.h>
#include <taviwireless/wireless.h>

#include <cstdio>
#include <optional>
#include <string>

#include "base/trusted_file.h"
#include "common/log.h"
#include "wireless/rules/paths.h"
#include "wireless/system/guarded.h"
#include "wireless/system/link_quality.h"

namespace taviwireless::wireless {

namespace {

// What TAVIWirelessNetworkConnect wrote down of the network that it joined.
struct ConnectionRecord {
    WirelessNetwork network{};
    char bssid[32] = "";  // as text
};

std::optional<ConnectionRecord> ReadConnectionRecord() {
    const std::optional<std::string> text = ReadTrusted(kCurrentConnection);
    if (!text) {
        return std::nullopt;
    }
    constexpr int kItems = 5;
    ConnectionRecord record;
    WirelessNetwork& network = record.network;
    if (sscanf(text->c_str(), "%32[^\n]\n%d\n%d\n%d\n%31[^\n]", network.essid, &network.protocol,
               &network.auth, &network.encrypt, record.bssid) < kItems) {
        return std::nullopt;
    }
    return record;
}

// The signal in percent; a negative number that is no percentage when the driver does not know its
// maximum.
int SignalOfConnection() {
    constexpr int kUnknownMaximum = -1;
    const std::optional<LinkQuality> quality = ReadLinkQuality();
    const int maximum = quality ? quality->maximum.value_or(0) : 0;
    if (maximum == 0) {
        TAVI_LOG_ERROR("Failed to get signal infomation");
        return 0;
    }
    const long long scaled = quality->value * 100LL;
    return static_cast<int>(maximum == kUnknownMaximum ? -scaled : scaled / maximum);
}

bool FillConnectedNetwork(WirelessNetwork& network) {
    const std::optional<ConnectionRecord> record = ReadConnectionRecord();
    if (!record) {
        return false;
    }
    network = record->network;
    network.signal = SignalOfConnection();
    return TAVIWirelessBssidParse(record->bssid, network.bssid) == 0;
}

}  // namespace

}  // namespace taviwireless::wireless

WirelessStatus* TAVIWirelessStatusGet(WirelessStatus* out) {
    using namespace taviwireless::wireless;
    if (out == nullptr) {
        TAVI_LOG_ERROR("Bad parameters");
        return nullptr;
    }
    *out = {};
    if (TAVIWirelessIsSupported() == 0) {
        out->status = WIRELESS_STATUS_NOT_SUPPORTED;
        return out;
    }
    WirelessInfo status{};
    TAVIWirelessCurInfoGet(WIRELESS_INFO_CONN_STATUS, &status);
    out->status = status.value;
    if (out->status == WIRELESS_STATUS_CONNECTED &&
        !TAVI_GUARDED(false, [out] { return FillConnectedNetwork(out->network); })) {
        TAVI_LOG_ERROR("Failed to get wireless network info");
    }
    if (out->status == WIRELESS_STATUS_ADHOC && TAVIWirelessAdhocNetworkGet(&out->network) < 0) {
        TAVI_LOG_ERROR("Failed to get adhoc network info");
    }
    return out;
}
