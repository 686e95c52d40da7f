// SPDX-License-Identifier: MIT
#ifndef TAVIWIRELESS_TESTS_PLATFORM_VETH_H
#define TAVIWIRELESS_TESTS_PLATFORM_VETH_H

#include <string>

#include "tests/support/process.h"

// Network interfaces of the appliance root: pairs whose other end is called NAME-far.
namespace taviwireless::test {

// Runs "ip ARGUMENTS" and returns what it prints.
inline std::string Ip(const std::string& arguments) {
    return Shell("ip " + arguments);
}

inline void MakeInterface(const std::string& name, const std::string& address) {
    Ip("link add " + name + " type veth peer name " + name + "-far");
    Ip("address add " + address + " dev " + name);
    Ip("link set " + name + " up");
    Ip("link set " + name + "-far up");
}

}  // namespace taviwireless::test

#endif
