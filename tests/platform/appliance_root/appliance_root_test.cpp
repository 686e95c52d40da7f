// SPDX-License-Identifier: MIT
// The appliance root as seen from outside: through the program appliance-root.
#include "platform/appliance_root/appliance_root.h"

#include <gmock/gmock.h>
#include <unistd.h>

#include <csignal>
#include <cstdlib>

#include "tests/support/process.h"

namespace taviwireless::test {
namespace {

using testing::StartsWith;

RunResult RunInside(std::vector<std::string> command) {
    command.insert(command.begin(), {BuiltProgram("appliance-root"), "--"});
    return RunProgram(command);
}

TEST(ApplianceRoot, HasNoDeviceOfTheMachineAndOnlyALoopbackThatIsUp) {
    const RunResult result =
        RunInside({"sh", "-c", "echo $(ls /dev; ls /dev/pts /sys/class/net); ip -br link"});
    EXPECT_THAT(result.out,
                StartsWith("fd full null ptmx pts random shm stderr stdin stdout tty urandom zero "
                           "/dev/pts: ptmx /sys/class/net: lo\nlo               UNKNOWN "));
}

TEST(ApplianceRoot, EndsWithTheStatusOfTheCommand) {
    const std::pair<const char*, int> kEnds[] = {{"exit 0", 0},
                                                 {"exit 255", 255},
                                                 {"kill -KILL $$", 128 + SIGKILL},
                                                 {"kill -TERM $$", 128 + SIGTERM}};
    for (const auto& [command, status] : kEnds) {
        EXPECT_EQ(RunInside({"sh", "-c", command}).status, status) << command;
    }
}

TEST(ApplianceRoot, HandsSignalsOnToTheCommand) {
    for (const auto& [number, name] :
         {std::pair(SIGTERM, "TERM"), std::pair(SIGINT, "INT"), std::pair(SIGHUP, "HUP")}) {
        Process root({BuiltProgram("appliance-root"), "sh", "-c",
                      "trap 'echo $0; exit 9' $0; echo up; sleep 60 & while :; do wait; done",
                      name});
        ASSERT_EQ(root.ReadLine(), "up");
        root.Signal(number);
        EXPECT_EQ(root.ReadLine(), name);
        EXPECT_EQ(root.Wait(), 9);
    }
}

// A program that was left running would hold the output open, and RunProgram() would wait for it.
TEST(ApplianceRoot, KillsWhatTheCommandLeftRunning) {
    const auto start = std::chrono::steady_clock::now();
    const auto result = RunInside({"sh", "-c", "sleep 60 & (setsid sleep 60 &) ; echo left"});
    EXPECT_EQ(result.out, "left\n");
    EXPECT_LT(std::chrono::steady_clock::now() - start, std::chrono::seconds(10));
}

TEST(ApplianceRoot, DiesWithTheProcessOutside) {
    Process root({BuiltProgram("appliance-root"), "sh", "-c", "echo up; setsid sleep 60"});
    ASSERT_EQ(root.ReadLine(), "up");
    root.Signal(SIGKILL);
    EXPECT_EQ(root.ReadLine(), std::nullopt);
    EXPECT_TRUE(root.AtEnd());
}

// Runs it with mounts of its own. In a chroot only an appliance root gives it those.
RunResult RunWithMounts(std::vector<std::string> command) {
    std::vector<std::string> unshare = {"unshare", "--mount", "--ipc"};
    if (geteuid() != 0) {
        unshare.insert(unshare.end(), {"--user", "--map-root-user"});
    } else if (RunProgram({"unshare", "--mount", "true"}).status != 0) {
        unshare = {BuiltProgram("appliance-root")};
    }
    command.insert(command.begin(), unshare.begin(), unshare.end());
    return RunProgram(command);
}

class UsedMachine : public testing::TestWithParam<const char*> {};

TEST_P(UsedMachine, IsNotSeenAndNotChanged) {
    const RunResult result =
        RunWithMounts({TAVI_SOURCE_DIR "/tests/platform/appliance_root/used_machine",
                       BuiltProgram("appliance-root"), GetParam()});
    const bool isReadOnly = GetParam() == std::string("read-only");
    const std::string place =
        "/etc/hostapd:\n\n/run/lock:\nno /var/lib/usbmodem\n0 new\ndestroyed\n" +
        std::string(isReadOnly ? "no output\n" : "");
    EXPECT_EQ(result.out, place + place + place + place + place + "unchanged\n" +
                              (isReadOnly ? "" : "kept\nkept\nkept\nkept\nkept\n"))
        << result.err;
    EXPECT_EQ(result.status, 0);
}

INSTANTIATE_TEST_SUITE_P(ApplianceRoot, UsedMachine,
                         testing::Values("", "user", "read-only", "chroot"));

}  // namespace
}  // namespace taviwireless::test
