// SPDX-License-Identifier: MIT
#ifndef TAVIWIRELESS_TESTS_SUPPORT_SYSTEM_CALLS_H
#define TAVIWIRELESS_TESTS_SUPPORT_SYSTEM_CALLS_H

#include <functional>
#include <optional>
#include <set>
#include <string>
#include <vector>

namespace taviwireless::test {

// One system call that was made: the `number`-th of its name, from 1, in all processes of the run.
struct SystemCall {
    std::string name;
    int number;
    std::string subject;  // the path that it names or its descriptor leads to, if there is one
};

// What befalls one call: it fails with this error instead of being made, or its process is killed.
struct Fault {
    std::string call;
    int number;
    int error;
};
constexpr int kKill = 0;  // as an error

struct WatchedRun {
    std::vector<SystemCall> calls;     // all, if there is no fault
    std::optional<SystemCall> struck;  // what the fault befell
    std::vector<std::string> left;     // programs that were left running, and were killed
};

// Does the work in a thread of its own, whose system calls the kernel reports to this function first
// (seccomp's notifications), and so those of every process that is started.
//
// Counted are the calls that can fail and touch more than the process itself (see the table in the
// source), in the order in which they are made, of processes that run the program of this path, the
// test itself if none is given, and have not become another program. Calls of the loader are not
// counted, nor, until it asks for it, those of the thread itself. Memory is not among them.
//
// Programs of these names may stay behind: they are killed once nothing else is left. For others it
// waits 10 s, and then says that they were left.
//
// An exception of the work is thrown again.
WatchedRun WatchCalls(const std::function<void()>& work,
                      const std::optional<Fault>& fault = std::nullopt,
                      const std::string& program = "/proc/self/exe",
                      const std::set<std::string>& mayStay = {});

// Within the work: whether calls of this thread, or forked process, are counted from now on.
void CountMyCalls(bool on);

}  // namespace taviwireless::test

#endif
