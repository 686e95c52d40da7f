#ifndef TAVIWIRELESS_CLI_MODEM_MODEM_REPORT_H
#define TAVIWIRELESS_CLI_MODEM_MODEM_REPORT_H

#include <vector>

#include "cli/modem/modem_access.h"
#include "cli/report.h"

namespace taviwireless::cli {

// The password is hidden unless showSecrets.
Report Describe(const ModemState& state, bool showSecrets = false);
Report Describe(const Profile& profile, bool showSecrets);

// A row for each modem, or the sentence that there is none.
Report DescribeAll(const std::vector<ModemState>& states);

}  // namespace taviwireless::cli

#endif
