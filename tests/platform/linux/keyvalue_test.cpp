#include <gmock/gmock.h>
#include <tavicore/error.h>
#include <tavicore/keyvalue.h>

#include "tests/support/files.h"

namespace taviwireless::test {
namespace {

constexpr char kFile[] = "/tmp/settings";

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
        {"KEY=\n", 0, ""},
        {"KEY=\"\"\n", 0, ""},
        {"KEY=a=b\n", 3, "a=b"},
        {"KEY=first\nKEY=second\n", 5, "first"},
        {"\n# KEY=comment\n#KEY=x\nno pair\n=x\nKEYS=1\nkey=2\nKEY=3\n", 1, "3"},
        {std::string("KEY=a\0b\n", 8), 1, "a"},
        {"\xff\xfe\x80\nKEY=\xc3\xbc\n", 2, "\xc3\xbc"},
        {"KEYS=1\nkey=2\n", -1, ""},
        {"", -1, ""},
    };
    for (const auto& row : kRows) {
        SCOPED_TRACE(row.text);
        WriteFile(kFile, row.text);
        char value[64];
        EXPECT_EQ(VEXACFileGetKeyValue(kFile, "KEY", value, sizeof value), row.result);
        EXPECT_STREQ(value, row.value);
        EXPECT_EQ(VEXACFileCheckKeyValue(kFile, "KEY", row.value, 0), row.result < 0 ? 0 : 1);
    }
}

TEST(KeyValue, AValueThatDoesNotFitIsRefusedAndNothingIsOverrun) {
    constexpr char kFile[] = "/etc/settings";  // in "/tmp" it would be too big to be read at all
    WriteFile(kFile, "BIG=" + std::string(1 << 20, 'x') + "\nKEY=12345\n");
    for (size_t size : {1, 5, 6}) {
        char value[8] = "#######";
        EXPECT_EQ(VEXACFileGetKeyValue(kFile, "KEY", value, size), size < 6 ? -1 : 5);
        EXPECT_STREQ(value, size < 6 ? "" : "12345");
        EXPECT_EQ(value[size], '#');
    }
    char value[64];
    EXPECT_EQ(VEXACFileGetKeyValue(kFile, "BIG", value, sizeof value), -1);
    EXPECT_EQ(VEXACErrGet(), VEXAC_ERR_TOO_LONG);
}

TEST(KeyValue, AWriteTouchesNothingButItsKey) {
    const std::string around =
        "# a comment\r\n\n\xff\xfe OTHER = \"x\"\n" + std::string("a\0b\n", 4);
    WriteFile(kFile, around + "KEY=old\nKEY=again\nlast line");
    EXPECT_EQ(VEXACFileSetKeyValue(kFile, "KEY", "new \"value\"", nullptr), 1);
    EXPECT_EQ(ReadFile(kFile), around + "KEY=\"new \"value\"\"\nlast line");
    EXPECT_EQ(VEXACFileSetKeyValue(kFile, "NEW", "1", "%s=%s\n"), 1);
    EXPECT_EQ(ReadFile(kFile), around + "KEY=\"new \"value\"\"\nlast line\nNEW=1\n");
    EXPECT_EQ(VEXACFileCheckKeyValue(kFile, "KEY", "new \"value\"", 0), 1);
}

TEST(KeyValue, RefusesWhatWouldForgeALineOrIsNoFormat) {
    WriteFile(kFile, "KEY=1\n");
    const struct {
        const char* key;
        const char* value;
        const char* format;
    } kRows[] = {
        {"KEY", "a\nPIN=1", nullptr}, {"KEY", "a\rb", nullptr}, {"K=Y", "a", nullptr},
        {"#KEY", "a", nullptr},       {"", "a", nullptr},       {"K Y", "a", nullptr},
        {"K\nY", "a", nullptr},       {"KEY", "a", "%s=%d\n"},  {"KEY", "a", "%s=%s"},
        {"KEY", "a", "%s=%s %n\n"},   {"KEY", "a", "%s\n"},     {"KEY", "a", "%s=%s\n%s\n"},
        {nullptr, "a", nullptr},      {"KEY", nullptr, nullptr}};
    for (const auto& row : kRows) {
        VEXACErrSet(VEXAC_ERR_NONE);
        EXPECT_EQ(VEXACFileSetKeyValue(kFile, row.key, row.value, row.format), -1);
        EXPECT_EQ(VEXACErrGet(), VEXAC_ERR_BAD_PARAMETER);
    }
    EXPECT_EQ(ReadFile(kFile), "KEY=1\n");
}

}  // namespace
}  // namespace taviwireless::test
