// The appliance root as the test programs see it that run in one.
#include <fcntl.h>
#include <gmock/gmock.h>
#include <unistd.h>

#include <filesystem>

#include "tests/support/files.h"

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

}  // namespace
}  // namespace taviwireless::test
