// SPDX-License-Identifier: MIT
// taviwireless modem connect, disconnect and status: the data connection.
#include <chrono>
#include <iomanip>
#include <sstream>
#include <thread>
#include <utility>

#include "cli/deadline.h"
#include "cli/modem/dial_failure.h"
#include "cli/modem/dial_guard.h"
#include "cli/modem/modem_access.h"
#include "cli/modem/modem_commands.h"
#include "cli/modem/modem_report.h"
#include "cli/report.h"
#include "cli/terminal.h"

namespace taviwireless::cli {

namespace {

using Clock = std::chrono::steady_clock;

constexpr std::chrono::milliseconds kLookPause{250};
constexpr int kConnectTimeout = 60;  // seconds

std::string Sentence(const std::string& id, const Connection& connection, const char* more = "") {
    std::string text = id + ": " + StateCell(connection.status) + more;
    if (!connection.address.empty()) {
        text += ", " + connection.address + " on " + connection.interface;
    }
    return Printable(text);
}

Report Describe(const std::string& id, const Connection& connection, const char* more = "") {
    Report report{{{Sentence(id, connection, more)}}, {}};
    report.document["id"] = id;
    report.document["state"] = connection.status;
    report.document["interface"] = TextOrNull(connection.interface);
    report.document["address"] = TextOrNull(connection.address);
    return report;
}

double SecondsSince(Clock::time_point begin) {
    return std::chrono::duration<double>(Clock::now() - begin).count();
}

std::string Seconds(double seconds, int digits) {
    std::ostringstream text;
    text << std::fixed << std::setprecision(digits) << seconds << " s";
    return text.str();
}

// Looks until the link is up or the dialler gave up; a DialGuard ends it otherwise.
Connection WaitUntilConnected(ModemAccess& access, const Options& options,
                              const DialAttempt& attempt) {
    for (;;) {
        const Connection connection = access.LookAtConnection(options.id);
        if (IsDisconnected(connection.status)) {
            throw attempt.Failure();
        }
        if (options.noWait || connection.status == kConnected) {
            return connection;
        }
        ShowProgress("Connecting " + options.id + " ...");
        std::this_thread::sleep_for(kLookPause);
    }
}

void RequireReadyToDial(const ModemState& state) {
    if (!IsDisconnected(state.netStatus)) {
        throw CommandError(kBusy, state.id + " is connecting already; taviwireless modem status " +
                                      state.id + " shows it, disconnect ends it");
    }
    if (state.simStatus != kReady) {
        throw CommandError(kFailure, "the SIM of " + state.id +
                                         " is not ready; taviwireless modem show " + state.id +
                                         " tells what it waits for");
    }
}

// What is there when it is connected, with what a person is told behind its state.
std::pair<Connection, std::string> Dial(ModemAccess& access, const Options& options) {
    DialGuard guard(options, kConnectTimeout, [&] { access.HangUp(options.id); });
    const auto begin = Clock::now();
    const ModemState state = access.Look(options.id);
    if (state.netStatus == kConnected) {
        return {{state.netStatus, state.interface, state.ip}, " already"};
    }
    RequireReadyToDial(state);
    const DialAttempt attempt(access, state);
    guard.HasDialled();
    access.Connect(options.id);
    const Connection connection = WaitUntilConnected(access, options, attempt);
    return {connection, " after " + Seconds(SecondsSince(begin), 1)};
}

}  // namespace

void ConnectModem(const Options& options) {
    const auto access = MakeAccess(options);
    const auto begin = Clock::now();
    const auto& [connection, more] = Dial(*access, options);
    Report report = Describe(options.id, connection, more.c_str());
    report.document["seconds"] = SecondsSince(begin);
    Print(options, report);
}

void DisconnectModem(const Options& options) {
    const auto access = MakeAccess(options);
    const char* more = "";
    const auto hangUp = [&] {
        const Connection before = access->LookAtConnection(options.id);
        if (IsDisconnected(before.status)) {
            more = " already";
            return before;
        }
        access->Disconnect(options.id);
        const Connection connection = access->LookAtConnection(options.id);
        if (!IsDisconnected(connection.status)) {
            throw CommandError(kFailure,
                               options.id + " is still connected; the system log tells why");
        }
        return connection;
    };
    const Connection connection = Deadline(options).Limit(hangUp);
    Print(options, Describe(options.id, connection, more));
}

void ShowConnection(const Options& options) {
    const auto access = MakeAccess(options);
    const Connection connection =
        Deadline(options).Limit([&] { return access->KnownConnection(options.id); });
    Print(options, Describe(options.id, connection));
}

}  // namespace taviwireless::cli
