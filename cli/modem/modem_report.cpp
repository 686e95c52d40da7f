// SPDX-License-Identifier: MIT
#include "cli/modem/modem_report.h"

#include <algorithm>
#include <iostream>

#include "base/join.h"
#include "cli/terminal.h"
#include "usbmodem/rules/paths.h"

namespace taviwireless::cli {

namespace {

bool IsAnswering(const ModemState& state) {
    return state.simStatus != kNoAnswer;
}

bool HasSIM(const ModemState& state) {
    return IsAnswering(state) && state.simStatus != kNoSIM;
}

// Modems put blanks before what they say: "+CGMI: NAME".
std::string WithoutBlanks(const std::string& text) {
    const size_t begin = text.find_first_not_of(' ');
    return begin == std::string::npos ? "" : text.substr(begin);
}

std::string SignalCell(const ModemState& state) {
    const std::string drawn = state.trend.empty() ? "" : " " + state.trend;
    return state.simStatus == kReady ? std::to_string(state.signal) + "%" + drawn : "-";
}

std::string ProtectionCell(const ModemState& state) {
    return HasSIM(state) ? (state.pinProtected ? "yes" : "no") : "-";
}

bool AreKnown(const ModemState& state, int attempts) {
    return HasSIM(state) && attempts >= 0;
}

std::string AttemptsCell(const ModemState& state, int attempts) {
    return AreKnown(state, attempts) ? std::to_string(attempts) : "-";
}

std::string SIMCell(const std::string& status) {
    static const std::map<std::string, std::string> texts = {{kReady, "ready"},
                                                             {kWantsPIN, "wants PIN"},
                                                             {kWantsPUK, "wants PUK"},
                                                             {kNoSIM, "no SIM"},
                                                             {kNoAnswer, "modem not ready"}};
    const auto text = texts.find(status);
    return text == texts.end() ? Cell(status) : text->second;
}

std::string ProfileValue(const Profile& profile, const std::string& key, bool showSecrets) {
    const auto found = profile.find(key);
    if (found == profile.end()) {
        return "";
    }
    return key == profile::kPassword ? SecretText(found->second, showSecrets) : found->second;
}

Json::Value YesOrNull(const std::string& value) {
    return value.empty() ? Json::Value() : Json::Value(value == "true");
}

std::string YesCell(const std::string& value) {
    return value.empty() ? "-" : value == "true" ? "yes" : "no";
}

void AddPorts(Report& report, const std::vector<std::string>& ports) {
    std::string names;
    Json::Value list = Json::arrayValue;
    for (const std::string& port : ports) {
        AddItem(names, port);
        list.append(port);
    }
    report.Add("ports", "Ports", ports.empty() ? Json::Value() : list, Cell(names));
}

Report DescribeModem(const ModemState& state) {
    const Json::Value unknown;
    Report report;
    const auto addAttempts = [&](const char* key, const char* title, int attempts) {
        report.Add(key, title, AreKnown(state, attempts) ? Json::Value(attempts) : unknown,
                   AttemptsCell(state, attempts));
    };
    report.Add("id", "Device", state.id, state.id);
    report.document["answers"] = IsAnswering(state);
    report.Add("vendor", "Vendor", WithoutBlanks(state.vendor));
    report.Add("product", "Product", WithoutBlanks(state.product));
    AddPorts(report, state.ports);
    report.Add("operator", "Operator", WithoutBlanks(state.carrier));
    report.Add("signal", "Signal", state.simStatus == kReady ? Json::Value(state.signal) : unknown,
               SignalCell(state));
    report.Add("sim_state", "SIM", IsAnswering(state) ? TextOrNull(state.simStatus) : unknown,
               SIMCell(state.simStatus));
    report.Add("imsi", "IMSI", WithoutBlanks(state.imsi));
    report.Add("pin_lock", "PIN lock", HasSIM(state) ? Json::Value(state.pinProtected) : unknown,
               ProtectionCell(state));
    addAttempts("pin_attempts", "PIN attempts", state.pinRemains);
    addAttempts("puk_attempts", "PUK attempts", state.pukRemains);
    report.Add("state", "State", TextOrNull(state.netStatus), StateCell(state.netStatus));
    report.Add("interface", "Interface", state.interface);
    report.Add("address", "Address", state.ip);
    return report;
}

void AddProfile(Report& report, const ModemState& state, bool showSecrets) {
    const bool isReady = state.simStatus == kReady;
    report.AddPart("profile",
                   "Profile: ", isReady ? Describe(state.profile, showSecrets) : Report());
}

}  // namespace

const std::vector<Column> kModemColumns = {{"DEVICE", !kText, 9},
                                           {"VENDOR", kText, 10, kExtra},
                                           {"PRODUCT", kText, 12},
                                           {"OPERATOR", kText, 14},
                                           {"SIGNAL"},
                                           {"SIM", kText, 15},
                                           {"PIN LOCK", !kText, 0, kExtra},
                                           {"PIN/PUK LEFT", !kText, 0, kExtra},
                                           {"STATE", kText, 15},
                                           {"ADDRESS", !kText, 15}};

std::vector<std::string> ModemRow(const ModemState& state) {
    return {state.id,
            Cell(WithoutBlanks(state.vendor)),
            Cell(WithoutBlanks(state.product)),
            Cell(WithoutBlanks(state.carrier)),
            SignalCell(state),
            SIMCell(state.simStatus),
            ProtectionCell(state),
            AttemptsCell(state, state.pinRemains) + " / " + AttemptsCell(state, state.pukRemains),
            StateCell(state.netStatus),
            Cell(state.ip)};
}

std::string StateCell(const std::string& status) {
    return status == kConnectionLost ? "connection lost" : Cell(status);
}

Report Describe(const Profile& profile, bool showSecrets) {
    Report report;
    for (const ProfileKey& key : kProfileKeys) {
        const std::string value = ProfileValue(profile, key.name, showSecrets);
        const bool isSwitch = key.name == std::string(profile::kDefaultGateway) ||
                              key.name == std::string(profile::kRoaming);
        report.Add(key.shown, key.title, isSwitch ? YesOrNull(value) : TextOrNull(value),
                   isSwitch ? YesCell(value) : Cell(value));
    }
    return report;
}

Report Describe(const ModemState& state, bool showSecrets) {
    Report report = DescribeModem(state);
    AddProfile(report, state, showSecrets);
    return report;
}

Report Describe(const ModemState& state, const ModemDetails& details, bool showSecrets) {
    Report report = DescribeModem(state);
    const LinkUsage& usage = details.usage;
    report.Add("registration", "Registration", details.registration);
    report.Add("dialled_at", "Dialled at", NumberOrNull(usage.since), TimeCell(usage.since));
    report.Add("bytes_sent", "Sent", NumberOrNull(usage.sent), BytesCell(usage.sent));
    report.Add("bytes_received", "Received", NumberOrNull(usage.received),
               BytesCell(usage.received));
    const std::string imsi = WithoutBlanks(state.imsi);
    report.Add("log_file", "Log file", imsi.empty() ? "" : usbmodem_lib::DialLogPath(imsi));
    AddProfile(report, state, showSecrets);
    return report;
}

Report DescribeAll(const std::vector<ModemState>& states) {
    if (states.empty()) {
        return {{{kNoModems}}, Json::arrayValue};
    }
    Report all{{}, Json::arrayValue, kModemColumns};
    for (Column& column : all.columns) {
        column.width = 0;  // all rows are known
    }
    for (const ModemState& state : states) {
        all.document.append(Describe(state).document);
        all.rows.push_back(ModemRow(state));
    }
    return all;
}

}  // namespace taviwireless::cli
