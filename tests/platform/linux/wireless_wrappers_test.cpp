// SPDX-License-Identifier: MIT
// The public names of Wi-Fi functions, with a library in libtaviwireless' place.
#include <dlfcn.h>
#include <gmock/gmock.h>
#include <tavicore/error.h>
#include <tavisdk/wireless.h>

namespace taviwireless::test {
namespace {

struct Unload {
    void operator()(void* library) const { dlclose(library); }
};
using Library = std::unique_ptr<void, Unload>;

void ExpectReached() {
    EXPECT_STREQ(TAVIWirelessInterfaceGet(), "wlan7");
    EXPECT_EQ(TAVIWirelessIsSupported(), 7);
    EXPECT_EQ(TAVIWirelessNetworkDisconnect(), 77);
}

void ExpectNotReached() {
    EXPECT_EQ(TAVIWirelessInterfaceGet(), nullptr);
    EXPECT_EQ(VEXACErrGet(), VEXAC_ERR_NOT_FOUND);
    EXPECT_EQ(TAVIWirelessIsSupported(), 0);
    EXPECT_EQ(TAVIWirelessNetworkDisconnect(), -1);
}

TEST(WirelessWrappers, ReachTheLibraryHoweverItWasLoaded) {
    ExpectNotReached();
    Library library(dlopen(TAVI_LIBRARY_STAND_IN, RTLD_NOW | RTLD_LOCAL));
    ASSERT_NE(library, nullptr) << dlerror();
    ExpectReached();
    library.reset();
    ExpectNotReached();  // it was let go
    library.reset(dlopen(TAVI_LIBRARY_STAND_IN, RTLD_NOW | RTLD_GLOBAL));
    ExpectReached();
}

}  // namespace
}  // namespace taviwireless::test
