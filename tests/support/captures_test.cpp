#include <dlfcn.h>
#include <gmock/gmock.h>
#include <syslog.h>
#include <unistd.h>

#include <cerrno>

#include "tests/support/log_capture.h"
#include "tests/support/process.h"
#include "tests/support/sleep_capture.h"

namespace taviwireless::test {
namespace {

using testing::ElementsAre;
using testing::IsEmpty;

// Loaded at run time, so the linker did not know that it needs these names from the program.
class LoadedLibrary : public testing::TestWithParam<const char*> {
  protected:
    LoadedLibrary() : handle_(dlopen(BuiltProgram(GetParam()).c_str(), RTLD_NOW | RTLD_LOCAL)) {}
    ~LoadedLibrary() override {
        if (handle_ != nullptr) {
            dlclose(handle_);
        }
    }

    template <typename Function>
    Function* Find(const char* name) {
        return reinterpret_cast<Function*>(dlsym(handle_, name));
    }

    void* handle_;
};

TEST_P(LoadedLibrary, SleepsInTheCapture) {
    ASSERT_NE(handle_, nullptr) << dlerror();
    SleepCapture sleeps;
    EXPECT_EQ(Find<unsigned(unsigned)>("SleepFor")(1000), 0u);
    EXPECT_THAT(sleeps.Calls(), ElementsAre(1000));
}

TEST_P(LoadedLibrary, LogsToTheCapture) {
    ASSERT_NE(handle_, nullptr) << dlerror();
    LogCapture log;
    errno = EACCES;
    Find<void(const char*, ...)>("Log")("port %s: %m", "ttyUSB0");
    Find<void(int)>("LogNumber")(7);
    EXPECT_EQ(log.Text(), "port ttyUSB0: Permission denied\nnumber 7\n");
}

INSTANTIATE_TEST_SUITE_P(Captures, LoadedLibrary,
                         testing::Values("../lib/libnoisy.so", "../lib/libnoisy_fortified.so"));

}  // namespace
}  // namespace taviwireless::test
