// SPDX-License-Identifier: MIT
// What processes that were killed leave behind, and the end of a process that looks for a modem.
#include <gmock/gmock.h>
#include <sys/sem.h>
#include <sys/wait.h>
#include <taviwireless/semaphore.h>
#include <unistd.h>

#include <filesystem>

#include "daemon/lock_files.h"
#include "daemon/probe.h"
#include "daemon/semaphore_sets.h"
#include "tests/support/files.h"

namespace {

unsigned int timeLimit = 0;  // seconds

}  // namespace

// In place of the C library's.
unsigned int alarm(unsigned int seconds) noexcept {
    timeLimit = seconds;
    return 0;
}

namespace taviwireless::test {
namespace {

TEST(LockFiles, OfSerialPortsAndThatProcessAloneAreRemoved) {
    const struct {
        const char* name;
        const char* text;
        bool stays;
    } kFiles[] = {
        {"LCK..ttyUSB0", "      4711\n", false}, {"LCK..ttyUSB12", "4711", false},
        {"LCK..ttyUSB1", "      4712\n", true},  {"LCK..ttyUSB2", "", true},
        {"LCK..ttyS0", "      4711\n", true},
    };
    const std::string folder = "/var/lock/";
    for (const auto& file : kFiles) {
        WriteFile(folder + file.name, file.text);
    }
    WriteFile("/tmp/other", "4711\n");
    std::filesystem::create_symlink("/tmp/other", folder + "LCK..ttyUSB3");
    daemon::RemovePortLocks(4711);
    for (const auto& file : kFiles) {
        EXPECT_EQ(Exists(folder + file.name), file.stays) << file.name;
    }
    EXPECT_TRUE(Exists(folder + "LCK..ttyUSB3"));  // a link is nobody's lock
}

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

TEST(Probe, HasTimeForAllPortsOfAModemAndNoMore) {
    WriteFile("/tmp/usbmodem.info0", "CONNECTNODE=0\nDEVICENODE=0,1,2,3,4,5,6,7,8,9,10,11,12,13\n");
    EXPECT_NE(daemon::Probe::Run(0), 0);       // there is no port
    EXPECT_GE(timeLimit, 10u + 15 * 25 / 10);  // what one that talks without end takes is 2.5 s
    EXPECT_LE(timeLimit, 90u);
}

}  // namespace
}  // namespace taviwireless::test
