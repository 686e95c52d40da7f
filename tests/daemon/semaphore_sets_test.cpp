// The semaphore sets that the lock of usbmodem0 leaves behind.
#include "daemon/semaphore_sets.h"

#include <gmock/gmock.h>
#include <sys/sem.h>
#include <sys/wait.h>
#include <taviwireless/semaphore.h>
#include <unistd.h>

#include "tests/support/files.h"

namespace taviwireless::test {
namespace {

constexpr int kSetsPerCommand = 2;

int CountSets() {
    seminfo info{};
    semctl(0, 0, SEM_INFO, &info);
    return info.semusz;  // with SEM_INFO: the number of sets there are
}

// What a command on usbmodem0 does with its lock.
bool Command() {
    semaphore::Semaphore lock(0);
    return lock.Enter() == 0 && lock.Release() == 0;
}

TEST(SemaphoreSets, FortyThousandCommandsStayFarBelowALoweredLimit) {
    constexpr int kLimit = 40;
    constexpr int kCommandsPerCall = 10;  // more than the longest method of the service sends
    WriteFile("/proc/sys/kernel/sem", "32000 1024000 500 " + std::to_string(kLimit));
    for (int i = 1; i <= 40000; ++i) {
        ASSERT_TRUE(Command()) << "command " << i;
        if (i % kCommandsPerCall == 0) {
            EXPECT_EQ(CountSets(), kCommandsPerCall * kSetsPerCommand);
            daemon::RemovePrivateSemaphoreSets(getpid());
        }
    }
    EXPECT_EQ(CountSets(), 0);
}

TEST(SemaphoreSets, OfOtherProcessesAndWithAKeyStay) {
    const pid_t other = fork();
    if (other == 0) {
        _exit(Command() ? 0 : 1);
    }
    int status = -1;
    waitpid(other, &status, 0);
    ASSERT_EQ(status, 0);
    semaphore::Semaphore keyed(7);
    ASSERT_EQ(keyed.Enter(), 0);
    ASSERT_TRUE(Command());
    daemon::RemovePrivateSemaphoreSets(getpid());
    EXPECT_EQ(CountSets(), 1 + kSetsPerCommand);
    EXPECT_EQ(keyed.Release(), 0);
    daemon::RemovePrivateSemaphoreSets(other);
    EXPECT_EQ(CountSets(), 1);
}

}  // namespace
}  // namespace taviwireless::test
