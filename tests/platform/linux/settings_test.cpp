// SPDX-License-Identifier: MIT
// Files of sections, and of keys and values.
#include <gmock/gmock.h>
#include <sys/mount.h>
#include <tavicore/error.h>
#include <tavicore/keyvalue.h>
#include <tavicore/section.h>
#include <unistd.h>

#include "tests/support/files.h"

namespace taviwireless::test {
namespace {

constexpr char kFile[] = "/tmp/sections";
constexpr char kFormat[] = "\t%s=%s\n";

std::string ValueOf(const char* section) {
    char value[32];
    VEXACFileGetSectionValue(kFile, section, "KEY", value, sizeof value);
    return value;
}

TEST(Section, ShowsEveryChangeOfTheFileAtOnce) {
    // A file system that stamps files by the tick, as most kernels do everywhere.
    ASSERT_EQ(mount("none", "/tmp", "ramfs", 0, nullptr), 0);
    for (int i = 10; i < 99; ++i) {  // the same length, within the same tick of the clock
        const std::string value = std::to_string(i);
        WriteFile(kFile, "[one]\nKEY=" + value + "\n[" + value + "]\nKEY=x\n");
        EXPECT_EQ(ValueOf("one"), value);
        EXPECT_EQ(ValueOf(value.c_str()), "x");
    }
    usleep(50000);
    EXPECT_EQ(ValueOf("98"), "x");
    WriteFile(kFile, "[two]\nKEY=98\n[98]\nKEY=y\n");
    EXPECT_EQ(ValueOf("98"), "y");
    EXPECT_EQ(ValueOf("one"), "");
    VEXACFileSetSectionValue(kFile, "two", "KEY", "1", kFormat);
    EXPECT_EQ(ValueOf("98"), "y");
    unlink(kFile);
    EXPECT_EQ(ValueOf("98"), "");
    umount("/tmp");
}

TEST(Section, IsRemovedAndNothingElse) {
    const std::string before = "# all\n[A]\n\tKEY=1\n", after = "# of c\n\n[c]\n\tKEY=3";
    WriteFile(kFile, before + "[b]\n# of b\n\tKEY=2\n" + after);
    EXPECT_EQ(VEXACFileRemoveSection(kFile, "B"), 1);
    EXPECT_EQ(ReadFile(kFile), before + after);
    WriteFile(kFile, "[b]\n\tKEY=1\n[A]\n[b]\n\tKEY=2");  // the second one would count then
    EXPECT_EQ(VEXACFileRemoveSection(kFile, "b"), 1);
    EXPECT_EQ(ReadFile(kFile), "[A]\n");
    EXPECT_EQ(VEXACFileRemoveSection(kFile, "b"), 0);
    EXPECT_EQ(VEXACErrGet(), VEXAC_ERR_NOT_FOUND);
}

constexpr char kSettings[] = "/tmp/settings";

TEST(KeyValue, ReadsValuesAsAShellWould) {
    const struct {
        std::string text;
        int result;
        const char* value;
    } kRows[] = {
        {"KEY=value\n", 5, "value"},
        {"KEY=value", 5, "value"},  // a last line without its newline
        {"  KEY= a b \t\r\n", 4, " a b"},
        {"KEY=\"a b \"\n", 4, "a b "},
        {"KEY='it\"s'\n", 4, "it\"s"},
        {"KEY=\"a\"b\"\n", 3, "a\"b"},  // one pair around the whole value, no escapes
        {"KEY=\"half\n", 5, "\"half"},
        {"KEY=\"\n", 1, "\""},
        {"KEY=first\nKEY=second\n", 5, "first"},
        {"\n# KEY=comment\n#KEY=x\nno pair\n=x\nKEYS=1\nkey=2\nKEY=3\n", 1, "3"},
        {std::string("KEY=a\0b\n", 8), 1, "a"},
        {"\xff\xfe\x80\nKEY=\xc3\xbc\n", 2, "\xc3\xbc"},
        {"", -1, ""},
    };
    for (const auto& row : kRows) {
        SCOPED_TRACE(row.text);
        WriteFile(kSettings, row.text);
        char value[64];
        EXPECT_EQ(VEXACFileGetKeyValue(kSettings, "KEY", value, sizeof value), row.result);
        EXPECT_STREQ(value, row.value);
        EXPECT_EQ(VEXACFileCheckKeyValue(kSettings, "KEY", row.value, 0), row.result < 0 ? 0 : 1);
    }
}

TEST(KeyValue, AValueThatDoesNotFitIsRefusedAndNothingIsOverrun) {
    WriteFile(kSettings, "KEY=12345\n");
    for (size_t size : {1, 5, 6}) {
        char value[8] = "#######";
        EXPECT_EQ(VEXACFileGetKeyValue(kSettings, "KEY", value, size), size < 6 ? -1 : 5);
        EXPECT_STREQ(value, size < 6 ? "" : "12345");
        EXPECT_EQ(value[size], '#');
        EXPECT_TRUE(size == 6 || VEXACErrGet() == VEXAC_ERR_TOO_LONG);
    }
}

TEST(KeyValue, AWriteLeavesOneLineOfItsKey) {
    WriteFile(kSettings, "KEY=old\n#\nKEY=again\nlast line");
    EXPECT_EQ(VEXACFileSetKeyValue(kSettings, "KEY", "new", nullptr), 1);
    EXPECT_EQ(ReadFile(kSettings), "KEY=\"new\"\n#\nlast line");
}

}  // namespace
}  // namespace taviwireless::test
