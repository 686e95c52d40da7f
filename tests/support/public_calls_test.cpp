// SPDX-License-Identifier: MIT
// Nothing is missing in the table of public calls.
#include "tests/support/public_calls.h"

#include <gmock/gmock.h>

#include <set>

#include "base/split.h"

namespace taviwireless::test {
namespace {

using Names = std::multiset<std::string>;

// What no caller calls: data, destructors, and private members of classes, which stand at the end.
const char kNotCalled[] =
    "^(vtable|typeinfo|gWireless)|~|::nullObject$|::vendorTable|Semaphore::Change\\(|USBModem::("
    "AskForSIM|AttemptRemain|CommandSet|CompleteInit|ComputeProfilePath|EnterP[IU][NK]|Exchange|"
    "FailInit|FillDefaults|FindPortsAndPrepare|FindQueryNode|KnowsItsSIM|Open|PidFilePath|Prepare|"
    "PrepareToDial|QuerySIMStatus|ReadConnectNode|ReadDialSettings|Refresh|TryQueryNode)[[(]";

// The names of the commands that the help of this command lists, and of those in them.
void AddCommands(const std::string& command, std::set<std::string>& names) {
    std::vector<std::string> argv = Split(command, ' ');
    argv.insert(argv.begin(), BuiltProgram("taviwireless"));
    argv.emplace_back("--help");
    const std::string help = RunProgram(argv).out;
    const size_t list = help.find("\nCommands:\n");
    if (list == std::string::npos) {
        names.insert(command);
        return;
    }
    std::istringstream lines(help.substr(help.find('\n', list + 1) + 1));
    for (std::string line; std::getline(lines, line) && line.rfind("  ", 0) == 0;) {
        const std::string name = line.substr(2, line.find(' ', 2) - 2);
        AddCommands(command.empty() ? name : command + ' ' + name, names);
    }
}

TEST(PublicCalls, HaveARowForEveryFunctionThatIsExported) {
    const std::string list = Shell(
        "grep -Ev '" + std::string(kNotCalled) +
        "' '" TAVI_EXPORTS "' | sed -E 's/^taviwireless:://; s/\\[abi:[a-z0-9]*\\]//; s/\\(.*//'");
    const std::vector<std::string> exported = Lines(list);
    Names rows;
    for (const PublicCall& call : PublicCalls()) {
        rows.insert(call.name);
    }
    EXPECT_EQ(rows, Names(exported.begin(), exported.end()));
}

TEST(PublicCalls, HaveARowForEveryCommand) {
    std::set<std::string> commands, rows;
    AddCommands("", commands);
    for (const CommandCall& command : CommandCalls()) {
        rows.insert(command.name);
    }
    EXPECT_EQ(rows, commands);
}

}  // namespace
}  // namespace taviwireless::test
