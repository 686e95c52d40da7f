// SPDX-License-Identifier: MIT
#include "tests/support/descriptors.h"

#include <filesystem>
#include <system_error>

namespace taviwireless::test {

std::map<int, std::string> OpenDescriptors() {
    namespace fs = std::filesystem;
    std::map<int, std::string> descriptors;
    for (const auto& entry : fs::directory_iterator("/proc/self/fd")) {
        descriptors[std::stoi(entry.path().filename())];
    }
    for (auto descriptor = descriptors.begin(); descriptor != descriptors.end();) {
        std::error_code gone;  // the directory that was just listed had a descriptor itself
        const auto link = "/proc/self/fd/" + std::to_string(descriptor->first);
        descriptor->second = fs::read_symlink(link, gone).string();
        descriptor = gone ? descriptors.erase(descriptor) : std::next(descriptor);
    }
    return descriptors;
}

}  // namespace taviwireless::test
