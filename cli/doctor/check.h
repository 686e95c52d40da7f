// SPDX-License-Identifier: MIT
#ifndef TAVIWIRELESS_CLI_DOCTOR_CHECK_H
#define TAVIWIRELESS_CLI_DOCTOR_CHECK_H

#include <string>
#include <vector>

// What taviwireless doctor looks at. Checks change nothing, and ask no modem anything.
namespace taviwireless::cli {

// kUnknown: it cannot be looked at, or there is nothing to look at.
enum class Health { kOk, kWarning, kFailed, kUnknown };

struct Finding {
    Health health;
    std::string text;
    std::string advice;  // what to do, when something is wrong
};
using Findings = std::vector<Finding>;

struct Check {
    const char* subject;
    Findings (*look)();  // a line for each; none where the subject does not come up
};
using Checks = std::vector<Check>;

inline Findings Ok(const std::string& text) {
    return {{Health::kOk, text, ""}};
}
inline Findings Unknown(const std::string& text, const std::string& advice = "") {
    return {{Health::kUnknown, text, advice}};
}
inline Findings Warning(const std::string& text, const std::string& advice) {
    return {{Health::kWarning, text, advice}};
}
inline Findings Failed(const std::string& text, const std::string& advice) {
    return {{Health::kFailed, text, advice}};
}
inline void Append(Findings& all, const Findings& more) {
    all.insert(all.end(), more.begin(), more.end());
}

// From the machine to the connection.
Checks ToolChecks();
Checks FileChecks();
Checks AdapterChecks();
Checks AccessPointChecks();
Checks ServiceChecks();
Checks ModemChecks();
Checks NetworkChecks();

}  // namespace taviwireless::cli

#endif
