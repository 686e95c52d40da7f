// SPDX-License-Identifier: MIT
#ifndef TAVIWIRELESS_PLATFORM_APPLIANCE_ROOT_PRIVATE_SYSTEM_H
#define TAVIWIRELESS_PLATFORM_APPLIANCE_ROOT_PRIVATE_SYSTEM_H

#include <filesystem>

namespace taviwireless {

// Where the caller is at work, by absolute paths.
struct Workplace {
    std::filesystem::path program;  // that is running
    std::filesystem::path current;  // directory
    std::filesystem::path output;   // folder that stays the machine's own; empty for none
};

// Lays out the file systems and brings lo up, as appliance_root.h describes them. The process must
// be the first one of new mount, network, UTS, IPC and PID namespaces. Throws std::system_error
// with one plain sentence.
void SetUpPrivateSystem(const Workplace& workplace);

}  // namespace taviwireless

#endif
