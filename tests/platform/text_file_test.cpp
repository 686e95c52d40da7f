// Replacing a file: in one step, alike, and one writer after the other.
#include <gmock/gmock.h>
#include <signal.h>
#include <sys/mount.h>
#include <sys/stat.h>
#include <sys/wait.h>
#include <tavicore/error.h>
#include <tavicore/keyvalue.h>
#include <tavicore/section.h>
#include <unistd.h>

#include <random>

#include "tests/support/descriptors.h"
#include "tests/support/files.h"

namespace taviwireless::test {
namespace {

constexpr char kFile[] = "/tmp/state/file";

// Runs body in a child process.
template <typename Body>
pid_t Fork(Body body) {
    const pid_t child = fork();
    if (child == 0) {
        body();
        _exit(0);
    }
    return child;
}

TEST(Replacing, KeepsModeOwnerAndLinks) {
    WriteFile(kFile, "A=1\n");
    // Without root there is one user and one group alone.
    const bool isGiven = chown(kFile, 1, 2) == 0;
    ASSERT_EQ(chmod(kFile, 0640), 0);
    ASSERT_EQ(symlink("state/file", "/tmp/link"), 0);
    const auto before = OpenDescriptors();
    EXPECT_EQ(VEXACFileSetKeyValue("/tmp/link", "A", "2", "%s=%s\n"), 1);
    struct stat status {};
    ASSERT_EQ(lstat(kFile, &status), 0);
    EXPECT_EQ(status.st_mode, S_IFREG | 0640u);
    EXPECT_EQ(status.st_uid, isGiven ? 1u : 0u);
    EXPECT_EQ(status.st_gid, isGiven ? 2u : 0u);
    ASSERT_EQ(lstat("/tmp/link", &status), 0);
    EXPECT_TRUE(S_ISLNK(status.st_mode));
    EXPECT_EQ(ReadFile(kFile), "A=2\n");
    EXPECT_EQ(OpenDescriptors(), before);
}

TEST(Replacing, AFullDiskLeavesTheOldFile) {
    MakeDirectories("/tmp/state");
    ASSERT_EQ(mount("tiny", "/tmp/state", "tmpfs", 0, "size=8k"), 0);
    WriteFile(kFile, "A=1\n");
    const std::string big(16384, 'x');
    EXPECT_EQ(VEXACFileSetKeyValue(kFile, "A", big.c_str(), nullptr), -1);
    EXPECT_EQ(VEXACErrGet(), VEXAC_ERR_IO);
    EXPECT_EQ(ReadFile(kFile), "A=1\n");
    EXPECT_FALSE(Exists("/tmp/state/.file.new"));
    EXPECT_EQ(VEXACFileSetKeyValue(kFile, "A", "2", "%s=%s\n"), 1);
}

TEST(Replacing, FourWritersLoseNothing) {
    constexpr int kWriters = 4;
    constexpr int kWrites = 500;
    MakeDirectories("/tmp/state");
    for (int writer = 0; writer < kWriters; ++writer) {
        Fork([writer] {
            for (int i = 0; i < kWrites; ++i) {
                const std::string key = "K" + std::to_string(writer) + "_" + std::to_string(i);
                if (VEXACFileSetSectionValue(kFile, "S", key.c_str(), "v", "%s=%s\n") != 0) {
                    _exit(1);
                }
            }
        });
    }
    for (int status = 0; wait(&status) > 0;) {
        EXPECT_EQ(status, 0);
    }
    VEXACSzHash* hash = VEXACSzHashAlloc(1024);
    ASSERT_EQ(VEXACFileGetSection(kFile, "S", &hash), 1);
    int found = 0;
    for (int i = 0; i < kWriters * kWrites; ++i) {
        const std::string key =
            "K" + std::to_string(i / kWrites) + "_" + std::to_string(i % kWrites);
        found += VEXACSzHashGetValue(hash, key.c_str()) != nullptr ? 1 : 0;
    }
    EXPECT_EQ(found, kWriters * kWrites);
    VEXACSzHashFree(hash);
}

// The file holds FIRST, a long value, and LAST, equal to FIRST, whenever it is looked at.
TEST(Replacing, AKilledWriterNeverLeavesATornFile) {
    constexpr int kKills = 200;
    MakeDirectories("/tmp/state");
    const std::string filler(20000, 'x');
    WriteFile(kFile, "PAIR=0-0\nFILLER=" + filler + "\n");
    std::mt19937 random(20);
    std::uniform_int_distribution<int> microseconds(0, 3000);
    for (int kill = 0; kill < kKills; ++kill) {
        const pid_t writer = Fork([kill] {
            for (int i = 0;; ++i) {
                const std::string text = std::to_string(kill) + "." + std::to_string(i);
                VEXACFileSetKeyValue(kFile, "PAIR", (text + "-" + text).c_str(), "%s=%s\n");
            }
        });
        usleep(static_cast<useconds_t>(microseconds(random)));
        ::kill(writer, SIGKILL);
        waitpid(writer, nullptr, 0);
        char pair[64];
        ASSERT_GT(VEXACFileGetKeyValue(kFile, "PAIR", pair, sizeof pair), 0);
        const std::string text = pair;
        ASSERT_EQ(text.substr(0, text.find('-')), text.substr(text.find('-') + 1));
        ASSERT_EQ(ReadFile(kFile), "PAIR=" + text + "\nFILLER=" + filler + "\n");
    }
    EXPECT_EQ(VEXACFileSetKeyValue(kFile, "PAIR", "1-1", "%s=%s\n"), 1);
    EXPECT_FALSE(Exists("/tmp/state/.file.new"));  // what the last killed one left
}

}  // namespace
}  // namespace taviwireless::test
