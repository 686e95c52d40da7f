// SPDX-License-Identifier: MIT
#include "tests/support/failing_memory.h"

#include <dlfcn.h>
#include <execinfo.h>

#include <algorithm>
#include <cstdlib>
#include <cstring>
#include <new>
#include <utility>

namespace taviwireless::test {
namespace {

thread_local int allocationsLeft = -1;  // negative: no end
thread_local bool hasFailed = false;
thread_local int allocated = 0;

// Whether the nearest caller that is no system library is code of this project, and not a stand-in
// of the test for a system library or for the kernel.
bool IsForUs() {
    void* callers[64];
    const int count = backtrace(callers, 64);
    Dl_info self{}, caller{};
    dladdr(reinterpret_cast<void*>(&HasAllocationFailed), &self);
    bool isOurs = false, isDecided = false;
    for (int i = 2; i < count && dladdr(callers[i], &caller) != 0; ++i) {
        if (caller.dli_sname != nullptr && strcmp(caller.dli_sname, "ioctl") == 0) {
            return false;
        }
        const char* name = strrchr(caller.dli_fname, '/');
        isOurs = isOurs || (!isDecided &&
                            strstr(name != nullptr ? name : caller.dli_fname, "tavi") != nullptr);
        isDecided = isDecided || isOurs || caller.dli_fbase == self.dli_fbase;
    }
    return isOurs;
}

}  // namespace

void FailAllocationAfter(int count) {
    allocationsLeft = count;
    hasFailed = false;
}

bool HasAllocationFailed() {
    allocationsLeft = -1;
    return hasFailed;
}

int AllocationsLeft() {
    return std::exchange(allocated, 0);
}

}  // namespace taviwireless::test

#define TAKEN_OVER __attribute__((visibility("default")))

TAKEN_OVER void* operator new(size_t size) {
    using namespace taviwireless::test;
    if (allocationsLeft == 0 && !hasFailed && IsForUs()) {
        hasFailed = true;
        throw std::bad_alloc();
    }
    allocationsLeft -= allocationsLeft > 0 ? 1 : 0;
    ++allocated;
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
    taviwireless::test::allocated -= memory != nullptr ? 1 : 0;
    free(memory);
}

TAKEN_OVER void operator delete(void* memory, size_t) noexcept {
    taviwireless::test::allocated -= memory != nullptr ? 1 : 0;
    free(memory);
}

#ifdef TAVI_OF_PROGRAM

namespace {

using Main = int (*)(int, char**, char**);
Main realMain = nullptr;

int MainWithMemory(int argc, char** argv, char** environment) {
    taviwireless::test::FailAllocationAfter(atoi(getenv("TAVI_ALLOCATIONS")));
    return realMain(argc, argv, environment);
}

}  // namespace

// The C library's start of a program, which calls main().
extern "C" TAKEN_OVER int __libc_start_main(Main start, int argc, char** argv, void (*init)(),
                                            void (*fini)(), void (*loaderFini)(), void* stackEnd) {
    const auto next =
        reinterpret_cast<decltype(&__libc_start_main)>(dlsym(RTLD_NEXT, "__libc_start_main"));
    const bool isTold = getenv("TAVI_ALLOCATIONS") != nullptr;
    realMain = start;
    return next(isTold ? MainWithMemory : start, argc, argv, init, fini, loaderFini, stackEnd);
}

#endif
