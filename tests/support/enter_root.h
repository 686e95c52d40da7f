// SPDX-License-Identifier: MIT
#ifndef TAVIWIRELESS_TESTS_SUPPORT_ENTER_ROOT_H
#define TAVIWIRELESS_TESTS_SUPPORT_ENTER_ROOT_H

#include <unistd.h>

#include <cstdlib>
#include <cstring>
#include <stdexcept>
#include <string>
#include <vector>

#include "platform/appliance_root/appliance_root.h"

namespace taviwireless::test {

// Has this program run in an appliance root. What has to come out of it goes to the folder that
// TAVI_TEST_OUTPUT names. An emulator does not know all calls that such a root is made with: where
// there is one, TAVI_TEST_ROOT names a program that makes it and runs this one in it.
inline void EnterRoot(char** argv) {
    const char* program = getenv("TAVI_TEST_ROOT");
    const char* output = getenv("TAVI_TEST_OUTPUT");
    if (program == nullptr) {
        EnterApplianceRoot(output != nullptr ? output : "");
    } else if (*program != '\0') {
        std::vector<char*> command{strdup(program), strdup("--")};
        do {
            command.push_back(*argv);
        } while (*argv++ != nullptr);
        setenv("TAVI_TEST_ROOT", "", 1);  // entered
        execv(command[0], command.data());
        throw std::runtime_error(std::string("cannot run ") + command[0]);
    }
}

}  // namespace taviwireless::test

#endif
