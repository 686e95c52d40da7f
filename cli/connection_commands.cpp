// taviwireless modem connect, disconnect and status: the data connection.
#include <json/json.h>

#include <CLI/CLI.hpp>
#include <chrono>
#include <iomanip>
#include <iostream>
#include <memory>
#include <sstream>
#include <thread>

#include "cli/commands.h"
#include "cli/output.h"
#include "cli/plugged_modem.h"

namespace taviwireless::cli {

namespace {

using usbmodem_lib::USBModem;
using usbmodem_lib::USBModemList;
using Clock = std::chrono::steady_clock;

constexpr std::chrono::milliseconds kLookPause{250};

struct Arguments {
    std::string id;
    int timeout = 60;  // seconds
    bool noWait = false;
};

struct Connection {
    std::string status;  // "connected", "connecting", "disconnected", "connection_lost"
    std::string interface;
    std::string address;
};

// The modem, ready to look at its connection. The dialler's log is found by the IMSI: a look
// without it would take a running connection for one that failed, and end it.
USBModem& ConnectableModem(USBModemList& list, const std::string& id) {
    USBModem& modem = InitialisedModem(list, id);
    bool failed = false;
    modem.GetIMSI(failed);
    if (failed) {
        ShowProgress("");
        throw CommandError(kFailure, "the SIM of " + id +
                                         " is not ready; taviwireless modem show " + id +
                                         " tells what it waits for");
    }
    return modem;
}

// A new process knows nothing of a running connection: the first look finds the interface in the
// dialler's log, the second its address.
Connection Look(USBModem& modem) {
    if (modem.UpdateNetStatus() == 2) {
        modem.UpdateNetStatus();
    }
    bool failed = false;
    Connection connection;
    connection.status = modem.GetNetStatus(failed);
    connection.interface = modem.GetNetIFName(failed);
    connection.address = modem.GetNetLocalIP(failed);
    if (failed) {
        throw CommandError(kFailure,
                           "cannot tell the state of the connection of " + modem.GetDevId());
    }
    return connection;
}

Json::Value ToJson(const std::string& id, const Connection& connection) {
    Json::Value document;
    document["id"] = id;
    document["net_status"] = connection.status;
    document["interface"] = connection.interface;
    document["ip"] = connection.address;
    return document;
}

std::string ToText(const std::string& id, const Connection& connection) {
    std::string text = id + ": " + connection.status;
    if (!connection.address.empty()) {
        text += ", " + connection.address + " on " + connection.interface;
    }
    return text;
}

double SecondsSince(Clock::time_point begin) {
    return std::chrono::duration<double>(Clock::now() - begin).count();
}

std::string Seconds(double seconds, int digits) {
    std::ostringstream text;
    text << std::fixed << std::setprecision(digits) << seconds << " s";
    return text.str();
}

// Waits until the link is up, the dialler gave up, or the time is over.
Connection WaitUntilConnected(USBModem& modem, int timeout) {
    const auto begin = Clock::now();
    for (;;) {
        const Connection connection = Look(modem);
        if (connection.status == "connected") {
            return connection;
        }
        if (connection.status != "connecting") {
            throw CommandError(kFailure, "the dialler of " + modem.GetDevId() +
                                             " gave up; its log is in /var/lib/usbmodem/");
        }
        if (SecondsSince(begin) > timeout) {
            throw CommandError(kFailure, modem.GetDevId() + " is not connected after " +
                                             std::to_string(timeout) +
                                             " s; it goes on trying until it is disconnected");
        }
        ShowProgress("Connecting " + modem.GetDevId() + " ... " + Seconds(SecondsSince(begin), 0));
        std::this_thread::sleep_for(kLookPause);
    }
}

void Connect(const Options& options, const Arguments& arguments) {
    USBModemList list;
    USBModem& modem = ConnectableModem(list, arguments.id);
    const auto begin = Clock::now();
    bool failed = false;
    if (!modem.IsNetDisconnected(failed)) {
        throw CommandError(kBusy, arguments.id + " has a connection already; " +
                                      "taviwireless modem disconnect ends it");
    }
    if (modem.NetConnect() != 1) {
        throw CommandError(kFailure,
                           "cannot connect " + arguments.id + "; --verbose shows the reason");
    }
    if (arguments.noWait) {
        return;
    }
    const Connection connection = WaitUntilConnected(modem, arguments.timeout);
    ShowProgress("");
    const double seconds = SecondsSince(begin);
    if (options.json) {
        Json::Value document = ToJson(arguments.id, connection);
        document["seconds"] = seconds;
        Print(document);
    } else {
        std::cout << ToText(arguments.id, connection) << " after " << Seconds(seconds, 1) << '\n';
    }
}

void Disconnect(const Arguments& arguments) {
    USBModemList list;
    USBModem& modem = ConnectableModem(list, arguments.id);
    ShowProgress("");
    bool failed = false;
    if (modem.IsNetDisconnected(failed)) {
        throw CommandError(kFailure, arguments.id + " is not connected");
    }
    if (modem.NetDisconnect() != 0) {
        throw CommandError(kFailure,
                           "cannot disconnect " + arguments.id + "; --verbose shows the reason");
    }
}

void Status(const Options& options, const Arguments& arguments) {
    USBModemList list;
    USBModem& modem = ConnectableModem(list, arguments.id);
    const Connection connection = Look(modem);
    ShowProgress("");
    if (options.json) {
        Print(ToJson(arguments.id, connection));
    } else {
        std::cout << ToText(arguments.id, connection) << '\n';
    }
}

}  // namespace

void AddConnectionCommands(CLI::App& modem, const Options& options) {
    const auto arguments = std::make_shared<Arguments>();
    const auto add = [&](const char* name, const char* description) {
        CLI::App* command = modem.add_subcommand(name, description);
        command->add_option("ID", arguments->id, "Device id, such as usbmodem0")->required();
        return command;
    };

    CLI::App* connect = add("connect", "Dial, and wait until the link is up");
    connect->add_flag("--no-wait", arguments->noWait, "Return as soon as the dialler runs");
    connect->add_option("--timeout", arguments->timeout, "Seconds to wait")
        ->check(CLI::Range(1, 3600))
        ->capture_default_str();
    connect->callback([&options, arguments] { Connect(options, *arguments); });

    add("disconnect", "Hang up")->callback([arguments] { Disconnect(*arguments); });

    add("status", "Show the state of the connection")->callback([&options, arguments] {
        Status(options, *arguments);
    });
}

}  // namespace taviwireless::cli
