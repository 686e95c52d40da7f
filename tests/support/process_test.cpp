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

TEST(RunProgram, PassesMoreThanAPipeHolds) {
    const std::string large(1 << 20, 'x');
    EXPECT_EQ(RunProgram({"cat"}, large).out, large);
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

}  // namespace
}  // namespace taviwireless::test
