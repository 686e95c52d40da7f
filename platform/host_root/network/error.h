// SPDX-License-Identifier: MIT
#ifndef TAVIWIRELESS_PLATFORM_HOST_ROOT_NETWORK_ERROR_H
#define TAVIWIRELESS_PLATFORM_HOST_ROOT_NETWORK_ERROR_H

#include <stdexcept>

namespace taviwireless::network {

// Why the program refuses or fails: one sentence for the person who called it.
struct Error : std::runtime_error {
    using std::runtime_error::runtime_error;
};

}  // namespace taviwireless::network

#endif
