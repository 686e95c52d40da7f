// The lock between processes. The appliance root has semaphores of its own, so keys are free here.
#include <gmock/gmock.h>
#include <sys/sem.h>
#include <sys/stat.h>
#include <taviwireless/semaphore.h>

#include <cerrno>
#include <chrono>

#include "tests/support/log_capture.h"

namespace taviwireless::test {
namespace {

using semaphore::Semaphore;

constexpr unsigned int kKey = 7;

TEST(Semaphore, IsOneSetOfOneSemaphoreWithValueOneForEverybody) {
    umask(077);  // permissions do not depend on who comes first
    int first = -1;
    int second = -1;
    EXPECT_EQ(Semaphore(kKey).Get(&first), 0);
    EXPECT_EQ(Semaphore(kKey).Get(&second), 0);
    EXPECT_EQ(first, second);
    EXPECT_EQ(first, semget(kKey, 1, 0));
    semid_ds description{};
    ASSERT_EQ(semctl(first, 0, IPC_STAT, &description), 0);
    EXPECT_EQ(description.sem_nsems, 1u);
    EXPECT_EQ(description.sem_perm.mode & 0777, 0666);
    EXPECT_EQ(semctl(first, 0, GETVAL), 1);
}

TEST(Semaphore, IsFreeWhenItsMakerWasKilledBeforeItHadAValue) {
    ASSERT_GE(semget(8, 1, IPC_CREAT | 0666), 0);
    EXPECT_EQ(Semaphore(8).Enter(), 0);
}

TEST(Semaphore, IsNotWaitedForForEver) {
    ASSERT_EQ(Semaphore(kKey).Enter(), 0);
    LogCapture log;
    const auto begin = std::chrono::steady_clock::now();
    EXPECT_EQ(Semaphore(kKey).Enter(), -1);
    const auto waited = std::chrono::steady_clock::now() - begin;
    EXPECT_TRUE(log.Has(" errno " + std::to_string(EAGAIN))) << log.Text();
    EXPECT_GE(waited, std::chrono::seconds(4));  // an exchange that takes its time
    EXPECT_LT(waited, std::chrono::seconds(15));
}

}  // namespace
}  // namespace taviwireless::test
