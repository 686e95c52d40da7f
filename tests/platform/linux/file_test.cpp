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

#include "common/sz_hash.h"
#include "common/sz_list.h"
#include "tests/support/files.h"

namespace taviwireless::test {
namespace {

TEST(File, ListsFilesByTheBeginningOfTheirNames) {
    for (const char* name : {"x10", "x2", "x", "ax", "y"}) {
        WriteFile(std::string("/tmp/list/") + name, "");
    }
    MakeDirectories("/tmp/list/x3");
    SzList names(0);
    EXPECT_EQ(VEXACFileEnumDir("/tmp/list", "x", names.Address(), VEXAC_ENUM_FILES), 3);
    EXPECT_STREQ(names[0], "x");
    EXPECT_STREQ(names[1], "x2");
    EXPECT_STREQ(names[2], "x10");
    EXPECT_EQ(names[3], nullptr);
    EXPECT_EQ(VEXACFileEnumDir("/tmp/none", "x", names.Address(), VEXAC_ENUM_FILES), -1);
}

TEST(File, LinesAreRemovedAndAdded) {
    WriteFile("/tmp/lines", "a\nb\na \na");
    EXPECT_EQ(VEXACFileRemoveLine("/tmp/lines", "a"), 2);
    EXPECT_EQ(VEXACFileRemoveLine("/tmp/lines", "a"), 0);
    EXPECT_EQ(VEXACFileAddLine("/tmp/lines", nullptr, "c", 1), 1);
    EXPECT_EQ(ReadFile("/tmp/lines"), "b\na \nc\n");
    EXPECT_EQ(VEXACFileAddLine("/tmp/lines", nullptr, "c\nd", 1), -1);
    EXPECT_EQ(VEXACFileRemoveLine("/tmp/none", "a"), -1);
}

// Whatever stands where a file should be: no call hangs, crashes or succeeds.
TEST(File, WhatIsNoRegularFileIsRefusedByEveryCall) {
    MakeDirectories("/tmp/directory");
    ASSERT_EQ(mkfifo("/tmp/fifo", 0600), 0);
    SzHash hash(1);
    SzList list(1);
    char value[8];
    const std::function<int(const char*)> kCalls[] = {
        [&](const char* f) { return VEXACFileGetKeyValue(f, "K", value, sizeof value); },
        [&](const char* f) { return VEXACFileEnumSection(f, list.Address()); },
        [&](const char* f) { return VEXACFileGetSectionValue(f, "S", "K", value, sizeof value); },
        [&](const char* f) { return VEXACFileRemoveLine(f, "l"); },
        [&](const char* f) { return VEXACReadPidFile(f); },
        [&](const char* f) { return VEXACProcSignalByPidFile(f, 0); },
        [&](const char* f) { return VEXACFileSetKeyValue(f, "K", "v", nullptr); },
        [&](const char* f) { return VEXACFileAddSection(f, "S", hash.Get(), "%s=%s\n"); },
        [&](const char* f) { return VEXACProcPidFileCreate(f); }};
    for (const char* path : {"/tmp/directory", "/tmp/fifo", "/dev/null", "/tmp/none/x", ""}) {
        for (const auto& call : kCalls) {
            EXPECT_EQ(call(path), -1) << path;
        }
    }
}

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
    ASSERT_EQ(symlink("/etc/target", "/tmp/own-link"), 0);
    ASSERT_EQ(symlink("/etc/target", "/tmp/strange-link"), 0);
    ASSERT_EQ(lchown("/tmp/strange-link", kStranger, kStranger), 0);
    ASSERT_EQ(symlink("/tmp/strange-link", "/etc/link"), 0);
    const struct {
        const char* path;
        bool isRead;
    } kRows[] = {{"/tmp/own", true},      {"/tmp/own-link", true},      {"/tmp/big", false},
                 {"/tmp/strange", false}, {"/tmp/strange-link", false}, {"/etc/link", false},
                 {"/etc/target", true}};
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

TEST(File, MissingIsOnlyWhatTheSystemSaysIsMissing) {
    WriteFile("/tmp/file", "K=v\n");
    ASSERT_EQ(symlink("/tmp/loop", "/tmp/loop"), 0);
    const struct {
        const char* path;
        int error;
    } kRows[] = {{"/tmp/none", VEXAC_ERR_NOT_FOUND},
                 {"/tmp/file/x", VEXAC_ERR_NOT_FOUND},
                 {"/tmp/loop", VEXAC_ERR_IO}};
    const std::function<int(const char*)> kLooks[] = {
        VEXACFileExist, VEXACFileCheckDir,
        [](const char* f) { return VEXACFileCheckKeyValue(f, "K", "v", 0); },
        [](const char* f) {
            char value[8];
            return VEXACFileGetSectionValue(f, "S", "K", value, sizeof value) + 1;
        }};
    for (const auto& row : kRows) {
        for (const auto& look : kLooks) {
            VEXACErrSet(VEXAC_ERR_NONE);
            EXPECT_EQ(look(row.path), 0) << row.path;
            EXPECT_EQ(VEXACErrGet(), row.error) << row.path;
        }
    }
    EXPECT_EQ(VEXACFileExist("/tmp/file"), 1);
}

}  // namespace
}  // namespace taviwireless::test
