// The appliance root as the test programs see it that run in one.
#include <fcntl.h>
#include <gmock/gmock.h>
#include <sys/sem.h>
#include <unistd.h>

#include <cerrno>
#include <chrono>
#include <csignal>
#include <filesystem>
#include <thread>

#include "tests/support/files.h"
#include "tests/support/process.h"

namespace taviwireless::test {
namespace {

namespace fs = std::filesystem;
using testing::ElementsAre;
using testing::UnorderedElementsAre;

std::vector<std::string> NamesIn(const std::string& directory) {
    std::vector<std::string> names;
    for (const auto& entry : fs::directory_iterator(directory)) {
        names.push_back(entry.path().filename());
    }
    return names;
}

TEST(InsideApplianceRoot, NoDeviceOfTheMachineIsSeen) {
    EXPECT_THAT(NamesIn("/dev"),
                UnorderedElementsAre("null", "zero", "full", "random", "urandom", "tty", "ptmx",
                                     "pts", "shm", "fd", "stdin", "stdout", "stderr"));
    EXPECT_THAT(NamesIn("/dev/pts"), ElementsAre("ptmx"));
}

TEST(InsideApplianceRoot, AModemPortCanBeAPseudoTerminal) {
    const int master = posix_openpt(O_RDWR | O_NOCTTY);
    ASSERT_GE(master, 0);
    ASSERT_EQ(grantpt(master), 0);
    ASSERT_EQ(unlockpt(master), 0);
    EXPECT_STREQ(ptsname(master), "/dev/pts/0");
    fs::create_symlink(ptsname(master), "/dev/ttyUSB0");

    const int port = open("/dev/ttyUSB0", O_RDWR | O_NOCTTY);
    ASSERT_GE(port, 0);
    EXPECT_TRUE(isatty(port));
    char received[8] = "";
    EXPECT_EQ(write(port, "AT", 2), 2);
    EXPECT_EQ(read(master, received, sizeof received), 2);
    EXPECT_STREQ(received, "AT");
    close(port);
    close(master);
}

TEST(InsideApplianceRoot, TheNetworkIsLoAndItIsUp) {
    EXPECT_THAT(NamesIn("/sys/class/net"), ElementsAre("lo"));
    constexpr long kUp = 1;
    EXPECT_TRUE(std::stol(ReadFile("/sys/class/net/lo/flags"), nullptr, 16) & kUp);
}

TEST(InsideApplianceRoot, SemaphoresArePrivate) {
    const int set = semget(0x7a11, 1, IPC_CREAT | IPC_EXCL | 0600);
    ASSERT_GE(set, 0);
    EXPECT_EQ(RunProgram({"wc", "-l", "/proc/sysvipc/sem"}).out, "2 /proc/sysvipc/sem\n");
    EXPECT_EQ(RunProgram({BuiltProgram("appliance-root"), "wc", "-l", "/proc/sysvipc/sem"}).out,
              "1 /proc/sysvipc/sem\n");
}

// A root within this one stands for a root on a machine that was in use.
class UsedMachine : public testing::Test {
  protected:
    UsedMachine() {
        const std::string program = "/tmp/clone/build/bin/appliance-root";
        MakeDirectories("/tmp/clone/build/bin");
        fs::copy_file(BuiltProgram("appliance-root"), program);
        WriteFile("/tmp/other", "not for those inside");
        WriteFile("/var/lib/usbmodem/pin.conf", "state");
        WriteFile("/etc/hostapd/old.conf", "state");
        WriteFile("/usr/tavi/old", "state");
        WriteFile("/run/lock/LCK..ttyUSB0", "state");
        program_ = program;
    }

    RunResult Inside(const std::string& script) {
        return RunProgram({"sh", "-c", script, "sh", program_});
    }

    std::string program_;
};

TEST_F(UsedMachine, ShowsNoneOfItsState) {
    const auto result = Inside(
        "$1 ls -A /etc/hostapd /usr/tavi /run/lock /var/lock/ && ! $1 test -e /var/lib/usbmodem");
    EXPECT_EQ(result.status, 0);
    EXPECT_EQ(result.out, "/etc/hostapd:\n\n/run/lock:\n\n/usr/tavi:\n\n/var/lock/:\n");
}

TEST_F(UsedMachine, KeepsItsStateWhateverIsDoneInside) {
    EXPECT_EQ(Inside("$1 sh -c 'rm -rf /etc/hostapd /usr/tavi /run/lock /etc/passwd;"
                     "  mkdir -p /var/lib/usbmodem; echo new > /var/lib/usbmodem/pin.conf'")
                  .status,
              0);
    EXPECT_EQ(ReadFile("/var/lib/usbmodem/pin.conf"), "state");
    EXPECT_EQ(ReadFile("/etc/hostapd/old.conf"), "state");
    EXPECT_EQ(ReadFile("/usr/tavi/old"), "state");
    EXPECT_EQ(ReadFile("/run/lock/LCK..ttyUSB0"), "state");
    EXPECT_TRUE(Exists("/etc/passwd"));
}

TEST_F(UsedMachine, ACheckoutInAHiddenFolderStaysVisibleAndReal) {
    const auto result = Inside("$1 sh -c 'ls -A /tmp; echo made > /tmp/clone/build/result'");
    EXPECT_EQ(result.out, "clone\n");
    EXPECT_EQ(ReadFile("/tmp/clone/build/result"), "made\n");
}

}  // namespace
}  // namespace taviwireless::test
