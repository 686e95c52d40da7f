// SPDX-License-Identifier: MIT
// taviwireless modem list, show, interfaces, usage and at: what the modems say of themselves.
#include <unistd.h>

#include <algorithm>
#include <iostream>

#include "base/join.h"
#include "base/split.h"
#include "cli/deadline.h"
#include "cli/modem/modem_access.h"
#include "cli/modem/modem_commands.h"
#include "cli/modem/modem_report.h"
#include "cli/terminal.h"

namespace taviwireless::cli {

namespace {

// What a modem says of its registration with the network, behind the first comma of the reply to
// AT+CREG? (3GPP TS 27.007, 7.2); empty when it does not say.
std::string RegistrationIn(const std::string& reply) {
    constexpr const char* kNames[] = {"none", "home", "searching", "denied", "unknown", "roaming"};
    const size_t begin = reply.find("+CREG:");
    const size_t comma = begin == std::string::npos ? begin : reply.find(',', begin);
    const size_t state = comma == std::string::npos ? comma : comma + 1;
    if (state >= reply.size() || reply[state] < '0' || reply[state] > '5') {
        return "";
    }
    return kNames[reply[state] - '0'];
}

// An older service cannot ask, and nobody while the dialler has the modem.
std::string AskRegistration(ModemAccess& access, const std::string& id) {
    try {
        return RegistrationIn(access.Command(id, "AT+CREG?"));
    } catch (const CommandError& error) {
        if (error.Status() == kNoService) {
            throw;
        }
        return "";
    }
}

// The names at once, and each row when its modem has answered.
void ListOneByOne(ModemAccess& access, const Options& options) {
    std::string names;
    for (const std::string& id : PluggedModems()) {
        AddItem(names, id);
    }
    if (isatty(STDERR_FILENO)) {
        std::cerr << "Asking " << names << " ..." << std::endl;
    }
    RowPrinter rows(options, kModemColumns);
    access.KnownModems(false, [&rows](const ModemState& state) {
        rows.Add(ModemRow(state), Describe(state).document);
    });
    rows.Finish(kNoModems);
}

void CheckCommand(const std::string& command) {
    const bool isPrintable =
        std::all_of(command.begin(), command.end(), [](char c) { return c >= ' ' && c <= '~'; });
    if (command.empty() || !isPrintable) {
        throw CommandError(kUsage, "an AT command is printable ASCII");
    }
}

}  // namespace

void ListModems(const Options& options) {
    const auto access = MakeAccess(options);
    Deadline deadline(options);
    deadline.Limit([&] {
        // Whoever waits sees rows come; a program gets the same table, whatever has to be asked.
        const bool isWatched = !options.json && isatty(STDOUT_FILENO);
        if (isWatched && !PluggedModems().empty() && access->HasToAsk()) {
            ListOneByOne(*access, options);
        } else {
            Print(options, DescribeAll(access->KnownModems(options.json)));
        }
    });
}

void ShowModem(const Options& options) {
    const auto access = MakeAccess(options);
    Deadline deadline(options);
    deadline.Limit([&] {
        ModemState state = access->Look(options.id);
        access->AddDetails(state);
        const ModemDetails details{AskRegistration(*access, options.id),
                                   UsageOf(options.id, state.interface)};
        Print(options, Describe(state, details, options.showSecrets));
    });
}

void ListInterfaces(const Options& options) {
    const auto access = MakeAccess(options);
    const auto interfaces = Deadline(options).Limit([&] { return access->Interfaces(); });
    Report all{{}, Json::arrayValue, {{"DEVICE"}, {"INTERFACE"}}};
    for (const Interface& interface : interfaces) {
        Json::Value document;
        document["id"] = interface.id;
        document["interface"] = TextOrNull(interface.name);
        all.document.append(document);
        all.rows.push_back({interface.id, Cell(interface.name)});
    }
    Print(options, all);
}

void ShowUsage(const Options& options) {
    const auto access = MakeAccess(options);
    const auto interfaces = Deadline(options).Limit([&] { return access->Interfaces(); });
    Report all{
        {}, Json::arrayValue, {{"DEVICE"}, {"INTERFACE"}, {"SENT"}, {"RECEIVED"}, {"SINCE"}}};
    for (const Interface& interface : interfaces) {
        if (!options.id.empty() && interface.id != options.id) {
            continue;
        }
        const LinkUsage usage = UsageOf(interface.id, interface.name);
        Json::Value document;
        document["id"] = interface.id;
        document["interface"] = TextOrNull(interface.name);
        document["bytes_sent"] = NumberOrNull(usage.sent);
        document["bytes_received"] = NumberOrNull(usage.received);
        document["dialled_at"] = NumberOrNull(usage.since);
        all.document.append(document);
        all.rows.push_back({interface.id, Cell(interface.name), BytesCell(usage.sent),
                            BytesCell(usage.received), TimeCell(usage.since)});
    }
    if (!options.id.empty() && all.document.empty()) {
        throw NotReadyError(options.id);
    }
    Print(options, all);
}

void SendATCommand(const Options& options) {
    const std::string command =
        options.atCommand.empty() ? ReadSecret("AT command") : options.atCommand;
    CheckCommand(command);
    const auto access = MakeAccess(options);
    const std::string reply =
        Deadline(options).Limit([&] { return access->Command(options.id, command); });
    Report report;
    report.document["id"] = options.id;
    report.document["reply"] = Json::arrayValue;
    for (const std::string& line : Lines(reply)) {
        report.document["reply"].append(Printable(line));
        report.rows.push_back({Printable(line)});
    }
    Print(options, report);
}

}  // namespace taviwireless::cli
