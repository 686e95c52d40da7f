// The Wi-Fi adapter of taviwireless_with_wifi, a program beside the test: its driver is associated
// while there is a file "/tmp/associated", and the model supports Wi-Fi unless there is a file
// "/tmp/unsupported". Waits cost nothing.
#include <dlfcn.h>
#include <tavicore/keyvalue.h>

#include <cstring>

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

// "/etc.defaults" cannot be private: it would be a new directory in the machine's own "/".
extern "C" __attribute__((visibility("default"))) int VEXACFileCheckKeyValue(const char* file,
                                                                             const char* key,
                                                                             const char* value,
                                                                             int flags) {
    if (strcmp(file, "/etc.defaults/taviinfo.conf") == 0) {
        return taviwireless::test::Exists("/tmp/unsupported") ? 0 : 1;
    }
    static const auto next = reinterpret_cast<decltype(&VEXACFileCheckKeyValue)>(
        dlsym(RTLD_NEXT, "VEXACFileCheckKeyValue"));
    return next(file, key, value, flags);
}
