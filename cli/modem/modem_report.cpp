#include "cli/modem/modem_report.h"

#include <json/json.h>

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

Json::Value AttemptsOrNull(const ModemState& state, int attempts) {
    return HasSIM(state) && attempts >= 0 ? Json::Value(attempts) : Json::Value();
}

std::string SignalCell(const ModemState& state) {
    return state.simStatus == kReady ? std::to_string(state.signal) + "%" : "-";
}

std::string ProtectionCell(const ModemState& state) {
    return HasSIM(state) ? (state.pinProtected ? "on" : "off") : "-";
}

std::string AttemptsCell(const ModemState& state, int attempts) {
    return HasSIM(state) && attempts >= 0 ? std::to_string(attempts) : "-";
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
    return status == "connection_lost" ? "connection lost" : Cell(status);
}

std::string ProfileValue(const Profile& profile, const std::string& key, bool showSecrets) {
    const auto found = profile.find(key);
    if (found == profile.end()) {
        return "";
    }
    const bool isHidden = key == kPassword && !showSecrets && !found->second.empty();
    return isHidden ? "********" : found->second;
}

}  // namespace

Json::Value ToJson(const Profile& profile, bool showSecrets) {
    Json::Value document(Json::objectValue);
    for (const ProfileKey& key : kProfileKeys) {
        document[key.name] = ProfileValue(profile, key.name, showSecrets);
    }
    document["default_gw"] = document["default_gw"] == "true";
    const std::string roaming = document["roaming"].asString();
    document["roaming"] = roaming.empty() ? Json::Value() : Json::Value(roaming == "true");
    return document;
}

Json::Value ToJson(const ModemState& state, bool showSecrets) {
    Json::Value document;
    document["id"] = state.id;
    document["vendor"] = TextOrNull(WithoutBlanks(state.vendor));
    document["product"] = TextOrNull(WithoutBlanks(state.product));
    document["carrier"] = TextOrNull(WithoutBlanks(state.carrier));
    document["signal"] = state.simStatus == kReady ? Json::Value(state.signal) : Json::Value();
    document["sim_status"] = state.simStatus;
    document["pin_protected"] = HasSIM(state) ? Json::Value(state.pinProtected) : Json::Value();
    document["pin_remains"] = AttemptsOrNull(state, state.pinRemains);
    document["puk_remains"] = AttemptsOrNull(state, state.pukRemains);
    document["net_status"] = TextOrNull(state.netStatus);
    document["ip"] = TextOrNull(state.ip);
    document["profile"] =
        state.simStatus == kReady ? ToJson(state.profile, showSecrets) : Json::Value();
    return document;
}

Json::Value ToJson(const std::vector<ModemState>& states) {
    Json::Value documents(Json::arrayValue);
    for (const ModemState& state : states) {
        documents.append(ToJson(state));
    }
    return documents;
}

std::string ListText(const std::vector<ModemState>& states) {
    if (states.empty()) {
        return "No modem is plugged in: there is no usbmodem.info file in /tmp/.\n";
    }
    Table table{{"DEVICE", "VENDOR", "PRODUCT", "OPERATOR", "SIGNAL", "SIM", "PIN LOCK",
                 "PIN/PUK LEFT", "NETWORK", "ADDRESS"}};
    for (const ModemState& state : states) {
        table.push_back(
            {state.id, Cell(WithoutBlanks(state.vendor)), Cell(WithoutBlanks(state.product)),
             Cell(WithoutBlanks(state.carrier)), SignalCell(state), SIMCell(state.simStatus),
             ProtectionCell(state),
             AttemptsCell(state, state.pinRemains) + " / " + AttemptsCell(state, state.pukRemains),
             NetworkCell(state.netStatus), Cell(state.ip)});
    }
    return ToText(table);
}

Table ShowTable(const ModemState& state, bool showSecrets) {
    Table table{{"Device", state.id},
                {"Vendor", Cell(WithoutBlanks(state.vendor))},
                {"Product", Cell(WithoutBlanks(state.product))},
                {"Operator", Cell(WithoutBlanks(state.carrier))},
                {"Signal", SignalCell(state)},
                {"SIM", SIMCell(state.simStatus)},
                {"PIN lock", ProtectionCell(state)},
                {"PIN attempts", AttemptsCell(state, state.pinRemains)},
                {"PUK attempts", AttemptsCell(state, state.pukRemains)},
                {"Network", NetworkCell(state.netStatus)},
                {"Address", Cell(state.ip)}};
    if (state.simStatus == kReady) {
        for (auto& row : ProfileTable(state.profile, showSecrets)) {
            row[0] = "Profile: " + row[0];
            table.push_back(row);
        }
    }
    return table;
}

Table ProfileTable(const Profile& profile, bool showSecrets) {
    Table table;
    for (const ProfileKey& key : kProfileKeys) {
        table.push_back({key.title, Printable(ProfileValue(profile, key.name, showSecrets))});
    }
    return table;
}

}  // namespace taviwireless::cli
