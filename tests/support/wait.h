// SPDX-License-Identifier: MIT
#ifndef TAVIWIRELESS_TESTS_SUPPORT_WAIT_H
#define TAVIWIRELESS_TESTS_SUPPORT_WAIT_H

#include <functional>

namespace taviwireless::test {

// Waits until the condition holds, as long as a busy machine may take (50 s, within the time limit
// of a case), and returns whether it does.
bool Eventually(const std::function<bool()>& condition);

}  // namespace taviwireless::test

#endif
