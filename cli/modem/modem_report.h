#ifndef TAVIWIRELESS_CLI_MODEM_MODEM_REPORT_H
#define TAVIWIRELESS_CLI_MODEM_MODEM_REPORT_H

#include <string>
#include <vector>

#include "cli/modem/link_usage.h"
#include "cli/modem/modem_access.h"
#include "cli/report.h"

namespace taviwireless::cli {

// What takes a question of its own, or changes all the time.
struct ModemDetails {
    std::string registration;  // "home", "roaming", "searching", ...; empty: not known
    LinkUsage usage;
};

// The password is hidden unless showSecrets.
Report Describe(const ModemState& state, bool showSecrets = false);
Report Describe(const ModemState& state, const ModemDetails& details, bool showSecrets);
Report Describe(const Profile& profile, bool showSecrets);

// A row for each modem, or the sentence that there is none.
Report DescribeAll(const std::vector<ModemState>& states);

// A person's table of modems, printed row by row as each gets known: its columns are as wide as
// most values are.
class ModemRows {
  public:
    ModemRows();
    void Add(const ModemState& state);
};

// The state of a connection as a person reads it.
std::string StateCell(const std::string& status);

}  // namespace taviwireless::cli

#endif
