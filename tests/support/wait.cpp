// SPDX-License-Identifier: MIT
#include "tests/support/wait.h"

#include <chrono>
#include <thread>

namespace taviwireless::test {

bool Eventually(const std::function<bool()>& condition) {
    const auto end = std::chrono::steady_clock::now() + std::chrono::seconds(50);
    while (!condition()) {
        if (std::chrono::steady_clock::now() > end) {
            return false;
        }
        std::this_thread::sleep_for(std::chrono::milliseconds(5));
    }
    return true;
}

}  // namespace taviwireless::test
