#include "cli/modem/modem_report.h"

#include "cli/terminal.h"

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
    return state.simStatus == kReady ? std::to_string(state.signal) + "%" : "-";
}

std::string ProtectionCell(const ModemState& state) {
    return HasSIM(state) ? (state.pinProtected ? "on" : "off") : "-";
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

std::string NetworkCell(const std::string& status) {
    return status == kConnectionLost ? "connection lost" : Cell(status);
}

std::string ProfileValue(const Profile& profile, const std::string& key, bool showSecrets) {
    const auto found = profile.find(key);
    if (found == profile.end()) {
        return "";
    }
    return key == profile::kPassword ? SecretText(found->second, showSecrets) : found->second;
}

}  // namespace

Report Describe(const Profile& profile, bool showSecrets) {
    Report report;
    for (const ProfileKey& key : kProfileKeys) {
        const std::string value = ProfileValue(profile, key.name, showSecrets);
        report.Add(key.name, key.title, value, Printable(value));
    }
    Json::Value& isDefault = report.document[profile::kDefaultGateway];
    isDefault = isDefault == "true";
    Json::Value& roaming = report.document[profile::kRoaming];
    roaming = roaming.asString().empty() ? Json::Value() : roaming == "true";
    return report;
}

Report Describe(const ModemState& state, bool showSecrets) {
    const Json::Value unknown;
    const bool isReady = state.simStatus == kReady;
    Report report;
    const auto addAttempts = [&](const char* key, const char* title, int attempts) {
        report.Add(key, title, AreKnown(state, attempts) ? Json::Value(attempts) : unknown,
                   AttemptsCell(state, attempts));
    };
    report.Add("id", "Device", state.id, state.id);
    report.Add("vendor", "Vendor", WithoutBlanks(state.vendor));
    report.Add("product", "Product", WithoutBlanks(state.product));
    report.Add("carrier", "Operator", WithoutBlanks(state.carrier));
    report.Add("signal", "Signal", isReady ? Json::Value(state.signal) : unknown,
               SignalCell(state));
    report.Add("sim_status", "SIM", state.simStatus, SIMCell(state.simStatus));
    report.Add("pin_protected", "PIN lock",
               HasSIM(state) ? Json::Value(state.pinProtected) : unknown, ProtectionCell(state));
    addAttempts("pin_remains", "PIN attempts", state.pinRemains);
    addAttempts("puk_remains", "PUK attempts", state.pukRemains);
    report.Add("net_status", "Network", TextOrNull(state.netStatus), NetworkCell(state.netStatus));
    report.Add("ip", "Address", state.ip);
    report.AddPart("profile",
                   "Profile: ", isReady ? Describe(state.profile, showSecrets) : Report());
    return report;
}

Report DescribeAll(const std::vector<ModemState>& states) {
    if (states.empty()) {
        return {{{"No modem is plugged in: there is no usbmodem.info file in /tmp/."}},
                Json::arrayValue};
    }
    Report all{{},
               Json::arrayValue,
               {{"DEVICE"},
                {"VENDOR", kText},
                {"PRODUCT", kText},
                {"OPERATOR", kText},
                {"SIGNAL"},
                {"SIM", kText},
                {"PIN LOCK"},
                {"PIN/PUK LEFT"},
                {"NETWORK", kText},
                {"ADDRESS"}}};
    for (const ModemState& state : states) {
        all.document.append(Describe(state).document);
        all.rows.push_back(
            {state.id, Cell(WithoutBlanks(state.vendor)), Cell(WithoutBlanks(state.product)),
             Cell(WithoutBlanks(state.carrier)), SignalCell(state), SIMCell(state.simStatus),
             ProtectionCell(state),
             AttemptsCell(state, state.pinRemains) + " / " + AttemptsCell(state, state.pukRemains),
             NetworkCell(state.netStatus), Cell(state.ip)});
    }
    return all;
}

}  // namespace taviwireless::cli
