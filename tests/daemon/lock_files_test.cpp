// The lock files that a killed process leaves behind.
#include "daemon/lock_files.h"

#include <gmock/gmock.h>

#include <filesystem>

#include "tests/support/files.h"

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

}  // namespace
}  // namespace taviwireless::test
