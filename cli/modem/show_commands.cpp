// taviwireless modem list, show, interfaces: what the modems say of themselves.
#include "cli/deadline.h"
#include "cli/modem/modem_access.h"
#include "cli/modem/modem_commands.h"
#include "cli/modem/modem_report.h"

namespace taviwireless::cli {

void ListModems(const Options& options) {
    const auto access = MakeAccess(options);
    const auto states = Deadline(options).Limit([&] { return access->KnownModems(options.json); });
    Print(options, DescribeAll(states));
}

void ShowModem(const Options& options) {
    const auto access = MakeAccess(options);
    const auto state = Deadline(options).Limit([&] { return access->Look(options.id); });
    Print(options, Describe(state, options.showSecrets));
}

void ListInterfaces(const Options& options) {
    const auto access = MakeAccess(options);
    const auto interfaces = Deadline(options).Limit([&] { return access->Interfaces(); });
    Report all{{}, Json::arrayValue, {{"MODEM"}, {"INTERFACE"}}};
    for (const Interface& interface : interfaces) {
        Json::Value document;
        document["id"] = interface.id;
        document["interface"] = TextOrNull(interface.name);
        all.document.append(document);
        all.rows.push_back({interface.id, Cell(interface.name)});
    }
    Print(options, all);
}

}  // namespace taviwireless::cli
