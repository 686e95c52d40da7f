// SPDX-License-Identifier: MIT
// taviwireless ap check: what the access point would be started with, and what hostapd says of it.
#include <unistd.h>

#include <cstdio>
#include <cstring>
#include <iostream>
#include <sstream>

#include "base/join.h"
#include "base/memory_file.h"
#include "cli/adapter/requirements.h"
#include "cli/ap/access_point.h"
#include "cli/ap/ap_changes.h"
#include "cli/ap/ap_commands.h"
#include "cli/ap/hostapd.h"
#include "cli/command_error.h"
#include "cli/report.h"
#include "cli/terminal.h"
#include "wireless/system/shell.h"

namespace taviwireless::cli {

namespace {

// hostapd has no mode that only checks. This key, which it cannot know, keeps it from starting; it
// names all other faults first.
constexpr char kStopper[] = "taviwireless_only_checks";

// What may be shown of the file.
const std::string& Shown(const ConfFile& file, bool showSecrets) {
    return showSecrets ? file.conf.Text() : file.conf.Shown();
}

// The path by which programs that are started meanwhile can open the file.
std::string PathOf(const UniqueFd& file) {
    if (!file) {
        throw CommandError(kFailure, "there is no memory for hostapd's settings");
    }
    return "/proc/" + std::to_string(getpid()) + "/fd/" + std::to_string(file.Get());
}

struct Verdict {
    int errors = -1;  // negative: none was heard
    std::vector<std::string> remarks;
};

// Returns what hostapd says of the text of both files. Its "Line 7: ..." counts through both.
Verdict AskNewHostapd(const std::string& text) {
    const UniqueFd file = MemoryFile(text + kStopper + "=1\n");
    const wireless::Pipe output(
        wireless::Command(128, {"hostapd ", wireless::Argument{PathOf(file)}, " 2>&1"}));
    Verdict verdict;
    char line[1024];
    while (output && fgets(line, sizeof line, output.get()) != nullptr) {
        std::string remark = line;
        remark.erase(remark.find_last_not_of('\n') + 1);
        if (sscanf(line, "%d errors found in", &verdict.errors) == 1) {
            --verdict.errors;  // the stopper
            break;             // what follows is that it does not start
        }
        if (remark.find(kStopper) == std::string::npos) {
            verdict.remarks.push_back(Printable(remark));
        }
    }
    return verdict;
}

std::string Join(const std::vector<std::string>& texts) {
    std::string joined;
    for (const std::string& text : texts) {
        AddItem(joined, text, "; ");
    }
    return joined;
}

Verdict CheckWithHostapd(const std::vector<ConfFile>& files) {
    std::string text;
    for (const ConfFile& file : files) {
        text += file.conf.Text();
    }
    // The network script leaves this line out as well; the BSSID of guests is not read from the
    // settings, and hostapd derives one.
    constexpr char kNoBssid[] = "\nbssid=\n";
    if (const size_t line = text.find(kNoBssid); line != text.npos) {
        text.erase(line, strlen(kNoBssid) - 1);
    }
    Verdict verdict = AskNewHostapd(text);
    if (verdict.errors < 0) {
        throw CommandError(kFailure,
                           "hostapd cannot be asked; is it installed? " + Join(verdict.remarks));
    }
    if (verdict.errors > 0) {
        throw CommandError(kFailure, "hostapd would not start: " + Join(verdict.remarks));
    }
    return verdict;
}

// A person reads it before what is said of it, whatever comes then.
void PrintText(const std::vector<ConfFile>& files, bool showSecrets) {
    for (const ConfFile& file : files) {
        // Line by line: the line breaks belong to the file and stay.
        std::istringstream lines(Shown(file, showSecrets));
        std::cout << "# " << file.path << '\n';
        for (std::string line; std::getline(lines, line);) {
            std::cout << Printable(line) << '\n';
        }
    }
    std::cout.flush();
}

Report Describe(const std::vector<ConfFile>& files, const Verdict& verdict, bool showSecrets) {
    Report report;
    report.document["files"] = Json::Value(Json::objectValue);
    for (const ConfFile& file : files) {
        report.document["files"][file.path] = Shown(file, showSecrets);
    }
    report.document["remarks"] = Json::Value(Json::arrayValue);
    for (const std::string& remark : verdict.remarks) {
        report.document["remarks"].append(remark);
        report.rows.push_back({"hostapd: " + remark});
    }
    report.rows.push_back({"hostapd understands all of it."});
    return report;
}

}  // namespace

void CheckAP(const Options& options) {
    RequireWifiSettings();
    const WirelessAPSettings settings = ReadAPSettings();
    const std::vector<ConfFile> files = RenderConfFiles(settings.ap);
    if (!options.json) {
        PrintText(files, options.showSecrets);
    }
    CheckAPConf(settings.ap);
    Print(options, Describe(files, CheckWithHostapd(files), options.showSecrets));
}

}  // namespace taviwireless::cli
