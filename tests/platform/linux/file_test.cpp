// SPDX-License-Identifier: MIT
#include <gmock/gmock.h>
#include <sys/stat.h>
#include <tavicore/error.h>
#include <tavicore/file.h>
#include <tavicore/keyvalue.h>
#include <tavicore/process.h>
#include <tavicore/section.h>
#include <unistd.h>

#include <functional>
#include <vector>

#include "tests/support/files.h"

namespace taviwireless::test {
namespace {

constexpr uid_t kStranger = 65534;

// Every way to read a file: as 0 when it was read, -1 when not.
std::vector<std::function<int(const char*)>> Readers() {
    return {
        [](const char* f) { return VEXACFileCheckKeyValue(f, "K", "v", 0) - 1; },
        [](const char* f) {
            char value[8];
            return VEXACFileGetKeyValue(f, "K", value, sizeof value) == 1 ? 0 : -1;
        },
        [](const char* f) {
            char value[8];
            return VEXACFileGetSectionValue(f, "S", "L", value, sizeof value);
        },
        [](const char* f) { return VEXACReadPidFile(f) == 7 ? 0 : -1; },
        [](const char* f) { return VEXACFileSetKeyValue(f, "K", "v", "%s=%s\n") == 1 ? 0 : -1; }};
}

// In a folder in which everybody can put files, files of strangers do not count, and their links
// lead nobody elsewhere.
TEST(SharedFolder, OnlyRegularFilesOfRootOrOneselfCount) {
    TAVI_NEEDS_A_STRANGER()
    constexpr char kText[] = "7\nK=v\n[S]\nL=v\n";
    WriteFile("/etc/target", kText);
    WriteFile("/tmp/own", kText);
    WriteFile("/tmp/big", kText + std::string(65536, '\n'));
    WriteFile("/tmp/strange", kText);
    ASSERT_EQ(chown("/tmp/strange", kStranger, kStranger), 0);
    ASSERT_EQ(mkfifo("/tmp/fifo", 0600), 0);
    ASSERT_EQ(symlink("/etc/target", "/tmp/own-link"), 0);
    ASSERT_EQ(symlink("/etc/target", "/tmp/strange-link"), 0);
    ASSERT_EQ(lchown("/tmp/strange-link", kStranger, kStranger), 0);
    ASSERT_EQ(symlink("/tmp/strange-link", "/etc/link"), 0);
    const struct {
        const char* path;
        bool isRead;
    } kRows[] = {{"/tmp/own", true},      {"/tmp/own-link", true},      {"/tmp/big", false},
                 {"/tmp/strange", false}, {"/tmp/strange-link", false}, {"/etc/link", false},
                 {"/etc/target", true},   {"/tmp/fifo", false}};
    for (const auto& row : kRows) {
        for (const auto& read : Readers()) {
            EXPECT_EQ(read(row.path), row.isRead ? 0 : -1) << row.path;
            EXPECT_TRUE(row.isRead || VEXACErrGet() == VEXAC_ERR_IO);
        }
    }
    EXPECT_EQ(ReadFile("/etc/target"), kText);
}

TEST(SharedFolder, AStrangersLinkIsNotTouchedAndHisPidFileReplaced) {
    TAVI_NEEDS_A_STRANGER()
    ASSERT_EQ(symlink("/etc/nologin", "/var/tmp/flag"), 0);
    ASSERT_EQ(lchown("/var/tmp/flag", kStranger, kStranger), 0);
    EXPECT_EQ(VEXACFileTouch("/var/tmp/flag"), -1);
    EXPECT_EQ(VEXACErrGet(), VEXAC_ERR_IO);
    EXPECT_FALSE(Exists("/etc/nologin"));
    WriteFile("/tmp/pid", "1\n");
    ASSERT_EQ(chown("/tmp/pid", kStranger, kStranger), 0);
    EXPECT_EQ(VEXACProcPidFileCreate("/tmp/pid"), 0);
    EXPECT_EQ(VEXACReadPidFile("/tmp/pid"), getpid());
}

}  // namespace
}  // namespace taviwireless::test
