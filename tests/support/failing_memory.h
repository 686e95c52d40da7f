#ifndef TAVIWIRELESS_TESTS_PLATFORM_LINUX_FAILING_MEMORY_H
#define TAVIWIRELESS_TESTS_PLATFORM_LINUX_FAILING_MEMORY_H

// operator new, which a test program with this file takes over, for the libraries it loads as well.
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
