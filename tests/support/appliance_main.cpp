// SPDX-License-Identifier: MIT
// main() of the test programs that touch system paths: every case runs in an appliance root. What
// has to come out of it, such as a report, goes to the folder that TAVI_TEST_OUTPUT names. With
// TAVI_TEST_OLD_KERNEL in the environment the cases run on a kernel as old as Linux 3.10.
#include <gmock/gmock.h>

#include <cstdio>
#include <cstdlib>
#include <cstring>
#include <exception>

#include "platform/appliance_root/appliance_root.h"
#include "tests/support/enter_root.h"
#include "tests/support/old_kernel.h"

namespace {

// CTest lists the cases when the program is built, perhaps where no root can be entered.
bool OnlyLists(int argc, char** argv) {
    for (int i = 1; i < argc; ++i) {
        if (strcmp(argv[i], "--gtest_list_tests") == 0) {
            return true;
        }
    }
    return false;
}

}  // namespace

int main(int argc, char** argv) {
    if (!OnlyLists(argc, argv)) {
        try {
            taviwireless::test::EnterRoot(argv);
            if (getenv("TAVI_TEST_OLD_KERNEL") != nullptr) {
                taviwireless::test::RefuseNewerCalls();
            }
        } catch (const std::exception& error) {
            fprintf(stderr, "%s\n", error.what());
            return taviwireless::kApplianceRootFailed;
        }
    }
    testing::InitGoogleMock(&argc, argv);
    return RUN_ALL_TESTS();
}
