// The lock between processes. The appliance root has semaphores of its own, so keys are free here.
#include <gmock/gmock.h>
#include <sys/ipc.h>
#include <sys/prctl.h>
#include <sys/sem.h>
#include <sys/wait.h>
#include <taviwireless/semaphore.h>
#include <unistd.h>

#include <cerrno>
#include <chrono>
#include <csignal>
#include <functional>
#include <thread>

#include "tests/support/log_capture.h"

namespace taviwireless::test {
namespace {

using semaphore::Semaphore;

constexpr unsigned int kKey = 7;

union SemaphoreArgument {
    int val;
    semid_ds* buf;
    seminfo* info;
};

int CountSets() {
    seminfo info{};
    SemaphoreArgument argument{};
    argument.info = &info;
    semctl(0, 0, SEM_INFO, argument);
    return info.semusz;  // with SEM_INFO: the number of sets there are
}

semid_ds Describe(int semid) {
    semid_ds description{};
    SemaphoreArgument argument{};
    argument.buf = &description;
    EXPECT_EQ(semctl(semid, 0, IPC_STAT, argument), 0);
    return description;
}

int Waiting(int semid) {
    return semctl(semid, 0, GETNCNT);
}

// A process that runs `work` and ends; killed with the object.
class Child {
  public:
    explicit Child(const std::function<int()>& work) : pid_(fork()) {
        if (pid_ == 0) {
            prctl(PR_SET_PDEATHSIG, SIGKILL);
            _exit(work());
        }
    }
    ~Child() { Kill(); }
    Child(const Child&) = delete;
    Child& operator=(const Child&) = delete;

    void Signal(int number) const { kill(pid_, number); }
    void Kill() {
        if (pid_ > 0) {
            kill(pid_, SIGKILL);
            Wait();
        }
    }
    // Its exit status, or 128 and the signal.
    int Wait() {
        int status = 0;
        waitpid(pid_, &status, 0);
        pid_ = -1;
        return WIFEXITED(status) ? WEXITSTATUS(status) : 128 + WTERMSIG(status);
    }

  private:
    pid_t pid_;
};

bool Becomes(const std::function<bool()>& condition) {
    for (int i = 0; i < 1000 && !condition(); ++i) {
        std::this_thread::sleep_for(std::chrono::milliseconds(5));
    }
    return condition();
}

TEST(Semaphore, IsOneSetOfOneSemaphoreWithValueOneForEverybody) {
    umask(077);  // permissions do not depend on who comes first
    int first = -1;
    int second = -1;
    EXPECT_EQ(Semaphore(kKey).Get(&first), 0);
    EXPECT_EQ(Semaphore(kKey).Get(&second), 0);
    EXPECT_EQ(first, second);
    EXPECT_EQ(first, semget(kKey, 1, 0));
    EXPECT_EQ(CountSets(), 1);
    EXPECT_EQ(Describe(first).sem_nsems, 1u);
    EXPECT_EQ(Describe(first).sem_perm.mode & 0777, 0666);
    EXPECT_EQ(semctl(first, 0, GETVAL), 1);
}

TEST(Semaphore, IsGivenBackByAHolderThatIsKilled) {
    Child holder([] {
        Semaphore(kKey).Enter();
        pause();
        return 0;
    });
    ASSERT_TRUE(Becomes([] {
        const int semid = semget(kKey, 1, 0);
        return semid >= 0 && semctl(semid, 0, GETVAL) == 0;
    }));
    Child waiting([] { return Semaphore(kKey).Enter(); });
    EXPECT_TRUE(Becomes([] { return Waiting(semget(kKey, 1, 0)) == 1; }));
    holder.Kill();
    EXPECT_EQ(waiting.Wait(), 0);
}

TEST(Semaphore, GoesOnWaitingAfterASignal) {
    Semaphore lock(kKey);
    ASSERT_EQ(lock.Enter(), 0);
    const int semid = semget(kKey, 1, 0);
    Child other([] {
        struct sigaction interrupt {};
        interrupt.sa_handler = [](int) {};
        sigaction(SIGUSR1, &interrupt, nullptr);
        return Semaphore(kKey).Enter();
    });
    ASSERT_TRUE(Becomes([semid] { return Waiting(semid) == 1; }));
    for (int i = 0; i < 5; ++i) {
        other.Signal(SIGUSR1);
        std::this_thread::sleep_for(std::chrono::milliseconds(5));
    }
    EXPECT_TRUE(Becomes([semid] { return Waiting(semid) == 1; }));
    EXPECT_EQ(lock.Release(), 0);
    EXPECT_EQ(other.Wait(), 0);
}

TEST(Semaphore, WithKeyZeroLeavesASetPerCallAndLocksNothing) {
    Semaphore lock(0);
    EXPECT_EQ(lock.Enter(), 0);
    EXPECT_EQ(lock.Enter(), 0);  // would wait for ever with any other key
    EXPECT_EQ(lock.Release(), 0);
    EXPECT_EQ(CountSets(), 3);
}

TEST(Semaphore, FailsWhenItIsRemovedUnderAWaiter) {
    Semaphore lock(kKey);
    ASSERT_EQ(lock.Enter(), 0);
    const int semid = semget(kKey, 1, 0);
    Child other([semid] {
        LogCapture log;
        const int result = Semaphore(kKey).Enter();
        return result == -1 && log.Has("semop fail semid " + std::to_string(semid) + " errno " +
                                       std::to_string(EIDRM))
                   ? 0
                   : 1;
    });
    ASSERT_TRUE(Becomes([semid] { return Waiting(semid) == 1; }));
    ASSERT_EQ(semctl(semid, 0, IPC_RMID), 0);
    EXPECT_EQ(other.Wait(), 0);
}

}  // namespace
}  // namespace taviwireless::test
