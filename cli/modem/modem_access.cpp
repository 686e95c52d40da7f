// SPDX-License-Identifier: MIT
#include "cli/modem/modem_access.h"

#include <taviwireless/usbmodem_list.h>

#include <algorithm>
#include <chrono>
#include <thread>

#include "cli/modem/port_trouble.h"
#include "cli/terminal.h"
#include "usbmodem/rules/paths.h"

namespace taviwireless::cli {

namespace {

bool Contains(const std::vector<std::string>& ids, const std::string& id) {
    return std::find(ids.begin(), ids.end(), id) != ids.end();
}

}  // namespace

bool IsDisconnected(const std::string& netStatus) {
    return netStatus == kDisconnected || netStatus == kConnectionLost;
}

std::vector<ModemState> ModemAccess::KnownModems(bool withProfiles, const OnModem& onModem) {
    const std::vector<std::string> ready = ReadyModems();
    std::vector<ModemState> states;
    for (const std::string& id : PluggedModems()) {
        ModemState state;
        state.id = id;
        try {
            if (Contains(ready, id)) {
                state = ReadyModem(id, withProfiles);
            }
        } catch (const CommandError& error) {
            if (error.Status() == kNoService || error.Status() == kBusy) {
                throw;
            }  // unplugged, or fallen silent, a moment ago: no reason to hide the others
        }
        onModem(state);
        states.push_back(state);
    }
    return states;
}

// A look keeps a service that shows nothing busy for about as long per modem; others want to be
// served too.
void ModemAccess::WaitForChange() {
    std::this_thread::sleep_for(std::chrono::seconds(2));
}

std::string ModemAccess::LogFile(const ModemState& state) {
    return state.imsi.empty() ? "" : usbmodem_lib::DialLogPath(state.imsi);
}

std::unique_ptr<ModemAccess> MakeAccess(const Options& options) {
    return options.direct ? MakeDirectAccess() : MakeServiceAccess();
}

std::string FullId(const std::string& id) {
    const bool isNumber = !id.empty() && id.find_first_not_of("0123456789") == std::string::npos;
    return isNumber ? "usbmodem" + id : id;
}

std::vector<std::string> PluggedModems() {
    usbmodem_lib::USBModemList list;
    if (list.SearchInfoPath() != 0) {
        throw CommandError(kFailure, "cannot look for modems in /tmp/");
    }
    std::vector<std::string> ids;
    for (const usbmodem_lib::USBModem& modem : list) {
        ids.push_back(modem.GetDevId());
    }
    return ids;
}

CommandError NotReadyError(const std::string& id) {
    if (Contains(PluggedModems(), id)) {
        if (auto trouble = PortTrouble(id)) {
            return *trouble;
        }
        return {kFailure, "modem " + id +
                              " is not ready: no port of it has answered yet; wait a moment, or "
                              "unplug it and plug it in again"};
    }
    return {kNotFound, "there is no modem " + Printable(id) +
                           "; taviwireless modem list shows those that are plugged in"};
}

CommandError ProfileError(const std::string& whatFailed, bool isSIMReady) {
    const std::string trouble = StateFolderTrouble();
    return {kFailure, whatFailed + "; " +
                          (!isSIMReady       ? "its SIM is not ready"
                           : trouble.empty() ? "the system log tells why"
                                             : trouble)};
}

}  // namespace taviwireless::cli
