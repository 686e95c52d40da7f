// SPDX-License-Identifier: MIT
#ifndef TAVIWIRELESS_TESTS_SUPPORT_OLD_KERNEL_H
#define TAVIWIRELESS_TESTS_SUPPORT_OLD_KERNEL_H

namespace taviwireless::test {

// From here on, this process and all that it starts get no call of the kernel that is newer than
// Linux 3.10. Throws when that cannot be had, as on an emulated processor.
void RefuseNewerCalls();

}  // namespace taviwireless::test

#endif
