#include "daemon/modem_keeper.h"

#include <syslog.h>

#include <algorithm>

#include "daemon/info_files.h"

namespace taviwireless::daemon {

namespace {

using usbmodem_lib::USBModem;

// Ends the connection of a modem that is gone, so that the machine gets its default route back. The
// dialler may have noticed before us and ended by itself; then the route is still to be set.
void HangUp(USBModem& modem) {
    bool err = false;
    const bool hadLink = !modem.GetNetIFName(err).empty() || !modem.IsNetDisconnected(err);
    if (hadLink && modem.NetDisconnect() != 0 && modem.GetProfileDefaultGW(err) == "true") {
        modem.RestoreDefaultRoute();
    }
}

bool IsUnplugged(const USBModem& modem) {
    return !modem.IsInfoExist();
}

}  // namespace

void ModemKeeper::Rescan() {
    list_.SearchInfoPath();
    Drop();
    Take();
}

void ModemKeeper::Drop() {
    for (USBModem& modem : list_) {
        if (IsUnplugged(modem)) {
            syslog(LOG_INFO, "%s was unplugged", modem.GetDevId().c_str());
            HangUp(modem);
        }
    }
    while (std::any_of(list_.begin(), list_.end(), IsUnplugged)) {
        list_.DropUnplugged();
    }
    for (auto modem = modems_.begin(); modem != modems_.end();) {
        modem = list_.FindUSBModem(modem->first).IsNull() ? modems_.erase(modem) : ++modem;
    }
}

void ModemKeeper::Take() {
    for (USBModem& record : list_) {
        const int id = static_cast<int>(record.GetIfid());
        const auto stamp = Stamp(InfoPath(id));
        const auto known = modems_.find(id);
        if (!stamp || (known != modems_.end() && known->second.stamp == *stamp)) {
            continue;
        }
        syslog(LOG_INFO, "%s was plugged in", record.GetDevId().c_str());
        if (known != modems_.end()) {
            HangUp(record);
            record = USBModem(record.GetIfid(), InfoPath(id));
        }
        modems_[id] = {*stamp, std::make_unique<Initialisation>(list_, id)};
    }
}

}  // namespace taviwireless::daemon
