// SPDX-License-Identifier: MIT
// taviwireless doctor: what a connection needs, what of it is wrong, and what to do.
#include "cli/doctor/doctor_command.h"

#include <algorithm>
#include <cstdlib>
#include <iostream>

#include "cli/command_error.h"
#include "cli/command_lines.h"
#include "cli/doctor/check.h"
#include "cli/report.h"
#include "cli/terminal.h"

namespace taviwireless::cli {

namespace {

struct HealthWord {
    const char* word;
    const char* mark;  // of one width
    Colour colour;
};
const HealthWord& WordsOf(Health health) {
    static const HealthWord words[] = {{"ok", "ok", Colour::kGood},
                                       {"warning", "! ", Colour::kWarning},
                                       {"failed", "!!", Colour::kBad},
                                       {"unknown", "- ", Colour::kFaint}};
    return words[static_cast<int>(health)];
}

Checks AllChecks() {
    Checks all;
    for (const auto checks : {ToolChecks, FileChecks, AdapterChecks, AccessPointChecks,
                              ServiceChecks, ModemChecks, NetworkChecks}) {
        const Checks some = checks();
        all.insert(all.end(), some.begin(), some.end());
    }
    return all;
}

std::vector<std::string> Row(const char* subject, const Finding& finding) {
    const HealthWord& words = WordsOf(finding.health);
    return {
        Coloured(words.colour, words.mark), subject,
        Printable(finding.text) + (finding.advice.empty() ? "" : "; " + Printable(finding.advice))};
}

Json::Value Document(const char* subject, const Finding& finding) {
    Json::Value document;
    document["subject"] = subject;
    document["state"] = WordsOf(finding.health).word;
    document["text"] = finding.text;
    document["advice"] = TextOrNull(finding.advice);
    return document;
}

}  // namespace

void Examine(const Options& options) {
    Report report{{}, Json::arrayValue};
    bool hasFailed = false;
    ShowProgress("Examining ...");
    for (const Check& check : AllChecks()) {
        for (const Finding& finding : check.look()) {
            report.rows.push_back(Row(check.subject, finding));
            report.document.append(Document(check.subject, finding));
            hasFailed = hasFailed || finding.health == Health::kFailed;
        }
    }
    Print(options, report);
    if (hasFailed) {
        // The lines have said it, so there is no sentence.
        if (!std::cout.flush()) {
            throw CommandError(kFailure, "cannot write the output");
        }
        exit(kFailure);
    }
}

void AddDoctorCommand(const Command& program, Options& options) {
    Add(program, "doctor", "Look for what keeps modems and Wi-Fi from working, and say what to do",
        options, Examine)
        .SetFooter("Exit status:\n  0  nothing has failed\n  1  something has failed");
}

}  // namespace taviwireless::cli
