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

TEST(LogCapture, RecordsPriorityAndTextWhileItLives) {
    syslog(LOG_ERR, "before");
    LogCapture log;
    syslog(LOG_ERR, "%s has %d ports", "modem", 3);
    syslog(LOG_INFO, "modem gone");
    ASSERT_EQ(log.Lines().size(), 2u);
    EXPECT_EQ(log.Lines()[0].priority, LOG_ERR);
    EXPECT_EQ(log.Lines()[1].priority, LOG_INFO);
    EXPECT_EQ(log.Text(), "modem has 3 ports\nmodem gone\n");
    EXPECT_EQ(log.Count("modem"), 2);
    EXPECT_TRUE(log.Has("gone"));
    EXPECT_FALSE(log.Has("before"));
    log.Clear();
    EXPECT_EQ(log.Text(), "");
}

TEST(LogCapture, OverlappingCapturesEachGetEveryLine) {
    LogCapture outer;
    {
        LogCapture inner;
        syslog(LOG_ERR, "both");
        EXPECT_EQ(inner.Text(), "both\n");
    }
    syslog(LOG_ERR, "one");
    EXPECT_EQ(outer.Text(), "both\none\n");
}

TEST(LogCapture, LoggingKeepsErrno) {
    LogCapture log;
    errno = ENOENT;
    syslog(LOG_ERR, "modem gone");
    EXPECT_EQ(errno, ENOENT);
}

TEST(SleepCapture, RecordsEveryCallAndReturnsAtOnce) {
    EXPECT_EQ(sleep(1000), 0u);
    SleepCapture sleeps;
    EXPECT_THAT(sleeps.Calls(), IsEmpty());
    EXPECT_EQ(sleep(1000), 0u);
    EXPECT_EQ(sleep(2), 0u);
    EXPECT_THAT(sleeps.Calls(), ElementsAre(1000, 2));
    EXPECT_EQ(sleeps.Total(), 1002u);
}

TEST(SleepCapture, TheHookSeesEachSleep) {
    std::vector<unsigned> seen;
    SleepCapture* current = nullptr;
    SleepCapture sleeps([&](unsigned seconds) {
        seen.push_back(seconds);
        EXPECT_EQ(current->Calls().size(), seen.size());
    });
    current = &sleeps;
    sleep(3);
    sleep(4);
    EXPECT_THAT(seen, ElementsAre(3, 4));
}

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
