// SPDX-License-Identifier: MIT
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

// What stands in the place of a table without rows.
constexpr char kNoModems[] = "No modem is plugged in: there is no usbmodem.info file in /tmp/.";

// The table of modems, for one that is printed row by row: with the widths that most values need.
extern const std::vector<Column> kModemColumns;
std::vector<std::string> ModemRow(const ModemState& state);

// The state of a connection as a person reads it.
std::string StateCell(const std::string& status);

}  // namespace taviwireless::cli

#endif
