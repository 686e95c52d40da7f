#ifndef TAVIWIRELESS_TESTS_PLATFORM_VETH_H
#define TAVIWIRELESS_TESTS_PLATFORM_VETH_H

#include <gmock/gmock.h>

#include <string>

#include "tests/support/process.h"

// Network interfaces of the appliance root: pairs whose other end is called NAME-far.
namespace taviwireless::test {

// Runs "ip ARGUMENTS" and returns what it prints.
inline std::string Ip(const std::string& arguments) {
    const RunResult result = RunProgram({"sh", "-c", "ip " + arguments});
    EXPECT_EQ(result.status, 0) << "ip " << arguments << ": " << result.err;
    return result.out;
}

inline void MakeInterface(const std::string& name, const std::string& address) {
    Ip("link add " + name + " type veth peer name " + name + "-far");
    Ip("address add " + address + " dev " + name);
    Ip("link set " + name + " up");
    Ip("link set " + name + "-far up");
}

}  // namespace taviwireless::test

#endif
