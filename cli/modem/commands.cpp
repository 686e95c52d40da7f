// taviwireless modem: the USB modems that are plugged in.
#include "cli/commands.h"

#include <json/json.h>

#include <CLI/CLI.hpp>
#include <iostream>

#include "cli/deadline.h"
#include "cli/modem/access.h"
#include "cli/modem/state_output.h"

namespace taviwireless::cli {

namespace {

void List(const Options& options) {
    const auto access = MakeAccess(options);
    const auto states = Deadline(options).Limit([&] { return access->LookAtAll(); });
    if (options.json) {
        Print(ToJson(states));
    } else {
        ShowProgress("");
        std::cout << ListText(states);
    }
}

void Show(const Options& options) {
    const auto access = MakeAccess(options);
    const auto state = Deadline(options).Limit([&] { return access->Look(options.id); });
    options.json ? Print(ToJson(state, options.showSecrets))
                 : Print(ShowTable(state, options.showSecrets));
}

void ListInterfaces(const Options& options) {
    const auto access = MakeAccess(options);
    const auto interfaces = Deadline(options).Limit([&] { return access->Interfaces(); });
    Json::Value documents(Json::arrayValue);
    Table table{{"MODEM", "INTERFACE"}};
    for (const Interface& interface : interfaces) {
        Json::Value document;
        document["id"] = interface.id;
        document["interface"] =
            interface.name.empty() ? Json::Value() : Json::Value(interface.name);
        documents.append(document);
        table.push_back({interface.id, interface.name.empty() ? "-" : Printable(interface.name)});
    }
    options.json ? Print(documents) : Print(table);
}

}  // namespace

CLI::App& AddModemCommand(CLI::App& group, const char* name, const char* description,
                          Options& options) {
    CLI::App* command = group.add_subcommand(name, description);
    command
        ->add_option("--timeout", options.timeout,
                     "Longest time that this may take once its input is read, in seconds")
        ->check(CLI::Range(1, 3600))
        ->type_name("SECONDS");
    return *command;
}

CLI::App& AddCommandWithID(CLI::App& group, const char* name, const char* description,
                           Options& options) {
    CLI::App& command = AddModemCommand(group, name, description, options);
    command.add_option("ID", options.id, "Device id, such as usbmodem0")->required();
    return command;
}

void AddModemCommands(CLI::App& app, Options& options) {
    CLI::App* modem = app.add_subcommand("modem", "USB modems that are plugged in");
    modem->add_flag("--direct", options.direct, "Ask the modems without the modem service");
    modem->require_subcommand(1);
    modem->fallthrough();

    AddModemCommand(*modem, "list", "List the modems and what they say of themselves", options)
        .callback([&options] { List(options); });

    CLI::App& show = AddCommandWithID(*modem, "show", "Show one modem and its profile", options);
    show.add_flag("--show-secrets", options.showSecrets, "Show the password as well");
    show.callback([&options] { Show(options); });

    AddWatchCommand(*modem, options);
    AddPINCommands(*modem, options);
    AddProfileCommands(*modem, options);
    AddConnectionCommands(*modem, options);
    AddModemCommand(*modem, "interfaces", "List the network interfaces of the modems", options)
        .callback([&options] { ListInterfaces(options); });
}

}  // namespace taviwireless::cli
