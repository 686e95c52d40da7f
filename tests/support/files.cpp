// SPDX-License-Identifier: MIT
#include "tests/support/files.h"

#include <sys/stat.h>
#include <unistd.h>

#include <cerrno>
#include <filesystem>
#include <fstream>
#include <iterator>
#include <system_error>

#include "base/memory_file.h"

namespace taviwireless::test {
namespace {

[[noreturn]] void Fail(const std::string& what) {
    throw std::system_error(errno, std::generic_category(), what);
}

}  // namespace

void WriteFile(const std::string& path, const std::string& text) {
    const auto folder = std::filesystem::path(path).parent_path();
    if (!folder.empty()) {
        MakeDirectories(folder);
    }
    // Without root, a file of the machine's cannot be changed in place, but can be replaced.
    if (access(path.c_str(), W_OK) != 0 && errno == EACCES) {
        std::filesystem::remove(path);
    }
    std::ofstream file(path, std::ios::binary);
    if (!file || !file.write(text.data(), text.size()) || !file.flush()) {
        Fail("Cannot write " + path);
    }
}

void WriteProgram(const std::string& path, const std::string& text) {
    std::filesystem::remove(path);
    WriteFile(path, text);
    chmod(path.c_str(), 0755);
}

std::string ReadFile(const std::string& path) {
    std::ifstream file(path, std::ios::binary);
    if (!file) {
        Fail("Cannot read " + path);
    }
    return {std::istreambuf_iterator<char>(file), std::istreambuf_iterator<char>()};
}

void MakeDirectories(const std::string& path) {
    std::filesystem::create_directories(path);
}

mode_t FileMode(const std::string& path) {
    struct stat status {};
    if (stat(path.c_str(), &status) != 0) {
        Fail("Cannot look at " + path);
    }
    return status.st_mode & 07777;
}

bool Exists(const std::string& path) {
    return std::filesystem::exists(path);
}

bool HasStranger() {
    const UniqueFd file = MemoryFile();
    return fchown(file.Get(), 65534, -1) == 0;
}

}  // namespace taviwireless::test
