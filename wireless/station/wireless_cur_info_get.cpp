// SPDX-License-Identifier: MIT
// What the driver says of the wireless interface, one thing at a time.
#include <tavisdk/network.h>
#include <taviwireless/wireless.h>

#include <algorithm>
#include <cstring>
#include <optional>
#include <string>

#include "common/log.h"
#include "wireless/system/driver_request.h"
#include "wireless/system/guarded.h"
#include "wireless/system/interface.h"

namespace taviwireless::wireless {

namespace {

bool AskDriver(unsigned long request, iwreq& argument) {
    return RequestDriver(request, argument) == DriverResult::kDone;
}

// Fills essid, a text of at most 32 bytes in a field of WIRELESS_ESSID_SIZE.
bool GetEssid(char* essid) {
    char received[WIRELESS_ESSID_SIZE] = {};  // a driver need not end it with a zero byte
    iwreq argument{};
    argument.u.essid.pointer = received;
    argument.u.essid.length = sizeof received;
    if (!AskDriver(SIOCGIWESSID, argument)) {
        TAVI_LOG_ERROR("Failed to request essid.");
        return false;
    }
    memset(essid, 0, WIRELESS_ESSID_SIZE);
    memcpy(essid, received, std::min<size_t>(argument.u.essid.length, sizeof received - 1));
    return true;
}

std::optional<int> Protocol() {
    iwreq argument{};
    if (!AskDriver(SIOCGIWNAME, argument)) {
        TAVI_LOG_ERROR("Failed to request protocol.");
        return std::nullopt;
    }
    constexpr char kStandard[] = "IEEE 802.11";  // and then letters, "bgn"
    const std::string name(argument.u.name, strnlen(argument.u.name, sizeof argument.u.name));
    if (name.find(kStandard) == std::string::npos) {
        return WIRELESS_PROTOCOL_UNKNOWN;
    }
    return TAVIWirelessProtocolParse(name.c_str() + strlen(kStandard));
}

std::optional<int> KeyState() {
    constexpr int kNoKey = 1;
    constexpr int kKeyIsSet = 2;
    char key[IW_ENCODING_TOKEN_MAX];
    iwreq argument{};
    argument.u.encoding.pointer = key;
    argument.u.encoding.length = sizeof key;
    if (!AskDriver(SIOCGIWENCODE, argument)) {
        TAVI_LOG_ERROR("Failed to request auth.");
        return std::nullopt;
    }
    std::fill_n(static_cast<volatile char*>(key), sizeof key, '\0');  // for certain
    const iw_point& encoding = argument.u.encoding;
    const bool isOff = (encoding.flags & IW_ENCODE_DISABLED) != 0 || encoding.length == 0;
    return isOff ? kNoKey : kKeyIsSet;
}

bool IsAssociated() {
    iwreq argument{};
    if (!AskDriver(SIOCGIWAP, argument)) {
        return false;
    }
    const char* address = argument.u.ap_addr.sa_data;
    return std::any_of(address, address + 6, [](char byte) { return byte != 0; });
}

std::optional<int> ConnectionStatus() {
    if (TAVIWirelessAdapterNum() <= 0) {
        return WIRELESS_STATUS_NO_ADAPTER;
    }
    const std::string interface = WirelessInterface();
    if (interface.empty()) {
        return std::nullopt;
    }
    if (TAVINetIsIFUp(interface.c_str()) == 0) {
        return WIRELESS_STATUS_INTERFACE_DOWN;
    }
    switch (TAVIWirelessOpmodeGet()) {
        case WIRELESS_OPMODE_AUTO:
        case WIRELESS_OPMODE_MANAGED:
            return IsAssociated() ? WIRELESS_STATUS_CONNECTED : WIRELESS_STATUS_NOT_CONNECTED;
        case WIRELESS_OPMODE_ADHOC:
            return WIRELESS_STATUS_ADHOC;
        case WIRELESS_OPMODE_MASTER:
        case WIRELESS_OPMODE_MONITOR:
            return WIRELESS_STATUS_MASTER;
        default:
            return WIRELESS_STATUS_OTHER_MODE;
    }
}

int Give(const std::optional<int>& value, void* out) {
    if (!value) {
        return -1;
    }
    *static_cast<int32_t*>(out) = *value;
    return 0;
}

int Get(int what, void* out) {
    if (out == nullptr) {
        TAVI_LOG_ERROR("Bad parameters");
        return -1;
    }
    switch (what) {
        case WIRELESS_INFO_ESSID:
            return GetEssid(static_cast<char*>(out)) ? 0 : -1;
        case WIRELESS_INFO_PROTOCOL:
            return Give(Protocol(), out);
        case WIRELESS_INFO_KEY_STATE:
            return Give(KeyState(), out);
        case WIRELESS_INFO_OPMODE:
            return Give(TAVIWirelessOpmodeGet(), out);
        case WIRELESS_INFO_CONN_STATUS:
            return Give(ConnectionStatus(), out);
        default:
            TAVI_LOG_ERROR("This request is not supported.");
            return -1;
    }
}

}  // namespace

}  // namespace taviwireless::wireless

int TAVIWirelessCurInfoGet(int what, void* out) {
    return TAVI_GUARDED(-1, [=] { return taviwireless::wireless::Get(what, out); });
}
