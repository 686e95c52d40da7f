// SPDX-License-Identifier: MIT
// The modems as the modem service knows them.
#include <dbus/dbus.h>
#include <taviwireless/usbmodem_ui.h>

#include <algorithm>
#include <chrono>
#include <cstdlib>
#include <ctime>
#include <thread>
#include <utility>

#include "cli/modem/modem_access.h"
#include "cli/modem/service_document.h"
#include "cli/modem/service_objects.h"
#include "cli/modem/session_bus.h"
#include "cli/modem/trace.h"
#include "cli/terminal.h"

namespace taviwireless::cli {

namespace {

// Hands a result of the front-end functions on unless the service could not be reached.
int Reached(int result) {
    if (result == 0) {
        throw CommandError(kNoService,
                           "the modem service is not running; usbmodemd starts it (or add "
                           "--direct to do without it)");
    }
    return result;
}

void Sent(int result) {
    if (Reached(result) < 0) {
        throw CommandError(kFailure, "cannot send to the modem service; --verbose shows why");
    }
}

int PINResult(int result) {
    return Reached(result) > 0 ? ModemAccess::kDone : result;
}

// A service that was just started looks for its modems first.
void WaitForModems() {
    constexpr auto kPatience = std::chrono::seconds(10);
    const auto end = std::chrono::steady_clock::now() + kPatience;
    std::vector<std::string> ready;
    while (usbmodem_ui::GetUSBModemList(ready) > 0 && ready.size() < PluggedModems().size() &&
           std::chrono::steady_clock::now() < end) {
        std::this_thread::sleep_for(std::chrono::milliseconds(100));
        ready.clear();
    }
}

// To be called before the service is asked anything. Only the first time: a service that ends
// meanwhile is not started again.
void EnsureService() {
    static bool isDone = false;
    if (std::exchange(isDone, true)) {
        return;
    }
    if (RequireService()) {
        WaitForModems();
    }
    Trace(
        "asking the modem service; its side is in the system log, with the AT dialogue if it runs "
        "as usbmodemd --debug");
}

std::vector<std::string> Lines(int (*get)(std::vector<std::string>& list)) {
    EnsureService();
    std::vector<std::string> lines;
    // A service that ends within the call gives no answer, and is not there the second time.
    if (Reached(get(lines)) < 0 && Reached(get(lines)) < 0) {
        throw CommandError(kFailure, "the modem service does not answer; --verbose shows why");
    }
    return lines;
}

void RequireAmong(const std::vector<std::string>& ready, const std::string& id) {
    if (std::find(ready.begin(), ready.end(), id) == ready.end()) {
        throw NotReadyError(id);
    }
}

// The functions that ask for one modem take whatever they are given, and answer alike for a modem
// that the service does not know and for a call that failed; so the id is looked up first.
void RequireReady(const std::string& id) {
    RequireAmong(Lines(usbmodem_ui::GetUSBModemList), id);
}

std::string Document(std::string (*get)(const std::string& id), const std::string& id) {
    RequireReady(id);
    ShowProgress("Asking " + id + " ...");
    Trace("asking the service about " + id);
    std::string document = get(id);
    if (document.empty()) {
        RequireReady(id);  // the service or the modem may have gone meanwhile
        throw CommandError(kFailure,
                           "the modem service does not tell about " + id + "; --verbose shows why");
    }
    return document;
}

void CheckSetting(const profile::Setting& setting) {
    // Compatible with a service that finds its keys anywhere in a line.
    const std::string line = setting.key + "=" + setting.value;
    if (!dbus_validate_utf8(line.c_str(), nullptr)) {
        throw CommandError(kUsage, "the value of " + setting.key +
                                       " is not UTF-8, which the modem service takes alone; add "
                                       "--direct to set it");
    }
    const std::string key = profile::ParseSetting(line)->key;
    if (key != setting.key) {
        throw CommandError(kUsage, "the value of " + setting.key + " holds \"" + key +
                                       "=\", which the modem service would take for a "
                                       "setting of its own; add --direct to set it");
    }
}

// Whether what is known suffices. The service looks more often, unless it was told not to.
bool IsRecent(const KnownModem& modem) {
    constexpr long long kMaxAge = 300;  // seconds
    return std::llabs(time(nullptr) - static_cast<long long>(modem.lastLook)) <= kMaxAge;
}

// The commands that only show what is known take it from the objects of the service, all others
// ask. An older service has no objects.
class ServiceAccess : public ModemAccess {
  public:
    ModemState Known(const std::string& id) override {
        RequireAmong(ReadyModems(), id);
        return ReadyModem(id, true);
    }

    Connection KnownConnection(const std::string& id) override {
        const auto ready = ReadyModems();
        if (!known_) {
            return LookAtConnection(id);
        }
        RequireAmong(ready, id);
        const ModemState& state = known_->at(id).state;
        return {state.netStatus, state.interface, state.ip};
    }

    bool HasToAsk() override {
        const auto ready = ReadyModems();
        return std::any_of(ready.begin(), ready.end(), [this](const std::string& id) {
            return !known_ || !IsRecent(known_->at(id));
        });
    }

    void WaitForChange() override {
        if (known_) {
            objects_.WaitForChange();
        } else {
            ModemAccess::WaitForChange();
        }
    }

    ModemState Look(const std::string& id) override {
        ModemState state = ReadModemDocument(Document(usbmodem_ui::GetUSBModem, id));
        // The document is written from top to bottom, so that of a link that comes up meanwhile
        // has its status but not its address yet.
        if (state.netStatus == kConnected && state.ip.empty()) {
            state = ReadModemDocument(Document(usbmodem_ui::GetUSBModem, id));
        }
        if (!state.ip.empty()) {
            for (const Interface& interface : Interfaces()) {
                state.interface = interface.id == id ? interface.name : state.interface;
            }
        }
        return state;
    }

    void AddDetails(ModemState& state) override {
        const auto known = objects_.Read();
        if (known && known->count(state.id) != 0) {
            state.imsi = known->at(state.id).state.imsi;
            state.ports = known->at(state.id).state.ports;
        }
    }

    std::string LogFile(const ModemState& state) override {
        const auto known = objects_.Read();
        return known && known->count(state.id) != 0 ? known->at(state.id).logFile : "";
    }

    Connection LookAtConnection(const std::string& id) override {
        const ModemState state = Look(id);
        return {state.netStatus, state.interface, state.ip};
    }

    // The service lists ids and interfaces in the same order, in two calls.
    std::vector<Interface> Interfaces() override {
        const auto ids = Lines(usbmodem_ui::GetUSBModemList);
        const auto names = Lines(usbmodem_ui::GetUSBModemIfList);
        if (ids.size() != names.size()) {
            throw CommandError(kFailure,
                               "a modem was plugged in or unplugged meanwhile; try again");
        }
        std::vector<Interface> interfaces;
        for (size_t i = 0; i < ids.size(); ++i) {
            interfaces.push_back({ids[i], names[i]});
        }
        return interfaces;
    }

    std::string Command(const std::string& id, const std::string& command) override {
        RequireReady(id);
        ShowProgress("Asking " + id + " ...");
        return objects_.Command(id, command);
    }

    int EnterPIN(const std::string& id, const std::string& pin) override {
        Trace("telling the service the PIN");
        return PINResult(usbmodem_ui::UnlockSIM(id, pin));
    }

    int EnterPUK(const std::string& id, const std::string& puk,
                 const std::string& newPin) override {
        Trace("telling the service the PUK and a new PIN");
        return PINResult(usbmodem_ui::UnlockPIN(id, puk, newPin));
    }

    int SetPIN(const std::string& id, const std::string& pin, const std::string& newPin,
               bool protection) override {
        Trace(std::string("telling the service to switch the PIN lock ") +
              (protection ? "on" : "off") + (newPin.empty() ? "" : ", and a new PIN"));
        return PINResult(usbmodem_ui::SetPIN(id, pin, newPin, protection));
    }

    // The service tells nothing of a profile that it cannot read: all texts are empty then, as in
    // a profile that was emptied.
    Profile ReadProfile(const std::string& id) override {
        Profile profile = ReadProfileDocument(Document(usbmodem_ui::GetProfile, id));
        const bool isEmpty = std::all_of(profile.begin(), profile.end(), [](const auto& entry) {
            return entry.second.empty() || entry.first == profile::kDefaultGateway ||
                   entry.first == profile::kRoaming;
        });
        if (isEmpty && Look(id).simStatus != kReady) {
            throw ProfileError("cannot read the profile of " + id, false);
        }
        return profile;
    }

    // The service gives no result; the profile read after it tells whether every setting arrived.
    void ChangeProfile(const std::string& id,
                       const std::vector<profile::Setting>& settings) override {
        std::string lines;
        for (const profile::Setting& setting : settings) {
            CheckSetting(setting);
            lines += setting.key + "=" + setting.value + "\n";
        }
        RequireReady(id);
        ShowProgress("Setting the profile of " + id + " ...");
        Trace("telling the service the settings");
        Sent(usbmodem_ui::SetProfile(id, lines));
        Profile wanted = ReadProfileDocument(Document(usbmodem_ui::GetProfile, id));
        const Profile now = wanted;
        for (const profile::Setting& setting : settings) {
            wanted[setting.key] = setting.value;
        }
        if (wanted != now) {
            throw ProfileError("the modem service did not set the profile of " + id,
                               Look(id).simStatus == kReady);
        }
    }

    void ResetProfile(const std::string&) override {
        throw CommandError(kUsage, "the modem service cannot reset a profile; add --direct");
    }

    void Connect(const std::string& id) override {
        Trace("telling the service to dial");
        Sent(usbmodem_ui::Connect(id));
    }

    void Disconnect(const std::string& id) override {
        Trace("telling the service to hang up");
        Sent(usbmodem_ui::Disconnect(id));
    }

    // By a connection that is not the one on which a reply may be awaited meanwhile.
    void HangUp(const std::string& id) override { HangUpByBus(id); }

  protected:
    std::vector<std::string> ReadyModems() override {
        EnsureService();
        known_ = objects_.Read();
        if (!known_) {
            return Lines(usbmodem_ui::GetUSBModemList);
        }
        std::vector<std::string> ready;
        for (const auto& [id, modem] : *known_) {
            if (modem.answers) {
                ready.push_back(id);
            }
        }
        return ready;
    }

    ModemState ReadyModem(const std::string& id, bool withProfile) override {
        if (known_ && !IsRecent(known_->at(id))) {
            ShowProgress("Asking " + id + " ...");
            if (objects_.Look(id)) {
                known_ = objects_.Read();
            }
        }
        if (!known_ || known_->count(id) == 0 || !IsRecent(known_->at(id))) {
            ModemState state = Look(id);
            AddDetails(state);
            return state;
        }
        ModemState state = known_->at(id).state;
        if (withProfile && state.simStatus == kReady) {
            state.profile = ReadProfileDocument(Document(usbmodem_ui::GetProfile, id));
        }
        return state;
    }

  private:
    ServiceObjects objects_;
    std::optional<std::map<std::string, KnownModem>> known_;  // as of the last ReadyModems
};

}  // namespace

std::unique_ptr<ModemAccess> MakeServiceAccess() {
    return std::make_unique<ServiceAccess>();
}

}  // namespace taviwireless::cli
