// SPDX-License-Identifier: MIT
// Replacing a file: in one step, alike, and one writer after the other.
#include <gmock/gmock.h>
#include <signal.h>
#include <sys/mount.h>
#include <sys/stat.h>
#include <sys/wait.h>
#include <tavicore/error.h>
#include <tavicore/keyvalue.h>
#include <unistd.h>

#include <algorithm>
#include <utility>

#include "tests/platform/linux/skipped_waits.h"
#include "tests/support/descriptors.h"
#include "tests/support/files.h"
#include "tests/support/log_capture.h"

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
    constexpr int kWrites = 300;
    WriteFile(kFile, "");
    for (int writer = 0; writer < kWriters; ++writer) {
        Fork([writer] {
            for (int i = 0; i < kWrites; ++i) {
                const std::string key = "K" + std::to_string(writer) + "_" + std::to_string(i);
                VEXACFileSetKeyValue(kFile, key.c_str(), "v", "%s=%s\n");
            }
        });
    }
    for (int status = 0; wait(&status) > 0;) {
        EXPECT_EQ(status, 0);
    }
    const std::string text = ReadFile(kFile);
    EXPECT_EQ(std::count(text.begin(), text.end(), '\n'), kWriters * kWrites);
}

constexpr char kLock[] = "/tmp/state/.file.lock";
constexpr uid_t kStranger = 65534;

int SetKey(const char* path, const char* value) {
    return VEXACFileSetKeyValue(path, "A", value, "%s=%s\n");
}

// A writer that has the lock and goes no further: stopped until it is killed.
class StoppedWriter {
  public:
    StoppedWriter()
        : pid_(Fork([] {
              AtEachSync([] { raise(SIGSTOP); });
              SetKey(kFile, "stopped");
          })) {
        waitpid(pid_, nullptr, WUNTRACED);
    }
    ~StoppedWriter() { End(); }
    StoppedWriter(const StoppedWriter&) = delete;
    StoppedWriter& operator=(const StoppedWriter&) = delete;

    pid_t Pid() const { return pid_; }
    void End() {
        if (pid_ > 0) {
            kill(pid_, SIGKILL);
            waitpid(std::exchange(pid_, -1), nullptr, 0);
        }
    }

  private:
    pid_t pid_;
};

struct Locking : testing::Test {
    Locking() { WriteFile(kFile, "A=1\n"); }

    LogCapture log_;
    SkippedWaits waits_;
};

TEST_F(Locking, AWriterThatDoesNotGoOnIsWaitedForTwoSecondsAndNamed) {
    ASSERT_EQ(symlink("/tmp/state/file", "/tmp/other-name"), 0);
    const auto before = OpenDescriptors();
    const StoppedWriter holder;
    EXPECT_EQ(FileMode(kLock), 0600);  // so that no stranger locks it
    for (const char* path : {kFile, "/tmp/state/../state/file", "/tmp/other-name"}) {
        const double begin = waits_.Seconds();
        log_.Clear();
        EXPECT_EQ(SetKey(path, "2"), -1);
        EXPECT_EQ(VEXACErrGet(), VEXAC_ERR_LOCKED);
        EXPECT_LE(waits_.Seconds() - begin, 2.001);
        EXPECT_THAT(log_.Text(),
                    testing::HasSubstr("Cannot write " + std::string(path) + ": process " +
                                       std::to_string(holder.Pid()) + " (tavicore_test) holds"));
    }
    EXPECT_EQ(SetKey("/tmp/state/another", "2"), 1);  // locks are of single files
    EXPECT_EQ(ReadFile(kFile), "A=1\n");
    EXPECT_EQ(OpenDescriptors(), before);
}

TEST_F(Locking, AKilledWritersLockIsTakenOver) {
    StoppedWriter().End();
    EXPECT_TRUE(Exists(kLock));
    EXPECT_EQ(SetKey(kFile, "2"), 1);
    EXPECT_LT(waits_.Seconds(), 0.01);
    EXPECT_FALSE(Exists(kLock));
    EXPECT_EQ(ReadFile(kFile), "A=2\n");
}

// What a stranger puts at the lock's name, in a folder where he may, keeps nobody from writing.
TEST_F(Locking, AStrangersFileOrLinkIsNoLock) {
    TAVI_NEEDS_A_STRANGER()
    constexpr char kSharedFile[] = "/tmp/file";
    constexpr char kSharedLock[] = "/tmp/.file.lock";
    WriteFile(kSharedLock, "");
    for (const bool isLink : {false, true}) {
        ASSERT_EQ(lchown(kSharedLock, kStranger, kStranger), 0);
        EXPECT_EQ(SetKey(kSharedFile, "2"), 1) << isLink;
        EXPECT_LT(waits_.Seconds(), 0.1);
        ASSERT_EQ(symlink("/etc/passwd", kSharedLock), 0);
    }
}

}  // namespace
}  // namespace taviwireless::test
