// SPDX-License-Identifier: MIT
// No memory: every call fails as a C function does, and files are as they were.
#include <gmock/gmock.h>
#include <tavicore/error.h>
#include <tavicore/file.h>
#include <tavicore/keyvalue.h>
#include <tavicore/process.h>
#include <tavicore/section.h>

#include <functional>
#include <string>

#include "common/sz_hash.h"
#include "common/sz_list.h"
#include "tests/support/failing_memory.h"
#include "tests/support/files.h"

namespace taviwireless::test {
namespace {

constexpr char kFile[] = "/tmp/state/file";
constexpr char kPidFile[] = "/tmp/state/pid";
// Too long for the room that a string has in itself.
constexpr char kLong[] = "a-value-that-is-longer-than-any-small-string";

struct Call {
    const char* name;
    int failed;
    std::function<int()> run;
};

// Calls it with the first allocation failing, then the second, and so on, until none fails.
// The caller sees each failure, and the file is as it was.
void CallWithoutMemory(const Call& call, const std::function<void()>& prepare) {
    SCOPED_TRACE(call.name);
    constexpr int kMostAllocations = 200;
    for (int count = 0; count < kMostAllocations; ++count) {
        prepare();
        VEXACErrSet(VEXAC_ERR_NONE);
        FailAllocationAfter(count);
        const int result = call.run();
        if (!HasAllocationFailed()) {
            EXPECT_NE(result, call.failed);
            return;
        }
        EXPECT_EQ(result, call.failed) << count;
        EXPECT_EQ(VEXACErrGet(), VEXAC_ERR_OUT_OF_MEMORY) << count;
        EXPECT_EQ(ReadFile(kFile), "K=v\n[S]\nK=v\n") << count;
        EXPECT_FALSE(Exists("/tmp/state/.file.lock"));
        EXPECT_FALSE(Exists("/tmp/state/.file.new"));
    }
    ADD_FAILURE() << "never succeeds";
}

TEST(Memory, ThatIsMissingFailsEveryCallAndChangesNoFile) {
    SzHash hash(0);
    hash.Set("K", "v");
    SzList list(0);
    const Call kCalls[] = {
        {"SzHashAlloc", 0, [] { return SzHash(0) ? 1 : 0; }},
        {"SzListPush", -1, [&] { return VEXACSzListPush(list.Address(), kLong); }},
        {"AddLine", -1, [] { return VEXACFileAddLine(kFile, nullptr, kLong, 0); }},
        {"SetKeyValue", -1, [] { return VEXACFileSetKeyValue(kFile, "K", kLong, nullptr); }},
        {"AddSection", -1, [&] { return VEXACFileAddSection(kFile, "T", hash.Get(), "%s=%s\n"); }},
        {"SetSectionValue", -1,
         [] { return VEXACFileSetSectionValue(kFile, "S", "K", kLong, "%s=%s\n"); }},
        {"PidFileCreate", -1, [] { return VEXACProcPidFileCreate(kPidFile); }},
        {"Exec", -1, [] { return VEXACExec("true", nullptr); }},
    };
    for (const Call& call : kCalls) {
        CallWithoutMemory(call, [&] {
            WriteFile(kFile, "K=v\n[S]\nK=v\n");
            VEXACProcPidFileCreate(kPidFile);
        });
    }
}

}  // namespace
}  // namespace taviwireless::test
