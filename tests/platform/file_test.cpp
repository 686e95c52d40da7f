#include <gmock/gmock.h>
#include <sys/stat.h>
#include <tavicore/error.h>
#include <tavicore/file.h>
#include <tavicore/keyvalue.h>
#include <tavicore/process.h>
#include <tavicore/section.h>

#include <functional>

#include "tests/support/files.h"

namespace taviwireless::test {
namespace {

TEST(File, ListsFilesByTheBeginningOfTheirNames) {
    for (const char* name : {"x10", "x2", "x", "ax", "y"}) {
        WriteFile(std::string("/tmp/list/") + name, "");
    }
    MakeDirectories("/tmp/list/x3");
    VEXACSzList* names = VEXACSzListAlloc(64);
    EXPECT_EQ(VEXACFileEnumDir("/tmp/list", "x", &names, VEXAC_ENUM_FILES), 3);
    EXPECT_STREQ(VEXACSzListGet(names, 0), "x");
    EXPECT_STREQ(VEXACSzListGet(names, 1), "x2");
    EXPECT_STREQ(VEXACSzListGet(names, 2), "x10");
    EXPECT_EQ(VEXACFileEnumDir("/tmp/none", "x", &names, VEXAC_ENUM_FILES), -1);
    VEXACSzListFree(names);
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
    VEXACSzHash* hash = VEXACSzHashAlloc(1);
    VEXACSzList* list = VEXACSzListAlloc(1);
    char value[8];
    const std::function<int(const char*)> kReads[] = {
        [&](const char* f) { return VEXACFileGetKeyValue(f, "K", value, sizeof value); },
        [&](const char* f) { return VEXACFileCheckKeyValue(f, "K", "v", 0) - 1; },
        [&](const char* f) { return VEXACFileGetSection(f, "S", &hash); },
        [&](const char* f) { return VEXACFileEnumSection(f, &list); },
        [&](const char* f) { return VEXACFileGetSectionValue(f, "S", "K", value, sizeof value); },
        [&](const char* f) { return VEXACFileSetSection(f, "S", nullptr, hash, "%s=%s\n"); },
        [&](const char* f) { return VEXACFileRemoveLine(f, "l"); },
        [&](const char* f) { return VEXACReadPidFile(f); },
        [&](const char* f) { return VEXACProcAliveByPidFile(f) - 1; },
        [&](const char* f) { return VEXACProcSignalByPidFile(f, 0); }};
    const std::function<int(const char*)> kWrites[] = {
        [&](const char* f) { return VEXACFileSetKeyValue(f, "K", "v", nullptr); },
        [&](const char* f) { return VEXACFileAddSection(f, "S", hash, "%s=%s\n"); },
        [&](const char* f) { return VEXACFileSetSectionValue(f, "S", "K", "v", "%s=%s\n"); },
        [&](const char* f) { return VEXACFileAddLine(f, nullptr, "l", 0); },
        [&](const char* f) { return VEXACProcPidFileCreate(f); }};
    for (const char* path : {"/tmp/directory", "/tmp/fifo", "/dev/null", "/tmp/none/x", "", "/"}) {
        SCOPED_TRACE(path);
        for (const auto& call : kReads) {
            EXPECT_EQ(call(path), -1);
        }
        for (const auto& call : kWrites) {
            EXPECT_EQ(call(path), -1);
        }
    }
    for (const auto& call : kReads) {
        EXPECT_EQ(call("/tmp/none"), -1);
        EXPECT_EQ(VEXACErrGet(), VEXAC_ERR_NOT_FOUND);
    }
    VEXACSzHashFree(hash);
    VEXACSzListFree(list);
}

}  // namespace
}  // namespace taviwireless::test
