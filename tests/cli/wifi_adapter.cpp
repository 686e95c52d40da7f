// SPDX-License-Identifier: MIT
// The Wi-Fi adapter of taviwireless_with_wifi, a program beside the test: its driver is associated
// while there is a file "/tmp/associated", and an access point while there is a file "/tmp/master".
// Waits cost nothing.
#include "tests/support/files.h"
#include "tests/wireless/scripted_driver.h"

namespace taviwireless::test {
namespace {

struct Adapter {
    Adapter() {
        driver.essid = "Ad-hoc";
        driver.atEachRequest = [this] {
            driver.accessPoint.fill(Exists("/tmp/associated") ? 0x11 : 0);
            if (Exists("/tmp/master")) {
                driver.mode = IW_MODE_MASTER;
            }
        };
    }
    ScriptedDriver driver;
};

Adapter adapter;

}  // namespace
}  // namespace taviwireless::test
