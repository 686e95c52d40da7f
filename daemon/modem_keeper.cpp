// SPDX-License-Identifier: MIT
#include "daemon/modem_keeper.h"

#include <syslog.h>
#include <tavicore/file.h>

#include <vector>

#include "common/sz_list.h"
#include "daemon/info_files.h"
#include "usbmodem/rules/paths.h"

namespace taviwireless::daemon {

namespace {

using usbmodem_lib::USBModem;

std::vector<int> InterfaceIds(usbmodem_lib::USBModemList& list) {
    std::vector<int> ids;
    for (const USBModem& modem : list) {
        ids.push_back(static_cast<int>(modem.GetIfid()));
    }
    return ids;
}

}  // namespace

void ModemKeeper::EndOrphanedConnections() {
    const std::string prefix = usbmodem_lib::kPidFilePrefix;
    const std::string name = prefix.substr(prefix.rfind('/') + 1);
    SzList files(64);
    VEXACFileEnumDir(usbmodem_lib::kStateDirectory, name.c_str(), files.Address(),
                     VEXAC_ENUM_FILES);
    for (int i = 0; i < files.Count(); ++i) {
        const std::optional<int> id = usbmodem_lib::InterfaceIdIn(files[i], name);
        if (id && !ReadInfoFile(*id)) {
            syslog(LOG_INFO, "usbmodem%d was unplugged while nobody looked", *id);
            USBModem(static_cast<unsigned int>(*id), usbmodem_lib::InfoPath(*id)).EndConnection();
        }
    }
}

void ModemKeeper::Rescan() {
    list_.SearchInfoPath();
    for (const int id : InterfaceIds(list_)) {
        Look(id);
    }
    onChange_();
}

void ModemKeeper::LookAfterModems() {
    bool hasChanged = false;
    for (const int id : InterfaceIds(list_)) {
        USBModem& modem = list_.FindUSBModem(id);
        if (!modem.IsInited()) {
            continue;
        }
        if (modem.IsError()) {
            syslog(LOG_WARNING, "usbmodem%d does not answer; out of service", id);
            Initialise(id);
            hasChanged = true;
        } else if (!modem.IsPortAlive()) {
            Look(id);
            hasChanged = true;
        }
    }
    if (hasChanged) {
        onChange_();
    }
}

void ModemKeeper::Initialise(int interfaceId) {
    modems_[interfaceId].initialisation =
        std::make_unique<Initialisation>(list_, interfaceId, onChange_);
}

void ModemKeeper::Look(int interfaceId) {
    const auto info = ReadInfoFile(interfaceId);
    if (!info) {
        Drop(interfaceId);
        return;
    }
    const auto known = modems_.find(interfaceId);
    const bool isNew = known == modems_.end();
    if (!isNew && IsSame(known->second, *info, interfaceId)) {
        return;
    }
    syslog(LOG_INFO, "usbmodem%d was plugged in%s", interfaceId, isNew ? "" : " anew");
    if (!isNew) {
        list_.FindUSBModem(interfaceId).EndConnection();
        modems_.erase(known);
    }
    modems_[interfaceId].info = *info;
    Initialise(interfaceId);
}

// Writing the same text again, or touching the file, changes nothing. What counts are the ports: a
// modem that was unplugged and plugged in faster than anybody looks has others of the same names.
bool ModemKeeper::IsSame(const Modem& known, const std::string& info, int interfaceId) {
    const USBModem& modem = list_.FindUSBModem(interfaceId);
    return (known.info == info || !NamesPorts(info)) && (!modem.IsInited() || modem.IsPortAlive());
}

void ModemKeeper::Drop(int interfaceId) {
    syslog(LOG_INFO, "usbmodem%d was unplugged", interfaceId);
    list_.FindUSBModem(interfaceId).EndConnection();
    modems_.erase(interfaceId);
    list_.Drop(interfaceId);
}

}  // namespace taviwireless::daemon
