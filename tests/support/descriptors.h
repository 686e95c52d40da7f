// SPDX-License-Identifier: MIT
#ifndef TAVIWIRELESS_TESTS_SUPPORT_DESCRIPTORS_H
#define TAVIWIRELESS_TESTS_SUPPORT_DESCRIPTORS_H

#include <map>
#include <string>

namespace taviwireless::test {

// The descriptors this process has open, each with what it leads to ("/tmp/x", "pipe:[123]").
// Two calls that return equal maps have no leak between them.
std::map<int, std::string> OpenDescriptors();

}  // namespace taviwireless::test

#endif
