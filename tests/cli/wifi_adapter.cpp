// The Wi-Fi adapter of taviwireless_with_wifi, a program beside the test: its driver is associated
// while there is a file "/tmp/associated". Waits cost nothing.
#include "tests/support/files.h"
#include "tests/wireless/scripted_driver.h"

namespace taviwireless::test {
namespace {

struct Adapter {
    Adapter() {
        driver.essid = "Ad-hoc";
        driver.atEachRequest = [this] {
            driver.accessPoint.fill(Exists("/tmp/associated") ? 0x11 : 0);
        };
    }
    ScriptedDriver driver;
};

Adapter adapter;

}  // namespace
}  // namespace taviwireless::test
