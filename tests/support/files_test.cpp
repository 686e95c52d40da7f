#include "tests/support/files.h"

#include <gmock/gmock.h>
#include <sys/stat.h>

#include <filesystem>
#include <system_error>

namespace taviwireless::test {
namespace {

TEST(Files, WritingMakesTheFoldersAndReplacesTheContent) {
    WriteFile("/tmp/a/b/file", "first, longer");
    WriteFile("/tmp/a/b/file", "second");
    AppendFile("/tmp/a/b/file", std::string("\0third", 6));
    EXPECT_EQ(ReadFile("/tmp/a/b/file"), std::string("second\0third", 12));
}

TEST(Files, ReadsFilesThatSayTheyAreEmpty) {
    EXPECT_NE(ReadFile("/proc/self/stat"), "");
}

TEST(Files, ModeHasThePermissionsOnly) {
    WriteFile("/tmp/key", "");
    ASSERT_EQ(chmod("/tmp/key", 04600), 0);
    EXPECT_EQ(FileMode("/tmp/key"), 04600u);
}

TEST(Files, WhatCannotBeDoneThrowsAndNamesThePath) {
    const auto expectNamed = [](auto&& action) {
        try {
            action();
            ADD_FAILURE() << "no exception";
        } catch (const std::system_error& error) {
            EXPECT_THAT(error.what(), testing::HasSubstr("/tmp/missing"));
        }
    };
    expectNamed([] { ReadFile("/tmp/missing"); });
    expectNamed([] { AppendFile("/tmp/missing/file", "x"); });
    expectNamed([] { FileMode("/tmp/missing"); });
}

TEST(Files, ALinkToNowhereDoesNotExist) {
    std::filesystem::create_symlink("/tmp/missing", "/tmp/link");
    EXPECT_FALSE(Exists("/tmp/link"));
    WriteFile("/tmp/missing", "");
    EXPECT_TRUE(Exists("/tmp/link"));
}

}  // namespace
}  // namespace taviwireless::test
