#include <gmock/gmock.h>
#include <sys/mount.h>
#include <tavicore/error.h>
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

}  // namespace
}  // namespace taviwireless::test
