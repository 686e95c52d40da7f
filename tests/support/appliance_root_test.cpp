// The appliance root as seen from outside: through the program appliance-root.
#include "platform/root/appliance_root.h"

#include <gmock/gmock.h>
#include <unistd.h>

#include <csignal>
#include <cstdlib>
#include <filesystem>

#include "tests/support/files.h"
#include "tests/support/process.h"

namespace taviwireless::test {
namespace {

using testing::HasSubstr;
using testing::StartsWith;

RunResult RunInside(std::vector<std::string> command) {
    command.insert(command.begin(), {BuiltProgram("appliance-root"), "--"});
    return RunProgram(command);
}

class PrivateFolder : public testing::TestWithParam<const char*> {};

TEST_P(PrivateFolder, TakesFilesThatAreNotSeenOutside) {
    const std::string path =
        std::string(GetParam()) + "/appliance-root-test-" + std::to_string(getpid());
    const auto result = RunInside({"sh", "-c", "echo hello > \"$1\" && cat \"$1\"", "sh", path});
    EXPECT_EQ(result.status, 0) << result.err;
    EXPECT_EQ(result.out, "hello\n");
    EXPECT_FALSE(std::filesystem::remove(path));
}

INSTANTIATE_TEST_SUITE_P(ApplianceRoot, PrivateFolder,
                         testing::Values("/tmp", "/run", "/run/lock", "/var/run", "/var/lock",
                                         "/var/tmp", "/var/lib", "/etc", "/etc/hostapd", "/usr",
                                         "/usr/sbin", "/usr/tavi", "/sbin", "/bin", "/dev",
                                         "/dev/shm", "/etc.defaults"));

class EmptyFolder : public testing::TestWithParam<const char*> {};

class PrivateNamespace : public testing::TestWithParam<const char*> {};

using CommandEnd = std::pair<std::string, int>;

class EndOfTheCommand : public testing::TestWithParam<CommandEnd> {};

TEST_P(EndOfTheCommand, BecomesTheStatus) {
    EXPECT_EQ(RunInside({"sh", "-c", GetParam().first}).status, GetParam().second);
}

INSTANTIATE_TEST_SUITE_P(ApplianceRoot, EndOfTheCommand,
                         testing::Values(CommandEnd("exit 0", 0), CommandEnd("exit 7", 7),
                                         CommandEnd("exit 255", 255),
                                         CommandEnd("kill -KILL $$", 128 + SIGKILL),
                                         CommandEnd("kill -TERM $$", 128 + SIGTERM)));

using NamedSignal = std::pair<int, std::string>;

class SignalFromOutside : public testing::TestWithParam<NamedSignal> {};

TEST_P(SignalFromOutside, ReachesTheCommand) {
    const auto [number, name] = GetParam();
    const std::string trap = "trap 'echo " + name + "; exit 9' " + name;
    Process root({BuiltProgram("appliance-root"), "sh", "-c",
                  trap + "; echo up; sleep 60 & while :; do wait; done"});
    ASSERT_EQ(root.ReadLine(), "up");
    root.Signal(number);
    EXPECT_EQ(root.ReadLine(), name);
    EXPECT_EQ(root.Wait(), 9);
}

INSTANTIATE_TEST_SUITE_P(ApplianceRoot, SignalFromOutside,
                         testing::Values(NamedSignal(SIGTERM, "TERM"), NamedSignal(SIGINT, "INT"),
                                         NamedSignal(SIGHUP, "HUP")));

// Whatever is left holds the output open, which RunProgram() would wait for.
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

// The program must be reachable for others, which a checkout in somebody's home is not.
TEST(ApplianceRoot, NeedsNoPrivilegeWhereUserNamespacesAreAllowed) {
    std::vector<std::string> nobody;  // before a command; not needed by somebody else than root
    if (geteuid() == 0) {
        nobody = {"setpriv", "--reuid=65534", "--regid=65534", "--clear-groups"};
    }
    auto command = nobody;
    command.insert(command.end(),
                   {"unshare", "--user", "--net", BuiltProgram("appliance-root"), "--help"});
    if (RunProgram(command).status != 0) {
        GTEST_SKIP() << "no user namespaces here, or the build directory is closed to others";
    }
    command = nobody;
    command.insert(command.end(),
                   {BuiltProgram("appliance-root"), "sh", "-ec",
                    "id -u; touch /etc/x /usr/sbin/x /var/lib/x /dev/ttyUSB0 /tmp/x /run/lock/x;"
                    "mkdir /var/lib/usbmodem; touch /etc/hostapd/x; rm /etc/passwd;"
                    "echo new > /etc/passwd; cat /etc/passwd"});
    const auto result = RunProgram(command);
    EXPECT_EQ(result.status, 0) << result.err;
    EXPECT_EQ(result.out, "0\nnew\n");
}

struct Usage {
    std::vector<std::string> arguments;
    int status;
    const char* error;

    friend void PrintTo(const Usage& usage, std::ostream* out) {
        *out << testing::PrintToString(usage.arguments);
    }
};

class CommandLine : public testing::TestWithParam<Usage> {};

}  // namespace
}  // namespace taviwireless::test
