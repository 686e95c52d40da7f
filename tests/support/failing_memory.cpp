#include "tests/support/failing_memory.h"

#include <cstdlib>
#include <new>

namespace taviwireless::test {
namespace {

thread_local int allocationsLeft = -1;  // negative: no end
thread_local bool hasFailed = false;

}  // namespace

void FailAllocationAfter(int count) {
    allocationsLeft = count;
    hasFailed = false;
}

bool HasAllocationFailed() {
    allocationsLeft = -1;
    return hasFailed;
}

}  // namespace taviwireless::test

#define TAKEN_OVER __attribute__((visibility("default")))

TAKEN_OVER void* operator new(size_t size) {
    using namespace taviwireless::test;
    if (allocationsLeft == 0 && !hasFailed) {
        hasFailed = true;
        throw std::bad_alloc();
    }
    allocationsLeft -= allocationsLeft > 0 ? 1 : 0;
    void* memory = malloc(size > 0 ? size : 1);
    if (memory == nullptr) {
        throw std::bad_alloc();
    }
    return memory;
}

TAKEN_OVER void* operator new(size_t size, const std::nothrow_t&) noexcept {
    try {
        return operator new(size);
    } catch (const std::bad_alloc&) {
        return nullptr;
    }
}

TAKEN_OVER void operator delete(void* memory) noexcept {
    free(memory);
}

TAKEN_OVER void operator delete(void* memory, size_t) noexcept {
    free(memory);
}
