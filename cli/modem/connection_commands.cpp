// taviwireless modem connect, disconnect and status: the data connection.
#include <chrono>
#include <iomanip>
#include <sstream>
#include <thread>

#include "cli/deadline.h"
#include "cli/modem/modem_access.h"
#include "cli/modem/modem_commands.h"
#include "cli/report.h"
#include "cli/terminal.h"

namespace taviwireless::cli {

namespace {

using Clock = std::chrono::steady_clock;

constexpr std::chrono::milliseconds kLookPause{250};
constexpr int kConnectTimeout = 60;  // seconds

std::string Sentence(const std::string& id, const Connection& connection) {
    std::string text = id + ": " + connection.status;
    if (!connection.address.empty()) {
        text += ", " + connection.address + " on " + connection.interface;
    }
    return Printable(text);
}

Report Describe(const std::string& id, const Connection& connection) {
    Report report{{{Sentence(id, connection)}}, {}};
    report.document["id"] = id;
    report.document["net_status"] = connection.status;
    report.document["interface"] = connection.interface;
    report.document["ip"] = connection.address;
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

// Looks until the link is up or the dialler gave up; the deadline ends it otherwise.
Connection WaitUntilConnected(ModemAccess& access, const std::string& id, bool noWait) {
    for (;;) {
        const Connection connection = access.LookAtConnection(id);
        if (IsDisconnected(connection.status)) {
            throw CommandError(kFailure, "the dialler of " + id +
                                             " gave up, or could not be started; its log is in "
                                             "/var/lib/usbmodem/, and the system log tells more");
        }
        if (noWait || connection.status == kConnected) {
            return connection;
        }
        ShowProgress("Connecting " + id + " ...");
        std::this_thread::sleep_for(kLookPause);
    }
}

Connection Dial(ModemAccess& access, const Options& options, Deadline& deadline) {
    const ModemState state = access.Look(options.id);
    if (!IsDisconnected(state.netStatus)) {
        throw CommandError(kBusy, options.id + " has a connection already; " +
                                      "taviwireless modem disconnect ends it");
    }
    if (state.simStatus != kReady) {
        throw CommandError(kFailure, "the SIM of " + options.id +
                                         " is not ready; taviwireless modem show " + options.id +
                                         " tells what it waits for");
    }
    access.Connect(options.id);
    deadline.SetSentence(options.id + " is not connected after " +
                         std::to_string(deadline.Seconds()) +
                         " s; it goes on trying until it is disconnected");
    return WaitUntilConnected(access, options.id, options.noWait);
}

}  // namespace

void ConnectModem(const Options& options) {
    const auto access = MakeAccess(options);
    Deadline deadline(options, kConnectTimeout);
    const auto begin = Clock::now();
    const Connection connection = deadline.Limit([&] { return Dial(*access, options, deadline); });
    const double seconds = SecondsSince(begin);
    Report report = Describe(options.id, connection);
    report.rows = {{Sentence(options.id, connection) + " after " + Seconds(seconds, 1)}};
    report.document["seconds"] = seconds;
    Print(options, report);
}

void DisconnectModem(const Options& options) {
    const auto access = MakeAccess(options);
    const auto hangUp = [&] {
        if (IsDisconnected(access->LookAtConnection(options.id).status)) {
            throw CommandError(kFailure, options.id + " is not connected");
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
    Print(options, Describe(options.id, connection));
}

void ShowConnection(const Options& options) {
    const auto access = MakeAccess(options);
    const Connection connection =
        Deadline(options).Limit([&] { return access->KnownConnection(options.id); });
    Print(options, Describe(options.id, connection));
}

}  // namespace taviwireless::cli
