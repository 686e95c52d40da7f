// Files of sections, and of keys and values.
#include <gmock/gmock.h>
#include <sys/mount.h>
#include <tavicore/error.h>
#include <tavicore/keyvalue.h>
#include <tavicore/section.h>
#include <unistd.h>

#include <cstring>
#include <vector>

#include "common/sz_hash.h"
#include "common/sz_list.h"
#include "tests/support/files.h"

namespace taviwireless::test {
namespace {

constexpr char kFile[] = "/tmp/sections";
constexpr char kFormat[] = "\t%s=%s\n";

using Pairs = std::vector<std::pair<std::string, std::string>>;

struct Hash : SzHash {
    explicit Hash(const Pairs& pairs = {}) : SzHash(64) {
        for (const auto& [key, value] : pairs) {
            Set(key.c_str(), value);
        }
    }
};

constexpr char kText[] =
    "stray=0\n[One]\n\tKEY= \"as it stands\" \n# KEY=comment\n\n; of Two\n"
    " [two] \r\nKEY=a=b\r\nKEY=second\n[no=header\nUTF=\xc3\xbc\xff\nno pair\n"
    "[a]b]\n[]\nLAST=1";

TEST(Section, ReadsSectionsAmongMalformedLines) {
    WriteFile(kFile, kText);
    SzList names(64);
    ASSERT_EQ(VEXACFileEnumSection(kFile, names.Address()), 4);
    const char* kNames[] = {"One", "two", "a]b", ""};
    for (int i = 0; i < 4; ++i) {
        EXPECT_STREQ(names[i], kNames[i]);
    }
    Hash two;
    EXPECT_EQ(VEXACFileGetSection(kFile, "TWO", two.Address()), 1);  // another letter case
    EXPECT_STREQ(two["KEY"], "a=b");
    EXPECT_STREQ(two["UTF"], "\xc3\xbc\xff");
    EXPECT_TRUE(two["stray"] == nullptr && two["[no"] == nullptr);
    EXPECT_EQ(VEXACFileGetSection(kFile, "three", two.Address()), 0);
    char value[32];
    EXPECT_EQ(VEXACFileGetSectionValue(kFile, "One", "KEY", value, sizeof value), 0);
    EXPECT_STREQ(value, " \"as it stands\" ");
    EXPECT_EQ(VEXACFileGetSectionValue(kFile, "", "LAST", value, 2), 0);
    EXPECT_STREQ(value, "1");
    EXPECT_EQ(VEXACFileGetSectionValue(kFile, "", "LAST", value, 1), -1);
    EXPECT_EQ(VEXACErrGet(), VEXAC_ERR_TOO_LONG);
    EXPECT_EQ(VEXACFileGetSectionValue(kFile, "One", "LAST", value, sizeof value), -1);
    EXPECT_EQ(VEXACErrGet(), VEXAC_ERR_NOT_FOUND);
}

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

// What this process has read so far, in bytes.
size_t BytesRead() {
    return std::stoul(ReadFile("/proc/self/io").substr(strlen("rchar: ")));
}

TEST(Section, ReadingOneByOneReadsAFileNoMoreThanTwice) {
    std::string text;
    for (int i = 0; i < 500; ++i) {
        text += "[" + std::to_string(i) + "]\nKEY=" + std::to_string(i) + "\n";
    }
    WriteFile(kFile, text);
    usleep(50000);  // only a file that is not being written is remembered
    const size_t before = BytesRead();
    for (int i = 0; i < 500; ++i) {
        EXPECT_EQ(ValueOf(std::to_string(i).c_str()), std::to_string(i));
    }
    constexpr size_t kOther = 1000;  // of the count itself
    EXPECT_LT(BytesRead() - before, 2 * text.size() + kOther);
}

int Set(const char* section, const Pairs& pairs) {
    return VEXACFileSetSection(kFile, section, nullptr, Hash(pairs).Get(), kFormat);
}

int Add(const char* section, const Pairs& pairs) {
    return VEXACFileAddSection(kFile, section, Hash(pairs).Get(), kFormat);
}

TEST(Section, WritesLeaveEverythingElseAsItStands) {
    const std::string top = "; top\n[one]\n[c=1\n";
    const std::string two = "\n# two\n[two]\nx=\xff\n";
    WriteFile(kFile, top + "\ta=1\n\tb=2\n" + two);
    EXPECT_EQ(VEXACFileSetSectionValue(kFile, "one", "c", " 3 ", kFormat), 0);
    EXPECT_EQ(ReadFile(kFile), top + "\ta=1\n\tb=2\n\tc= 3 \n" + two);
    EXPECT_EQ(Set("ONE", {{"b", "9"}, {"n", ""}}), 1);
    EXPECT_EQ(ReadFile(kFile), top + "\tb=9\n\tn=\n" + two);
    EXPECT_EQ(Add("new", {{"z", "1"}, {"a", "2"}}), 1);
    EXPECT_EQ(ReadFile(kFile), top + "\tb=9\n\tn=\n" + two + "[new]\n\tz=1\n\ta=2\n");
    EXPECT_EQ(Add("new", {}), -1);
    EXPECT_EQ(Add(" blanks ", {}), 1);
    EXPECT_EQ(Set(" blanks ", {}), 1);
    EXPECT_EQ(Set("none", {}), 0);
}

TEST(Section, RefusesWhatWouldForgeALine) {
    WriteFile(kFile, "[one]\n\ta=1\n");
    const struct {
        const char *section, *key, *value;
    } kRows[] = {{"one", "a", "x\n[two]"}, {"one", "a\nb", "x"}, {"one", "[a", "x"},
                 {"one", "", "x"},         {"one", "a=b", "x"},  {"one", "#a", "x"},
                 {"one\n[two", "a", "x"},  {"", "a", "x"}};
    for (const auto& row : kRows) {
        EXPECT_EQ(VEXACFileSetSectionValue(kFile, row.section, row.key, row.value, kFormat), -1);
        EXPECT_EQ(VEXACErrGet(), VEXAC_ERR_BAD_PARAMETER);
    }
    EXPECT_EQ(Add("x", {{"a", "1\n2"}}), -1);
    EXPECT_EQ(Set("one", {{"a", "1\n2"}}), -1);
    EXPECT_EQ(ReadFile(kFile), "[one]\n\ta=1\n");
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

TEST(KeyValue, AWriteTouchesNothingButItsKey) {
    const std::string around =
        "# a comment\r\n\n\xff\xfe OTHER = \"x\"\n" + std::string("a\0b\n", 4);
    WriteFile(kSettings, around + "KEY=old\nKEY=again\nlast line");
    EXPECT_EQ(VEXACFileSetKeyValue(kSettings, "KEY", "new \"value\"", nullptr), 1);
    EXPECT_EQ(ReadFile(kSettings), around + "KEY=\"new \"value\"\"\nlast line");
    EXPECT_EQ(VEXACFileSetKeyValue(kSettings, "NEW", "1", "%s=%s\n"), 1);
    EXPECT_EQ(ReadFile(kSettings), around + "KEY=\"new \"value\"\"\nlast line\nNEW=1\n");
    EXPECT_EQ(VEXACFileCheckKeyValue(kSettings, "KEY", "new \"value\"", 0), 1);
}

TEST(KeyValue, RefusesWhatWouldForgeALineOrIsNoFormat) {
    WriteFile(kSettings, "KEY=1\n");
    const struct {
        const char* key;
        const char* value;
        const char* format;
    } kRows[] = {
        {"KEY", "a\nPIN=1", nullptr}, {"KEY", "a\rb", nullptr},   {"K=Y", "a", nullptr},
        {"#KEY", "a", nullptr},       {"K Y", "a", nullptr},      {nullptr, "a", nullptr},
        {"KEY", "a", "%s=%s"},        {"KEY", "a", "%s=%s %n\n"}, {"KEY", "a", "%s=%s\n%s\n"}};
    for (const auto& row : kRows) {
        VEXACErrSet(VEXAC_ERR_NONE);
        EXPECT_EQ(VEXACFileSetKeyValue(kSettings, row.key, row.value, row.format), -1);
        EXPECT_EQ(VEXACErrGet(), VEXAC_ERR_BAD_PARAMETER);
    }
    EXPECT_EQ(ReadFile(kSettings), "KEY=1\n");
}

}  // namespace
}  // namespace taviwireless::test
