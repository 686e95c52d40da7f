// SPDX-License-Identifier: MIT
// The modems themselves, through the layer that the service uses too.
#include <taviwireless/usbmodem_list.h>
#include <unistd.h>

#include <algorithm>
#include <set>

#include "cli/modem/modem_access.h"
#include "cli/modem/port_trouble.h"
#include "cli/modem/trace.h"
#include "cli/terminal.h"
#include "usbmodem/rules/paths.h"

namespace taviwireless::cli {

namespace {

using usbmodem_lib::USBModem;
using usbmodem_lib::USBModemList;

Profile ReadStoredProfile(USBModem& modem, bool& failed) {
    Profile values;
    for (const ProfileKey& key : kProfileKeys) {
        bool ignored = false;
        values[key.name] =
            key.isStored ? modem.GetProfileWithKey(key.name, failed) : modem.GetRoaming(ignored);
    }
    return values;
}

// As of the last time that it was asked.
bool IsReady(USBModem& modem) {
    bool ignored = false;
    return modem.IsPINReady(ignored);
}

class DirectAccess : public ModemAccess {
  public:
    ModemState Look(const std::string& id) override {
        const Connection connection = LookAtConnection(id);
        USBModem& modem = Initialised(id);
        ShowProgress("Reading " + id + " ...");
        bool ignored = false;
        ModemState state;
        state.id = id;
        state.netStatus = connection.status;
        state.ip = connection.address;
        state.interface = connection.interface;
        state.vendor = modem.GetVendorName(ignored);
        state.product = modem.GetProductName(ignored);
        state.simStatus = modem.GetPINStatus(ignored);
        state.signal = modem.GetSignalQuality(ignored);
        state.carrier = modem.GetDefaultISP(ignored);
        state.pinProtected = modem.PINGetEnableProtection() != 0;
        state.pinRemains = modem.PINGetAttemptRemain();
        state.pukRemains = modem.PUKGetAttemptRemain();
        state.profile = ReadStoredProfile(modem, ignored);
        const usbmodem_lib::KnownModem known = modem.Known();
        state.imsi = known.imsi;
        state.ports = {known.connectNode, known.queryNode};
        return state;
    }

    // The dialler's files alone tell it.
    Connection KnownConnection(const std::string& id) override {
        Refresh();
        USBModem& modem = list_.FindUSBModem(id);
        if (modem.IsNull()) {
            throw NotReadyError(id);
        }
        bool failed = modem.RecallConnection() < 0;
        Connection connection{modem.GetNetStatus(failed), modem.GetNetIFName(failed),
                              modem.GetNetLocalIP(failed)};
        if (failed) {
            const std::string trouble = StateFolderTrouble();
            throw CommandError(kFailure, "cannot tell the state of the connection of " + id +
                                             (trouble.empty() ? "" : ": " + trouble));
        }
        return connection;
    }

    // A new process knows nothing of a running connection: the first look finds the interface in
    // the dialler's log, the second its address. The log is found by the IMSI: UpdateNetStatus
    // without it would take a running connection for one that failed, and end it.
    Connection LookAtConnection(const std::string& id) override {
        USBModem& modem = Initialised(id);
        if (hasIMSI_.count(id) != 0 && modem.UpdateNetStatus() == 2) {
            modem.UpdateNetStatus();
        }
        bool failed = false;
        Connection connection;
        connection.status = modem.GetNetStatus(failed);
        connection.interface = modem.GetNetIFName(failed);
        connection.address = modem.GetNetLocalIP(failed);
        if (failed) {
            throw CommandError(kFailure, "cannot tell the state of the connection of " + id);
        }
        return connection;
    }

    std::vector<Interface> Interfaces() override {
        std::vector<Interface> interfaces;
        for (const std::string& id : PluggedModems()) {
            interfaces.push_back({id, KnownConnection(id).interface});
        }
        return interfaces;
    }

    std::string Command(const std::string& id, const std::string& command) override {
        USBModem& modem = Initialised(id);
        std::string reply;
        if (modem.ModemCmd(command, reply) != 0) {
            throw CommandError(kFailure, id + " did not answer the command");
        }
        return reply;
    }

    int EnterPIN(const std::string& id, const std::string& pin) override {
        return Initialised(id).PINUnlock(pin);
    }

    int EnterPUK(const std::string& id, const std::string& puk,
                 const std::string& newPin) override {
        return Initialised(id).PUKSet(puk, newPin);
    }

    int SetPIN(const std::string& id, const std::string& pin, const std::string& newPin,
               bool protection) override {
        return Initialised(id).PINSet(pin, newPin, protection);
    }

    Profile ReadProfile(const std::string& id) override {
        bool failed = false;
        USBModem& modem = Initialised(id);
        Profile profile = ReadStoredProfile(modem, failed);
        if (failed) {
            throw ProfileError("cannot read the profile of " + id, IsReady(modem));
        }
        return profile;
    }

    void ChangeProfile(const std::string& id,
                       const std::vector<profile::Setting>& settings) override {
        USBModem& modem = Initialised(id);
        for (const profile::Setting& setting : settings) {
            if (modem.SetProfileWithKey(setting.key, setting.value) != 0) {
                throw ProfileError("cannot change the profile of " + id, IsReady(modem));
            }
        }
    }

    void ResetProfile(const std::string& id) override {
        USBModem& modem = Initialised(id);
        ShowProgress("Reading defaults from " + id + " ...");
        if (modem.SetProfileToDefault() != 0) {
            throw ProfileError("cannot reset the profile of " + id, IsReady(modem));
        }
    }

    // A failure shows in the state of the connection.
    void Connect(const std::string& id) override { Initialised(id).NetConnect(); }

    void Disconnect(const std::string& id) override {
        if (Initialised(id).NetDisconnect() == 0) {
            return;
        }
        const bool isUp = !IsDisconnected(LookAtConnection(id).status);
        const char* why = geteuid() != 0 ? "that takes root" : "the system log tells why";
        throw CommandError(
            kFailure, isUp ? std::string("cannot end the dialler of ") + id + "; " + why
                           : id + " is hung up, but the default route could not be given back; "
                                  "set it anew");
    }

    // By the dialler's files, with a record of its own.
    void HangUp(const std::string& id) override {
        if (const auto number = usbmodem_lib::InterfaceIdIn(id, "usbmodem")) {
            USBModem(static_cast<unsigned int>(*number), usbmodem_lib::InfoPath(*number))
                .EndConnection();
        }
    }

  protected:
    // Each modem is initialised when it is looked at: one that is dead does not hide those behind
    // it.
    std::vector<std::string> ReadyModems() override { return PluggedModems(); }

  private:
    // Follows what was plugged in and unplugged meanwhile.
    void Refresh() {
        if (std::any_of(list_.begin(), list_.end(),
                        [](const USBModem& modem) { return !modem.IsInfoExist(); })) {
            list_.DropUnplugged();
            hasIMSI_.clear();
        }
        if (list_.SearchInfoPath() != 0) {
            throw CommandError(kFailure, "cannot look for modems in /tmp/");
        }
    }

    // Costs a modem that does not answer up to six seconds, and one whose ports cannot be opened
    // none.
    bool Initialise(USBModem& modem) {
        if (modem.IsInited()) {
            return true;
        }
        const auto holder = HolderOfPorts(modem.GetDevId());
        if (holder && holder->isService) {
            throw CommandError(kBusy, holder->sentence);
        }
        if (holder || PortTrouble(modem.GetDevId())) {
            return false;
        }
        Trace("finding the ports of " + modem.GetDevId());
        ShowProgress("Finding the ports of " + modem.GetDevId() + " ...");
        return modem.InitInfo() == 0;
    }

    // Borrowed until the next call.
    USBModem& Initialised(const std::string& id) {
        Refresh();
        USBModem& modem = list_.FindUSBModem(id);
        if (modem.IsNull() || !Initialise(modem)) {
            const auto holder = HolderOfPorts(id);
            throw holder ? CommandError(kFailure, holder->sentence) : NotReadyError(id);
        }
        if (hasIMSI_.count(id) == 0) {
            bool failed = false;
            modem.GetIMSI(failed);
            if (!failed) {
                hasIMSI_.insert(id);
            }
        }
        return modem;
    }

    USBModemList list_;
    std::set<std::string> hasIMSI_;  // the modems whose IMSI is known
};

}  // namespace

std::unique_ptr<ModemAccess> MakeDirectAccess() {
    return std::make_unique<DirectAccess>();
}

}  // namespace taviwireless::cli
