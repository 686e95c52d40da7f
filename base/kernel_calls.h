// SPDX-License-Identifier: MIT
#ifndef TAVIWIRELESS_BASE_KERNEL_CALLS_H
#define TAVIWIRELESS_BASE_KERNEL_CALLS_H

#include <sys/syscall.h>

// Numbers of calls that the kernel's headers, the C library or the kernel itself may be too old to
// know. Who uses one does without where it fails with ENOSYS, as the number -1 always does.
namespace taviwireless {

#ifdef SYS_memfd_create
constexpr long kMemfdCreate = SYS_memfd_create;  // Linux 3.17
#else
constexpr long kMemfdCreate = -1;
#endif

#ifdef SYS_pidfd_open
constexpr long kPidfdSendSignal = SYS_pidfd_send_signal;  // Linux 5.1
constexpr long kPidfdOpen = SYS_pidfd_open;               // Linux 5.3
#else
constexpr long kPidfdSendSignal = -1;
constexpr long kPidfdOpen = -1;
#endif

#ifdef SYS_close_range
constexpr long kCloseRange = SYS_close_range;  // Linux 5.9
#else
constexpr long kCloseRange = -1;
#endif

}  // namespace taviwireless

#endif
