// SPDX-License-Identifier: MIT
#include "sim/personality.h"

#include <json/reader.h>

#include <algorithm>
#include <filesystem>
#include <fstream>
#include <stdexcept>

#include "base/join.h"
#include "sim/at_text.h"

namespace taviwireless::sim {

const std::vector<std::string> kComputedPlaceholders = {
    "sim_state", "lock", "pin_attempts", "puk_attempts", "attempts_now", "registration"};

namespace {

namespace fs = std::filesystem;

constexpr int kMostExtended = 8;  // a longer chain is a circle

const std::map<std::string, SimNeed> kNeeds = {
    {"nothing", SimNeed::kNothing}, {"card", SimNeed::kCard}, {"unlocked", SimNeed::kUnlocked}};

const std::map<std::string, Effect> kEffects = {
    {"reset", Effect::kReset},          {"dial", Effect::kDial},
    {"hang_up", Effect::kHangUp},       {"enter_pin", Effect::kEnterPin},
    {"change_pin", Effect::kChangePin}, {"set_lock", Effect::kSetLock}};

const std::map<std::string, PortRole> kRoles = {
    {"dial", PortRole::kDial}, {"at", PortRole::kAt}, {"mute", PortRole::kMute}};

const std::vector<std::string> kSections = {"extends",   "vendor_id", "ports",
                                            "variables", "errors",    "commands"};

// The errors that the modem reports by itself; a personality gives each its number and text.
const std::vector<std::string> kNeededErrors = {"not_allowed",    "sim_absent",   "sim_pin",
                                                "sim_puk",        "sim_failure",  "sim_busy",
                                                "wrong_password", "bad_argument", "sim_blocked"};

const std::vector<std::string> kNeededVariables = {"echo", "cmee", "roaming"};

template <typename List>
bool Holds(const List& list, const std::string& word) {
    return std::find(std::begin(list), std::end(list), word) != std::end(list);
}

// Beside the program, so that it is found in a build tree, once installed, and when moved.
fs::path Folder() {
    return fs::read_symlink("/proc/self/exe").parent_path().parent_path() /
           "share/taviwireless/modemsim";
}

// Without line breaks and the star before the first line.
std::string OneLine(const std::string& text) {
    constexpr char kBlanks[] = " \t\r\n";
    std::string line = text.substr(text.rfind("* ", 0) == 0 ? 1 : 0);
    for (size_t end = 0; (end = line.find('\n')) != std::string::npos;) {
        const size_t begin = line.find_last_not_of(kBlanks, end) + 1;
        const size_t next = std::min(line.find_first_not_of(kBlanks, end), line.size());
        line.replace(begin, next - begin, " ");
    }
    return line;
}

// What is wrong with a file; LoadInto adds the file's name.
struct BadContent : std::runtime_error {
    using runtime_error::runtime_error;
};

[[noreturn]] void Fail(const std::string& place, const std::string& problem) {
    throw BadContent("at " + place + ": " + problem);
}

Json::Value ReadJson(const std::string& path) {
    std::ifstream file(path);
    if (!file) {
        throw std::invalid_argument("its personality " + path + " cannot be opened");
    }
    Json::CharReaderBuilder builder;
    Json::CharReaderBuilder::strictMode(&builder.settings_);
    Json::Value root;
    std::string errors;
    if (!Json::parseFromStream(builder, file, &root, &errors)) {
        throw BadContent("as JSON:" + OneLine(errors));
    }
    return root;
}

std::string Text(const Json::Value& value, const std::string& place) {
    if (!value.isString()) {
        Fail(place, "a text in quotes is expected");
    }
    return value.asString();
}

const Json::Value& Object(const Json::Value& value, const std::string& place) {
    if (!value.isNull() && !value.isObject()) {
        Fail(place, "an object in braces is expected");
    }
    return value;
}

template <typename Value>
Value Choose(const std::map<std::string, Value>& choices, const Json::Value& word,
             const std::string& place) {
    const auto found = choices.find(Text(word, place));
    if (found != choices.end()) {
        return found->second;
    }
    std::string known;
    for (const auto& [name, value] : choices) {
        AddItem(known, name);
    }
    Fail(place, "'" + word.asString() + "' is none of " + known);
}

void ReadSettings(const Json::Value& settings, const std::string& place, CommandRule* rule) {
    for (const auto& name : Object(settings, place).getMemberNames()) {
        const Json::Value& value = settings[name];
        if (value.isInt() && value.asInt() > 0) {
            rule->setToArgument[name] = value.asUInt();
        } else if (value.isString()) {
            rule->setToText[name] = value.asString();
        } else {
            Fail(place + " / " + name, "the number of an argument, or a text, is expected");
        }
    }
}

CommandRule ReadRule(const Json::Value& entry, const std::string& place) {
    CommandRule rule;
    if (!entry.isObject()) {
        Fail(place, "an object in braces is expected");
    }
    for (const auto& key : entry.getMemberNames()) {
        const std::string here = place + " / " + key;
        if (key == "reply" && entry[key].isArray()) {
            for (const auto& line : entry[key]) {
                rule.reply.push_back(Text(line, here));
            }
        } else if (key == "needs") {
            rule.needs = Choose(kNeeds, entry[key], here);
        } else if (key == "effect") {
            rule.effect = Choose(kEffects, entry[key], here);
        } else if (key == "set") {
            ReadSettings(entry[key], here, &rule);
        } else {
            Fail(here, "reply (a list), needs, effect and set are what a command has");
        }
    }
    return rule;
}

ErrorText ReadError(const Json::Value& entry, const std::string& place) {
    if (!entry.isArray() || entry.size() != 2 || !entry[0].isInt() || !entry[1].isString()) {
        Fail(place, "a number and a text are expected, as in [11, \"SIM PIN required\"]");
    }
    return {entry[0].asInt(), entry[1].asString()};
}

// Puts the members of root[section] into *target, through read; null takes a member out.
template <typename Value, typename Read>
void Merge(const Json::Value& root, const std::string& section,
           std::map<std::string, Value>* target, Read read) {
    const Json::Value& members = Object(root[section], section);
    for (const auto& name : members.getMemberNames()) {
        if (members[name].isNull()) {
            target->erase(name);
        } else {
            (*target)[name] = read(members[name], section + " / " + name);
        }
    }
}

void ReadPorts(const Json::Value& ports, std::vector<PortRole>* target) {
    if (!ports.isArray() || ports.empty()) {
        Fail("ports", "a list of dial, at and mute is expected");
    }
    target->clear();
    for (const auto& port : ports) {
        target->push_back(Choose(kRoles, port, "ports"));
    }
}

void Apply(const Json::Value& root, Personality* target) {
    for (const auto& section : root.getMemberNames()) {
        if (!Holds(kSections, section)) {
            Fail(section, "there is no such section");
        }
    }
    if (root.isMember("vendor_id")) {
        target->vendorId = Text(root["vendor_id"], "vendor_id");
    }
    if (root.isMember("ports")) {
        ReadPorts(root["ports"], &target->ports);
    }
    Merge(root, "variables", &target->variables, Text);
    Merge(root, "errors", &target->errors, ReadError);
    Merge(root, "commands", &target->rules, ReadRule);
}

void CheckPlaceholders(const Personality& personality, const std::string& line,
                       const std::string& place) {
    size_t close = 0;
    for (size_t open = 0; (open = line.find('{', close)) != std::string::npos &&
                          (close = line.find('}', open)) != std::string::npos;) {
        const std::string name = line.substr(open + 1, close - open - 1);
        if (personality.variables.count(name) == 0 && !Holds(kComputedPlaceholders, name)) {
            Fail(place, "there is no variable '" + name + "'");
        }
    }
}

void CheckRule(const Personality& personality, const CommandRule& rule, const std::string& place) {
    for (const auto& line : rule.reply) {
        CheckPlaceholders(personality, line, place);
    }
    const auto check = [&](const std::string& name) {
        if (personality.variables.count(name) == 0) {
            Fail(place, "there is no variable '" + name + "'");
        }
    };
    for (const auto& [name, argument] : rule.setToArgument) {
        check(name);
    }
    for (const auto& [name, text] : rule.setToText) {
        check(name);
    }
}

void Check(const Personality& personality) {
    if (personality.ports.empty() || personality.vendorId.empty()) {
        Fail("the top", "ports and vendor_id are needed");
    }
    for (const auto& name : kNeededVariables) {
        if (personality.variables.count(name) == 0) {
            Fail("variables", "'" + name + "' is needed");
        }
    }
    for (const auto& name : kNeededErrors) {
        if (personality.errors.count(name) == 0) {
            Fail("errors", "'" + name + "' is needed");
        }
    }
    for (const auto& [command, rule] : personality.rules) {
        CheckRule(personality, rule, "commands / " + command);
    }
}

std::string PathOf(const std::string& name) {
    return name.find('/') != std::string::npos ? name : (Folder() / (name + ".json")).string();
}

void LoadInto(const std::string& name, int depth, Personality* target) {
    const std::string path = PathOf(name);
    try {
        const Json::Value root = ReadJson(path);
        if (!root.isObject()) {
            Fail("the top", "an object in braces is expected");
        }
        if (depth == kMostExtended) {
            Fail("extends", "the personalities extend each other in a circle");
        }
        if (root.isMember("extends")) {
            LoadInto(Text(root["extends"], "extends"), depth + 1, target);
        }
        Apply(root, target);
        if (depth == 0) {
            Check(*target);
        }
    } catch (const BadContent& error) {
        throw std::invalid_argument("its personality " + path + " is wrong " + error.what());
    }
}

}  // namespace

const char* RoleName(PortRole role) {
    for (const auto& [name, value] : kRoles) {
        if (value == role) {
            return name.c_str();
        }
    }
    return "";
}

PortRole ParseRole(const std::string& word) {
    const auto role = kRoles.find(word);
    if (role == kRoles.end()) {
        throw std::invalid_argument("a port is dial, at or mute, not '" + word + "'");
    }
    return role->second;
}

Personality Personality::Load(const std::string& name) {
    Personality personality;
    LoadInto(name, 0, &personality);
    return personality;
}

std::vector<std::string> Personality::Known() {
    std::vector<std::string> names;
    std::error_code ignored;
    for (const auto& entry : fs::directory_iterator(Folder(), ignored)) {
        if (entry.path().extension() == ".json") {
            names.push_back(entry.path().stem());
        }
    }
    std::sort(names.begin(), names.end());
    return names;
}

const CommandRule* Personality::Find(const std::string& command) const {
    static const CommandRule kJustOk;
    const CommandRule* best = nullptr;
    size_t bestLength = 0;
    const bool asksValues = command.size() > 2 && command.compare(command.size() - 2, 2, "=?") == 0;
    for (const auto& [pattern, rule] : rules) {
        const bool exact = pattern.back() != '*';
        if (!MatchesPattern(pattern, command) || (asksValues && !exact)) {
            continue;
        }
        if (exact) {
            return &rule;
        }
        if (pattern.size() > bestLength) {
            best = &rule;
            bestLength = pattern.size();
        }
    }
    if (best == nullptr && asksValues) {
        const std::string name = command.substr(0, command.size() - 2);
        const auto next = rules.lower_bound(name);
        const bool known = next != rules.end() && next->first.compare(0, name.size(), name) == 0;
        return known ? &kJustOk : nullptr;
    }
    return best;
}

}  // namespace taviwireless::sim
