// SPDX-License-Identifier: MIT
// Modems: their ports, and what the service knows of SIM, network and connection. No modem is asked.
#include <unistd.h>

#include <cstdlib>
#include <cstring>
#include <functional>

#include "base/join.h"
#include "base/split.h"
#include "base/trusted_file.h"
#include "cli/doctor/check.h"
#include "cli/doctor/processes.h"
#include "cli/modem/modem_access.h"
#include "cli/modem/service_objects.h"
#include "usbmodem/rules/paths.h"

namespace taviwireless::cli {

namespace {

std::string InfoPathOf(const std::string& id) {
    return std::string(usbmodem_lib::kInfoDirectory) + usbmodem_lib::kInfoName +
           id.substr(strlen("usbmodem"));
}

Findings Modems() {
    std::string ids;
    for (const std::string& id : PluggedModems()) {
        AddItem(ids, id);
    }
    return ids.empty() ? Warning(std::string("none is plugged in: there is no file ") +
                                     usbmodem_lib::kInfoDirectory + usbmodem_lib::kInfoName + "N",
                                 "plug one in; /usr/tavi/hotplug/usb.plug writes the file")
                       : Ok(ids);
}

// The value of a key in the text of an info file.
std::string ValueOf(const std::string& text, const std::string& key) {
    for (const std::string& line : Lines(text)) {
        if (line.rfind(key + "=", 0) == 0) {
            return line.substr(key.size() + 1);
        }
    }
    return "";
}

// A program that is none of those that have to do with it.
std::string HolderOf(const std::string& port, const std::vector<RunningProcess>& processes) {
    for (const RunningProcess& process : processes) {
        bool isOurs = false;
        for (const char* name : {"usbmodemd", "taviwireless", "wvdial", "pppd", "modemsim"}) {
            isOurs = isOurs || process.name == name;
        }
        if (!isOurs && HasOpen(process, port)) {
            return process.name + " (process " + std::to_string(process.pid) + ")";
        }
    }
    return "";
}

Findings LookAtPort(const std::string& id, const std::string& port,
                    const std::vector<RunningProcess>& processes) {
    if (access(port.c_str(), F_OK) != 0) {
        return Failed(port + " of " + id + " does not exist",
                      "unplug the modem and plug it in again");
    }
    if (access(port.c_str(), R_OK | W_OK) != 0) {
        return Warning(port + " of " + id + " may not be used by this user",
                       "be root, or ask the service");
    }
    const std::string holder = HolderOf(port, processes);
    return holder.empty()
               ? Findings()
               : Failed(port + " of " + id + " is held by " + holder, "end that program");
}

Findings LookAtPorts(const std::string& id, const std::vector<RunningProcess>& processes) {
    const std::string path = InfoPathOf(id);
    const std::string text = ReadTrusted(path).value_or("");
    const std::string dial = ValueOf(text, "CONNECTNODE");
    const std::string queries = ValueOf(text, "DEVICENODE");
    if (dial.empty() || queries.empty()) {
        return Failed(path + " names no ports of " + id, "unplug the modem and plug it in again");
    }
    Findings wrong;
    std::vector<std::string> numbers = Split(queries, ',');
    if (("," + queries + ",").find("," + dial + ",") == std::string::npos) {
        numbers.push_back(dial);
    }
    for (const std::string& number : numbers) {
        Append(wrong, LookAtPort(id, usbmodem_lib::kPortPrefix + number, processes));
    }
    return wrong;
}

Findings Ports() {
    const std::vector<std::string> ids = PluggedModems();
    const std::vector<RunningProcess> processes = RunningProcesses();
    Findings wrong;
    for (const std::string& id : ids) {
        Append(wrong, LookAtPorts(id, processes));
    }
    if (ids.empty() || !wrong.empty()) {
        return wrong;
    }
    return geteuid() == 0 ? Ok("there, and held by no other program")
                          : Unknown("there; only root can see who holds them", "look as root");
}

// What there is to say of each modem that the service knows.
Findings OfEach(const std::function<Findings(const std::string& id, const KnownModem&)>& look) {
    if (PluggedModems().empty()) {
        return {};
    }
    const auto modems = ServiceObjects().Read();
    if (!modems) {
        return Unknown("the modem service has not told");
    }
    Findings all;
    for (const auto& [id, modem] : *modems) {
        Append(all, look(id, modem));
    }
    return all;
}

Findings SIM(const std::string& id, const KnownModem& modem) {
    const std::string& state = modem.state.simStatus;
    if (!modem.answers) {
        return Failed(id + " does not answer", "wait a moment, or unplug it and plug it in again");
    }
    if (state == kWantsPIN) {
        return Failed("that of " + id + " waits for its PIN", "taviwireless modem unlock " + id);
    }
    if (state == kWantsPUK) {
        return Failed("that of " + id + " waits for its PUK", "taviwireless modem puk " + id);
    }
    return state == kReady ? Ok("that of " + id + " is ready")
                           : Failed(id + " has none that can be read", "put one in");
}

bool IsInUse(const KnownModem& modem) {
    return modem.answers && modem.state.simStatus == kReady;
}

Findings Registration(const std::string& id, const KnownModem& modem) {
    if (!IsInUse(modem)) {
        return Unknown("that of " + id + " comes after its SIM");
    }
    if (modem.state.carrier.empty()) {
        return Failed(id + " is in no network",
                      "look at the antenna, and whether the SIM is active");
    }
    const std::string signal =
        modem.state.signal > 0 ? ", signal " + std::to_string(modem.state.signal) + "%" : "";
    return Ok(id + " is with " + modem.state.carrier + signal);
}

Findings Link(const std::string& id, const KnownModem& modem) {
    if (modem.state.netStatus == kConnected) {
        return Ok(id + " is connected on " + modem.state.interface + ", " + modem.state.ip);
    }
    if (modem.state.netStatus == kConnectionLost) {
        return Failed("that of " + id + " was lost",
                      "taviwireless modem connect " + id + "; its log tells why");
    }
    return Unknown(id + " is not connected",
                   IsInUse(modem) ? "taviwireless modem connect " + id : "");
}

}  // namespace

Checks ModemChecks() {
    return {{"modems", Modems},
            {"modem ports", Ports},
            {"SIM", [] { return OfEach(SIM); }},
            {"mobile network", [] { return OfEach(Registration); }},
            {"mobile connection", [] { return OfEach(Link); }}};
}

}  // namespace taviwireless::cli
