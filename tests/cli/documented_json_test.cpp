// SPDX-License-Identifier: MIT
// What every command prints with --json is what docs/command-line.md says, key by key.
#include <map>
#include <set>

#include "base/split.h"
#include "tests/cli/cli_runs.h"
#include "tests/support/public_calls.h"
#include "tests/support/surroundings.h"

namespace taviwireless::test {
namespace {

// "string or null" and so on, by key; the keys of an object within are such as "profile.apn".
using Keys = std::map<std::string, std::string>;

constexpr char kFailures[] = "failures";

// The tables of the document by the commands of their headings: "### `modem list`, `modem show`",
// with rows such as "| `signal` | number or null | percent |".
std::map<std::string, Keys> DocumentedKeys() {
    std::map<std::string, Keys> tables;
    std::vector<std::string> commands;
    for (const std::string& line : Lines(ReadFile(TAVI_SOURCE_DIR "/docs/command-line.md"))) {
        const std::vector<std::string> parts = Split(line, '`');
        if (line.rfind("#", 0) == 0) {
            commands.clear();
            for (size_t i = 1; i < parts.size() && line.rfind("### ", 0) == 0; i += 2) {
                commands.push_back(parts[i]);
                tables[parts[i]];
            }
        } else if (!commands.empty() && line.rfind("| `", 0) == 0) {
            const std::string type = Split(parts.at(2), '|').at(1);
            for (const std::string& command : commands) {
                tables[command][parts[1]] = type.substr(1, type.size() - 2);
            }
        }
    }
    return tables;
}

std::string TypeOf(const Json::Value& value) {
    return value.isNull()     ? "null"
           : value.isString() ? "string"
           : value.isBool()   ? "boolean"
           : value.isArray()  ? "array"
           : value.isObject() ? "object"
                              : "number";
}

// The keys that are directly in the object of this prefix, such as "" or "profile.".
std::set<std::string> KeysIn(const Keys& keys, const std::string& prefix) {
    std::set<std::string> names;
    for (const auto& [key, type] : keys) {
        if (key.rfind(prefix, 0) == 0 && key.find('.', prefix.size()) == std::string::npos) {
            names.insert(key.substr(prefix.size()));
        }
    }
    return names;
}

void Compare(const Json::Value& value, const Keys& keys, const std::string& prefix = "") {
    if (value.isArray()) {
        for (const Json::Value& one : value) {
            Compare(one, keys, prefix);
        }
    }
    const std::set<std::string> wanted = KeysIn(keys, prefix);
    if (!value.isObject() || wanted.empty()) {  // nothing is said of the parts
        return;
    }
    const auto members = value.getMemberNames();
    EXPECT_EQ(std::set<std::string>(members.begin(), members.end()), wanted) << prefix;
    for (const std::string& name : members) {
        const auto type = keys.find(prefix + name);
        if (type != keys.end()) {
            EXPECT_THAT(type->second, testing::HasSubstr(TypeOf(value[name]))) << prefix + name;
            Compare(value[name], keys, prefix + name + ".");
        }
    }
}

struct DocumentedJson : testing::TestWithParam<Needs> {};

TEST_P(DocumentedJson, IsPrinted) {
    const std::map<std::string, Keys> tables = DocumentedKeys();
    std::optional<Surroundings> surroundings;  // take seconds to make
    for (const CommandCall& command : CommandCalls()) {
        // What they print at each change is what list and status print.
        const bool isForEver = command.name == "modem watch" || command.name == "wifi watch";
        if (command.needs != GetParam() || isForEver) {
            continue;
        }
        SCOPED_TRACE(command.name);
        const auto table = tables.find(command.name);
        ASSERT_NE(table, tables.end());
        if (!surroundings) {
            surroundings.emplace(GetParam());
        }
        surroundings->Arrange(command.sim);
        std::vector<std::string> argv = command.Argv();
        argv.emplace_back("--json");
        const RunResult result = RunProgram(argv, command.input);
        SCOPED_TRACE(result.out + result.err);
        // The doctor's status tells what it has found.
        const bool isAnswer = result.status == 0 || command.name == "doctor";
        Compare(Parse(result.out), isAnswer ? table->second : tables.at(kFailures));
        EXPECT_TRUE(isAnswer);
    }
}

INSTANTIATE_TEST_SUITE_P(Needs, DocumentedJson,
                         testing::Values(Needs::kPlugged, Needs::kDialled, Needs::kService,
                                         Needs::kServedConnection, Needs::kAdapter, Needs::kJoined,
                                         Needs::kAccessPoint),
                         [](const auto& info) {
                             return std::to_string(static_cast<int>(info.param));
                         });

}  // namespace
}  // namespace taviwireless::test
