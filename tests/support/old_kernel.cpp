// SPDX-License-Identifier: MIT
#include "tests/support/old_kernel.h"

#include <fcntl.h>
#include <linux/filter.h>
#include <linux/seccomp.h>
#include <sys/prctl.h>
#include <sys/syscall.h>
#include <unistd.h>

#include <cerrno>
#include <cstddef>
#include <system_error>

namespace taviwireless::test {

namespace {

#ifdef SYS_fcntl64
constexpr int kFcntl = SYS_fcntl64;  // where long has 32 bits
#else
constexpr int kFcntl = SYS_fcntl;
#endif

}  // namespace

// Calls are numbered as they were added; the last one of Linux 3.10 is finit_module. The locks that
// an open file has, instead of a process, came later as well. rseq stays: the C library has used it
// for the first thread already, and ends the program that cannot do so for a second one.
void RefuseNewerCalls() {
    sock_filter filter[] = {
        BPF_STMT(BPF_LD | BPF_W | BPF_ABS, offsetof(seccomp_data, nr)),
        BPF_JUMP(BPF_JMP | BPF_JEQ | BPF_K, SYS_rseq, 6, 0),
        BPF_JUMP(BPF_JMP | BPF_JGT | BPF_K, SYS_finit_module, 6, 0),
        BPF_JUMP(BPF_JMP | BPF_JEQ | BPF_K, kFcntl, 0, 4),
        BPF_STMT(BPF_LD | BPF_W | BPF_ABS, offsetof(seccomp_data, args[1])),
        BPF_JUMP(BPF_JMP | BPF_JGT | BPF_K, F_OFD_SETLKW, 2, 0),
        BPF_JUMP(BPF_JMP | BPF_JGE | BPF_K, F_OFD_GETLK, 0, 1),
        BPF_STMT(BPF_RET | BPF_K, SECCOMP_RET_ERRNO | EINVAL),
        BPF_STMT(BPF_RET | BPF_K, SECCOMP_RET_ALLOW),
        BPF_STMT(BPF_RET | BPF_K, SECCOMP_RET_ERRNO | ENOSYS),
    };
    const sock_fprog program{sizeof filter / sizeof filter[0], filter};
    const bool isSet = prctl(PR_SET_SECCOMP, SECCOMP_MODE_FILTER, &program) == 0;
    if (!isSet || syscall(SYS_close_range, ~0U, ~0U, 0) == 0 || errno != ENOSYS) {
        throw std::system_error(errno, std::generic_category(), "newer calls are not refused");
    }
}

}  // namespace taviwireless::test
