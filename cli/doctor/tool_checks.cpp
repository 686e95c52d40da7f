// SPDX-License-Identifier: MIT
// The programs that the library runs.
#include <taviwireless/wireless.h>
#include <unistd.h>

#include "base/join.h"
#include "base/split.h"
#include "cli/doctor/check.h"
#include "cli/modem/modem_access.h"
#include "wireless/rules/paths.h"

namespace taviwireless::cli {

namespace {

struct Tool {
    const char* program;  // with its path where the library names one
    const char* package;
};
constexpr char kDialler[] = "/usr/tavi/bin/wvdial";  // which runs the stock one, on a PC
constexpr char kHostRoot[] = "the host root, or the appliance's own";

// As the library's shell finds it, which has the folders of root in its path as well.
bool IsThere(const std::string& program) {
    if (program.find('/') != std::string::npos) {
        return access(program.c_str(), X_OK) == 0;
    }
    for (const char* folder :
         {"/usr/local/sbin/", "/usr/local/bin/", "/usr/sbin/", "/usr/bin/", "/sbin/", "/bin/"}) {
        if (access((folder + program).c_str(), X_OK) == 0) {
            return true;
        }
    }
    return false;
}

// What is missing is a failure where it is needed.
Findings Look(const std::vector<Tool>& tools, bool isNeeded) {
    std::string there;
    std::string missing;
    std::string packages;
    for (const auto& [program, package] : tools) {
        const bool isOurs = program == std::string(kDialler);
        const std::string name = isOurs ? program : Split(program, '/').back();
        IsThere(program) ? AddItem(there, name) : AddItem(missing, program);
        if (!IsThere(program) && packages.find(package) == std::string::npos) {
            AddItem(packages, package);
        }
    }
    if (missing.empty()) {
        return Ok(there);
    }
    return {{isNeeded ? Health::kFailed : Health::kWarning, "missing: " + missing,
             "install " + packages}};
}

Findings WifiPrograms() {
    return Look({{"/sbin/iwlist", "wireless-tools"},
                 {"/sbin/iwconfig", "wireless-tools"},
                 {"/usr/sbin/wpa_supplicant", "wpasupplicant"},
                 {"/usr/sbin/wpa_cli", "wpasupplicant"},
                 {"/sbin/ifconfig", "net-tools"},
                 {"/sbin/route", "net-tools"},
                 {"udhcpc", "udhcpc"}},
                TAVIWirelessAdapterNum() > 0);
}

Findings AccessPointPrograms() {
    return Look({{"hostapd", "hostapd"},
                 {"hostapd_cli", "hostapd"},
                 {"iwlist", "wireless-tools"},
                 {"udhcpd", "udhcpd"},
                 {wireless::kNetworkScript, kHostRoot}},
                TAVIWirelessAPIsSupported() == 1);
}

Findings ModemPrograms() {
    return Look({{kDialler, kHostRoot}, {"wvdial", "wvdial"}, {"pppd", "ppp"}},
                !PluggedModems().empty());
}

}  // namespace

Checks ToolChecks() {
    return {{"Wi-Fi programs", WifiPrograms},
            {"access point programs", AccessPointPrograms},
            {"modem programs", ModemPrograms}};
}

}  // namespace taviwireless::cli
