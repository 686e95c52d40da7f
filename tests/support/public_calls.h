// SPDX-License-Identifier: MIT
#ifndef TAVIWIRELESS_TESTS_SUPPORT_PUBLIC_CALLS_H
#define TAVIWIRELESS_TESTS_SUPPORT_PUBLIC_CALLS_H

#include <functional>
#include <string>
#include <vector>

#include "tests/support/surroundings.h"

// Every public function and every command of the command line, each with a harmless call, for
// suites that try all of them.
namespace taviwireless::test {

struct PublicCall {
    std::string name;  // as in the list of exports, without "taviwireless::" and the parameters
    Needs needs;
    std::function<std::string(Surroundings&)> run;  // all that the call gives, as text
    std::string sim = kReadySim;                    // for Surroundings::Arrange
};

const std::vector<PublicCall>& PublicCalls();

struct CommandCall {
    std::string name;  // such as "modem pin set"
    Needs needs;       // kService, kServedConnection: of the modem service; else without it
    bool writes;       // files, the network or a SIM
    std::vector<std::string> arguments = {};
    std::string input = {};
    std::string sim = kReadySim;

    bool IsOfModems() const { return name.rfind("modem", 0) == 0; }
    // How it is started, with its waits cut. Those that watch get SIGINT after half a
    // second.
    std::vector<std::string> Argv() const;
};

const std::vector<CommandCall>& CommandCalls();

}  // namespace taviwireless::test

#endif
