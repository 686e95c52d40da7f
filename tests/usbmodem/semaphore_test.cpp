// The lock between processes. The appliance root has semaphores of its own, so keys are free here.
#include <gmock/gmock.h>
#include <sys/prctl.h>
#include <sys/sem.h>
#include <sys/stat.h>
#include <sys/wait.h>
#include <taviwireless/semaphore.h>
#include <unistd.h>

#include <cerrno>
#include <chrono>
#include <csignal>
#include <functional>

#include "tests/support/log_capture.h"
#include "tests/support/wait.h"

namespace taviwireless::test {
namespace {

using semaphore::Semaphore;

constexpr unsigned int kKey = 7;

// Starts a process that runs `work` and ends with its result, or with the test.
pid_t Start(const std::function<int()>& work) {
    const pid_t pid = fork();
    if (pid == 0) {
        prctl(PR_SET_PDEATHSIG, SIGKILL);
        _exit(work());
    }
    return pid;
}

int ExitStatus(pid_t pid) {
    int status = -1;
    waitpid(pid, &status, 0);
    return WIFEXITED(status) ? WEXITSTATUS(status) : -1;
}

// Whether a number of the semaphore (GETVAL, GETNCNT) ever becomes `value`.
bool Becomes(int number, int value) {
    return Eventually([=] { return semctl(semget(kKey, 1, 0), 0, number) == value; });
}

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

TEST(Semaphore, IsWaitedForThroughSignalsUntilItsHolderIsKilled) {
    const pid_t holder = Start([] {
        Semaphore(kKey).Enter();
        return pause();
    });
    ASSERT_TRUE(Becomes(GETVAL, 0));
    const pid_t waiting = Start([] {
        struct sigaction interrupt {};
        interrupt.sa_handler = [](int) {};
        sigaction(SIGUSR1, &interrupt, nullptr);
        return Semaphore(kKey).Enter();
    });
    ASSERT_TRUE(Becomes(GETNCNT, 1));
    for (int i = 0; i < 5; ++i) {
        kill(waiting, SIGUSR1);
        usleep(5000);
    }
    EXPECT_TRUE(Becomes(GETNCNT, 1));
    kill(holder, SIGKILL);
    EXPECT_EQ(ExitStatus(waiting), 0);
}

TEST(Semaphore, IsNotWaitedForForEver) {
    int semid = -1;
    ASSERT_EQ(Semaphore(kKey).Get(&semid), 0);
    const pid_t stranger = Start([semid] {
        sembuf take{0, -1, 0};
        semop(semid, &take, 1);
        return pause();
    });
    ASSERT_TRUE(Becomes(GETVAL, 0));
    LogCapture log;
    const auto begin = std::chrono::steady_clock::now();
    EXPECT_EQ(Semaphore(kKey).Enter(), -1);
    const auto waited = std::chrono::steady_clock::now() - begin;
    EXPECT_TRUE(log.Has(" errno " + std::to_string(EAGAIN))) << log.Text();
    EXPECT_GE(waited, std::chrono::seconds(4));  // an exchange that takes its time
    EXPECT_LT(waited, std::chrono::seconds(15));
    kill(stranger, SIGKILL);
}

}  // namespace
}  // namespace taviwireless::test
