// SPDX-License-Identifier: MIT
#ifndef TAVIWIRELESS_TESTS_SUPPORT_FILES_H
#define TAVIWIRELESS_TESTS_SUPPORT_FILES_H

#include <sys/types.h>

#include <string>

// Files as tests need them. Every function throws std::system_error, naming the path, when it
// cannot do its work, so that a test fails where its situation could not be built.
namespace taviwireless::test {

// Writes `text` as the whole content of `path`, creating the file and the directories above it.
void WriteFile(const std::string& path, const std::string& text);

// Writes a program for everybody. What stands at `path` is replaced: it may be a link to one that
// others need.
void WriteProgram(const std::string& path, const std::string& text);

// The whole content of `path`. Reads up to the end, so files of /proc and /sys work too.
std::string ReadFile(const std::string& path);

// Creates `path` and every directory above it that is missing.
void MakeDirectories(const std::string& path);

// The permission bits of `path` itself (07777); links are followed.
mode_t FileMode(const std::string& path);

// True when `path` names something; a link that leads nowhere names nothing.
bool Exists(const std::string& path);

// Whether files can be given to user 65534: an ordinary user has no other users inside unless the
// machine lends some.
bool HasStranger();

}  // namespace taviwireless::test

// Fails the case where there is nobody to be kept out.
#define TAVI_NEEDS_A_STRANGER()                                                                    \
    ASSERT_TRUE(::taviwireless::test::HasStranger())                                               \
        << "there is no second user: run as root, or install uidmap and lend yourself users with " \
           "usermod --add-subuids 100000-165535 --add-subgids 100000-165535 NAME";

#endif
