#ifndef TAVIWIRELESS_CLI_MODEM_MODEM_REPORT_H
#define TAVIWIRELESS_CLI_MODEM_MODEM_REPORT_H

#include <json/forwards.h>

#include <vector>

#include "cli/modem/modem_access.h"
#include "cli/report.h"

namespace taviwireless::cli {

// The keys of a profile, in the order in which they are shown.
struct ProfileKey {
    const char* name;
    const char* title;
    bool canBeSet;
};
constexpr char kPassword[] = "pass";
constexpr ProfileKey kProfileKeys[] = {
    {"number", "Number", true},    {"user", "User", true},
    {kPassword, "Password", true}, {"apn", "APN", true},
    {"isp", "ISP", true},          {"location", "Location", true},
    {"roaming", "Roaming", false}, {"default_gw", "Default route", true},
};

// What is not known is null in documents and "-" in tables. The password is hidden unless
// showSecrets.
Json::Value ToJson(const ModemState& state, bool showSecrets = false);
Json::Value ToJson(const std::vector<ModemState>& states);
Json::Value ToJson(const Profile& profile, bool showSecrets);

// A row for each modem, or the sentence that there is none.
std::string ListText(const std::vector<ModemState>& states);
// A row for each value.
Table ShowTable(const ModemState& state, bool showSecrets);
Table ProfileTable(const Profile& profile, bool showSecrets);

}  // namespace taviwireless::cli

#endif
