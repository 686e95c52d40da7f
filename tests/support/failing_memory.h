// SPDX-License-Identifier: MIT
#ifndef TAVIWIRELESS_TESTS_SUPPORT_FAILING_MEMORY_H
#define TAVIWIRELESS_TESTS_SUPPORT_FAILING_MEMORY_H

// operator new, which a test program with this file takes over, for the libraries it loads as well;
// or another program, with libtavi_failing_memory_of_program.so preloaded, whose main() then begins
// with FailAllocationAfter(TAVI_ALLOCATIONS).
namespace taviwireless::test {

// From now on, `count` allocations of this thread succeed, and the next one that code of this
// project asks for (in a file whose name holds "tavi") throws std::bad_alloc.
void FailAllocationAfter(int count);

// Ends that. True when an allocation has failed.
bool HasAllocationFailed();

// What this thread has allocated and not freed again, since the last call.
int AllocationsLeft();

}  // namespace taviwireless::test

#endif
