// SPDX-License-Identifier: MIT
#include "cli/modem/service_document.h"

#include <cstdlib>

#include "base/split.h"

namespace taviwireless::cli {

namespace {

// The values of the lines <tabs>"KEY": VALUE, by key. In a modem document the keys of the modem
// and of its profile differ, so the nesting need not be followed.
std::map<std::string, std::string> ReadLines(const std::string& document) {
    std::map<std::string, std::string> values;
    for (const std::string& line : Lines(document)) {
        const size_t key = line.find_first_not_of('\t');
        const size_t colon = line.find("\": ");
        if (key == std::string::npos || line[key] != '"' || colon == std::string::npos) {
            continue;
        }
        std::string value = line.substr(colon + 3);
        if (!value.empty() && value.back() == ',') {
            value.pop_back();
        }
        if (value.size() >= 2 && value.front() == '"' && value.back() == '"') {
            value = value.substr(1, value.size() - 2);
        }
        values[line.substr(key + 1, colon - key - 1)] = value;
    }
    return values;
}

std::string TextOr(const std::map<std::string, std::string>& values, const char* key,
                   const std::string& otherwise) {
    const auto found = values.find(key);
    return found == values.end() ? otherwise : found->second;
}

int NumberOr(const std::map<std::string, std::string>& values, const char* key, int otherwise) {
    const std::string digits = TextOr(values, key, "");
    return digits.empty() ? otherwise : std::atoi(digits.c_str());
}

Profile ProfileOf(const std::map<std::string, std::string>& values) {
    Profile profile;
    for (const ProfileKey& key : kProfileKeys) {
        const auto found = values.find(key.name);
        if (found != values.end()) {
            profile.insert(*found);
        }
    }
    return profile;
}

}  // namespace

ModemState ReadModemDocument(const std::string& document) {
    const auto values = ReadLines(document);
    ModemState state;
    state.id = TextOr(values, "id", "");
    state.vendor = TextOr(values, "vendor", "");
    state.product = TextOr(values, "product", "");
    state.signal = NumberOr(values, "signal", state.signal);
    state.ip = TextOr(values, "ip", "");
    state.carrier = TextOr(values, "carrier", "");
    state.netStatus = TextOr(values, "net_status", "");
    state.simStatus = TextOr(values, "sim_status", state.simStatus);
    state.pinProtected = TextOr(values, "pin_protected", "") == "true";
    state.pinRemains = NumberOr(values, "pin_remains", state.pinRemains);
    state.pukRemains = NumberOr(values, "puk_remains", state.pukRemains);
    state.profile = ProfileOf(values);
    return state;
}

Profile ReadProfileDocument(const std::string& document) {
    return ProfileOf(ReadLines(document));
}

}  // namespace taviwireless::cli
