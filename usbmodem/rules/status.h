// SPDX-License-Identifier: MIT
#ifndef TAVIWIRELESS_USBMODEM_RULES_STATUS_H
#define TAVIWIRELESS_USBMODEM_RULES_STATUS_H

// The states of a SIM and of a link. Their numbers are those of command sets and of the state file,
// their names those of the documents.
namespace taviwireless::usbmodem_lib {

// A command set may give numbers beyond these, too; they count as unknown.
enum class SimStatus : int {
    kReady = 0,
    kPINRequired = 1,
    kPUKRequired = 2,
    kBusy = 3,
    kError = 4,
    kUnknown = 5,
};

enum class NetStatus : int {
    kConnected = 0,
    kConnecting = 1,
    kReconnecting = 2,
    kDisconnected = 3,
    kConnectionLost = 4,
};

constexpr const char* NameOf(SimStatus status) {
    switch (status) {
        case SimStatus::kReady:
            return "ready";
        case SimStatus::kPINRequired:
            return "pin_protect";
        case SimStatus::kPUKRequired:
            return "puk_protect";
        default:
            return "no_sim";
    }
}

constexpr const char* NameOf(NetStatus status) {
    switch (status) {
        case NetStatus::kConnected:
            return "connected";
        case NetStatus::kDisconnected:
            return "disconnected";
        case NetStatus::kConnectionLost:
            return "connection_lost";
        default:
            return "connecting";
    }
}

}  // namespace taviwireless::usbmodem_lib

#endif
