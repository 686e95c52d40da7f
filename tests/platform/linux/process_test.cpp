// SPDX-License-Identifier: MIT
#include <fcntl.h>
#include <gmock/gmock.h>
#include <signal.h>
#include <sys/wait.h>
#include <tavicore/error.h>
#include <tavicore/process.h>
#include <unistd.h>

#include "base/spawn_settings.h"
#include "tests/support/descriptors.h"
#include "tests/support/files.h"
#include "tests/support/wait.h"

namespace taviwireless::test {
namespace {

constexpr char kPidFile[] = "/tmp/pid";

// Waits until the process named in the pid file has the wanted state.
bool WaitUntilAlive(int alive) {
    return Eventually([alive] { return VEXACProcAliveByPidFile(kPidFile) == alive; });
}

TEST(Process, AChildThatNobodyWaitsForIsKnownByItsPidFile) {
    const auto before = OpenDescriptors();
    const pid_t child = VEXACProcForkChildNoWait();
    if (child == 0) {
        VEXACProcPidFileCreate(kPidFile);
        for (;;) {
            pause();
        }
    }
    ASSERT_GT(child, 0);
    EXPECT_TRUE(WaitUntilAlive(1));
    EXPECT_EQ(VEXACReadPidFile(kPidFile), child);
    EXPECT_EQ(VEXACProcSignalByPidFile(kPidFile, SIGTERM), 0);
    EXPECT_TRUE(WaitUntilAlive(0));
    EXPECT_EQ(waitpid(-1, nullptr, WNOHANG), -1);  // no zombie of ours
    EXPECT_EQ(errno, ECHILD);
    EXPECT_EQ(VEXACProcSignalByPidFile(kPidFile, SIGTERM), -1);
    EXPECT_EQ(VEXACErrGet(), VEXAC_ERR_NOT_FOUND);
    EXPECT_EQ(OpenDescriptors(), before);
}

TEST(Process, AStalePidFileDoesNotHarmWhoHasTheNumberNow) {
    const std::string self = std::to_string(getpid());
    WriteFile(kPidFile, self + "\n1\n");  // started at tick 1, which this process did not
    EXPECT_EQ(VEXACProcAliveByPidFile(kPidFile), 0);
    EXPECT_EQ(VEXACProcSignalByPidFile(kPidFile, SIGKILL), -1);
    EXPECT_EQ(VEXACReadPidFile(kPidFile), 0);  // so that nobody signals that number either
    for (const char* text : {"", "abc", "-5", "99999999999999999999", "4294967297"}) {
        WriteFile(kPidFile, text);
        EXPECT_EQ(VEXACReadPidFile(kPidFile), 0) << text;
        EXPECT_EQ(VEXACProcSignalByPidFile(kPidFile, SIGKILL), -1) << text;
    }
    for (const char* rest : {"\n", "\nsome remark\n"}) {  // writers that record no start time
        WriteFile(kPidFile, self + rest);
        EXPECT_EQ(VEXACProcAliveByPidFile(kPidFile), 1);
        EXPECT_EQ(VEXACReadPidFile(kPidFile), getpid());
    }
}

void ReapAll(int) {
    while (waitpid(-1, nullptr, WNOHANG) > 0) {
    }
}

// The exit status arrives whatever the caller does about its children.
TEST(Exec, GivesTheExitStatusToWhoDoesNotWait) {
    struct sigaction ignore {};
    ignore.sa_handler = SIG_IGN;
    struct sigaction noZombies {};
    noZombies.sa_flags = SA_NOCLDWAIT;
    struct sigaction reap {};
    reap.sa_handler = ReapAll;
    for (const auto& action : {ignore, noZombies, reap}) {
        ASSERT_EQ(sigaction(SIGCHLD, &action, nullptr), 0);
        EXPECT_EQ(VEXACExec("true", nullptr), 0);
        EXPECT_EQ(VEXACExec("sh", "-c", "true; exit $#", "sh", "a b", "c", "d", nullptr), 3);
        EXPECT_EQ(VEXACExec("/bin/sh", "-c", "kill -9 $$", nullptr), -1);
        EXPECT_EQ(VEXACExec("/no/such/program", nullptr), -1);
        EXPECT_EQ(VEXACErrGet(), VEXAC_ERR_NOT_FOUND);
        const pid_t child = VEXACProcForkChildNoWait();
        if (child == 0) {
            _exit(0);
        }
        EXPECT_GT(child, 0);
    }
    signal(SIGCHLD, SIG_DFL);
    EXPECT_EQ(waitpid(-1, nullptr, WNOHANG), -1);  // nothing is left behind
}

TEST(Exec, TheProgramInheritsNoDescriptorAndNoIgnoredSignal) {
    const int leak = open("/dev/null", O_RDONLY);  // deliberately not closed on exec
    signal(SIGTERM, SIG_IGN);
    EXPECT_EQ(VEXACExec("sh", "-c", "ls /proc/self/fd > /tmp/fds; kill -TERM $$; exit 0", nullptr),
              -1);
    signal(SIGTERM, SIG_DFL);
    EXPECT_EQ(ReadFile("/tmp/fds"), "0\n1\n2\n3\n");  // 3 is the one that ls reads

    posix_spawn_file_actions_t actions;  // the same where the C library cannot close them all
    posix_spawn_file_actions_init(&actions);
    ASSERT_EQ(SpawnSettings::AddCloseFrom(&actions, STDERR_FILENO + 1, 0L), 0);
    const char* command[] = {"sh", "-c", "ls /proc/self/fd > /tmp/fds-of-old", nullptr};
    pid_t child = -1;
    ASSERT_EQ(posix_spawnp(&child, "sh", &actions, nullptr, const_cast<char**>(command), environ),
              0);
    posix_spawn_file_actions_destroy(&actions);
    EXPECT_EQ(waitpid(child, nullptr, 0), child);
    EXPECT_EQ(ReadFile("/tmp/fds-of-old"), ReadFile("/tmp/fds"));
    close(leak);
}

}  // namespace
}  // namespace taviwireless::test
