// taviwireless modem list, show, interfaces: what the modems say of themselves.
#include <json/json.h>

#include <iostream>

#include "cli/deadline.h"
#include "cli/modem/modem_access.h"
#include "cli/modem/modem_commands.h"
#include "cli/modem/modem_report.h"

namespace taviwireless::cli {

void ListModems(const Options& options) {
    const auto access = MakeAccess(options);
    const auto states = Deadline(options).Limit([&] { return access->LookAtAll(); });
    if (options.json) {
        Print(ToJson(states));
    } else {
        ShowProgress("");
        std::cout << ListText(states);
    }
}

void ShowModem(const Options& options) {
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

}  // namespace taviwireless::cli
