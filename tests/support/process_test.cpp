#include "tests/support/process.h"

#include <gmock/gmock.h>

#include <csignal>
#include <system_error>

#include "tests/support/descriptors.h"

namespace taviwireless::test {
namespace {

using std::chrono::milliseconds;
using testing::Contains;
using testing::Key;
using testing::Not;

TEST(RunProgram, GivesStatusOutputAndErrors) {
    const auto result = RunProgram({"sh", "-c", "cat; echo bad >&2; exit 3"}, "good");
    EXPECT_EQ(result.status, 3);
    EXPECT_EQ(result.out, "good");
    EXPECT_EQ(result.err, "bad\n");
}

TEST(RunProgram, PassesMoreThanAPipeHolds) {
    const std::string large(1 << 20, 'x');
    EXPECT_EQ(RunProgram({"cat"}, large).out, large);
}

TEST(RunProgram, IsNotHarmedByAProgramThatDoesNotReadItsInput) {
    EXPECT_EQ(RunProgram({"true"}, std::string(1 << 20, 'x')).status, 0);
}

TEST(RunProgram, NamesTheProgramThatIsNotThere) {
    try {
        RunProgram({"no-such-program"});
        FAIL() << "it ran";
    } catch (const std::system_error& error) {
        EXPECT_EQ(error.code().value(), ENOENT);
        EXPECT_THAT(error.what(), testing::HasSubstr("no-such-program"));
    }
}

TEST(Process, TalksLineByLine) {
    Process cat({"cat"});
    EXPECT_TRUE(cat.WriteLine("one"));
    EXPECT_TRUE(cat.WriteLine("two"));
    EXPECT_EQ(cat.ReadLine(), "one");
    EXPECT_EQ(cat.ReadLine(), "two");
    EXPECT_EQ(cat.ReadLine(milliseconds(1)), std::nullopt);
    EXPECT_FALSE(cat.AtEnd());
    cat.CloseInput();
    EXPECT_EQ(cat.ReadLine(), std::nullopt);
    EXPECT_TRUE(cat.AtEnd());
    EXPECT_EQ(cat.Wait(), 0);
}

TEST(Process, GivesALastLineWithoutEnd) {
    Process printf({"printf", "one\\ntwo"});
    EXPECT_EQ(printf.ReadLine(), "one");
    EXPECT_EQ(printf.ReadLine(), "two");
    EXPECT_EQ(printf.ReadLine(), std::nullopt);
    EXPECT_TRUE(printf.AtEnd());
}

TEST(Process, WaitsNoLongerThanAsked) {
    Process sleeper({"sleep", "60"});
    EXPECT_EQ(sleeper.Wait(milliseconds(5)), std::nullopt);
    sleeper.Signal(SIGTERM);
    EXPECT_EQ(sleeper.Wait(), 128 + SIGTERM);
    EXPECT_EQ(sleeper.Wait(), 128 + SIGTERM);
}

TEST(Process, WritingToAnEndedProgramFails) {
    Process ended({"true"});
    ASSERT_EQ(ended.Wait(), 0);
    EXPECT_FALSE(ended.WriteLine("anybody?"));
}

TEST(Process, LeavesNothingBehind) {
    const auto before = OpenDescriptors();
    pid_t pid = -1;
    {
        Process sleeper({"sleep", "60"});
        pid = sleeper.Pid();
        EXPECT_NE(OpenDescriptors(), before);
    }
    EXPECT_EQ(OpenDescriptors(), before);
    EXPECT_EQ(kill(pid, 0), -1);
}

TEST(OpenDescriptors, NamesWhatEachLeadsTo) {
    FILE* file = fopen("/proc/version", "r");
    ASSERT_NE(file, nullptr);
    const int number = fileno(file);
    EXPECT_EQ(OpenDescriptors()[number], "/proc/version");
    fclose(file);
    EXPECT_THAT(OpenDescriptors(), Not(Contains(Key(number))));
}

}  // namespace
}  // namespace taviwireless::test
