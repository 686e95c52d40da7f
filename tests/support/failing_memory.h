#ifndef TAVIWIRELESS_TESTS_PLATFORM_LINUX_FAILING_MEMORY_H
#define TAVIWIRELESS_TESTS_PLATFORM_LINUX_FAILING_MEMORY_H

// operator new, which a test program with this file takes over, for the libraries it loads as well.
namespace taviwireless::test {

// From now on, `count` allocations of this thread succeed and the next one throws std::bad_alloc.
void FailAllocationAfter(int count);

// Ends that. True when an allocation has failed.
bool HasAllocationFailed();

}  // namespace taviwireless::test

#endif
