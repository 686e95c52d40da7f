// SPDX-License-Identifier: MIT
#ifndef TAVIWIRELESS_TESTS_WIRELESS_WIFI_FIXTURE_H
#define TAVIWIRELESS_TESTS_WIRELESS_WIFI_FIXTURE_H

#include <sys/stat.h>

#include <cstdio>
#include <filesystem>
#include <sstream>
#include <stdexcept>
#include <string>
#include <vector>

#include "base/fixed_field.h"
#include "tests/support/files.h"
#include "tests/support/process.h"

// The Wi-Fi adapter and the system's tools as tests in an appliance root see them.
namespace taviwireless::test {

// What the model's settings say of Wi-Fi: "yes" or "no".
inline void SetSupport(const std::string& support) {
    WriteFile("/etc.defaults/taviinfo.conf", "support_wireless=" + support + "\n");
}

// "wlan0", down: one end of a veth pair, "wlan0-far" being the other. It goes with the object.
class WirelessInterface {
  public:
    WirelessInterface() { Shell("ip link add wlan0 type veth peer name wlan0-far"); }
    ~WirelessInterface() { RunProgram({"ip", "link", "delete", "wlan0"}); }
    WirelessInterface(const WirelessInterface&) = delete;
    WirelessInterface& operator=(const WirelessInterface&) = delete;

    void Up() { Shell("ip link set wlan0 up; ip link set wlan0-far up"); }
};

// Stand-ins for system programs at their real paths. Each appends "PATH ARGUMENTS" as one line to
// /tmp/commands and then does what its script says.
class ToolStandIns {
  public:
    ToolStandIns() { ForgetCommands(); }

    void Add(const std::string& path, const std::string& script = "") {
        WriteProgram(path, "#!/bin/sh\necho \"$0 $*\" >> /tmp/commands\n" + script + "\n");
    }

    std::vector<std::string> Commands() const {
        std::vector<std::string> lines;
        std::istringstream text(ReadFile("/tmp/commands"));
        for (std::string line; std::getline(text, line);) {
            lines.push_back(line);
        }
        return lines;
    }
    void ForgetCommands() { WriteFile("/tmp/commands", ""); }
};

// A line of the table that "/sbin/iwlist wlan0 scanning tavi" prints.
inline std::string ScanLine(int channel, const std::string& essid, const std::string& bssid,
                            int signal, const std::string& protocol, const std::string& security) {
    char line[512];
    snprintf(line, sizeof line, "%-4d %-32s %s %d %s %s\n", channel, essid.c_str(), bssid.c_str(),
             signal, protocol.c_str(), security.c_str());
    return line;
}

// A stand-in for iwlist. Run k of the table form, from 0, prints the k-th of the given tables, and
// the last one when there are no more. The form "last" prints /tmp/scan/last if there is such a
// file; others print nothing.
inline void AddScanner(ToolStandIns& tools, const std::vector<std::string>& tables) {
    const std::string headings =
        "Ch   ESSID                            BSSID             Signal Protocol Security\n" +
        std::string(80, '-') + "\n";
    Shell("rm -rf /tmp/scan");
    for (size_t k = 0; k < tables.size(); ++k) {
        WriteFile("/tmp/scan/" + std::to_string(k), headings + tables[k]);
    }
    tools.Add("/sbin/iwlist",
              "[ \"$3\" = tavi ] || { cat \"/tmp/scan/$3\" 2> /dev/null; exit 0; }\n"
              "k=$(cat /tmp/scan/next 2> /dev/null || echo 0)\n"
              "cat /tmp/scan/$k\n"
              "if [ -e /tmp/scan/$((k + 1)) ]; then echo $((k + 1)) > /tmp/scan/next; fi");
}

}  // namespace taviwireless::test

#endif
