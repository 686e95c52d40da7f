// SPDX-License-Identifier: MIT
#ifndef TAVIWIRELESS_TESTS_CLI_CLI_RUNS_H
#define TAVIWIRELESS_TESTS_CLI_CLI_RUNS_H

#include <gmock/gmock.h>
#include <json/json.h>

#include "tests/support/files.h"
#include "tests/support/process.h"

namespace taviwireless::test {

constexpr int kFailure = 1;
constexpr int kUsage = 2;
constexpr int kNotFound = 3;
constexpr int kBusy = 4;
constexpr int kNoService = 5;

// taviwireless modem ...
inline RunResult Modem(std::vector<std::string> arguments, const std::string& input = "") {
    arguments.insert(arguments.begin(), {BuiltProgram("taviwireless"), "modem"});
    return RunProgram(WithShortWaits(arguments), input);
}

inline RunResult DirectModem(std::vector<std::string> arguments, const std::string& input = "") {
    arguments.insert(arguments.begin(), "--direct");
    return Modem(arguments, input);
}

inline Json::Value Parse(const std::string& text) {
    Json::Value document;
    std::istringstream stream(text);
    std::string errors;
    EXPECT_TRUE(Json::parseFromStream(Json::CharReaderBuilder(), stream, &document, &errors))
        << errors << text;
    return document;
}

}  // namespace taviwireless::test

#endif
