// SPDX-License-Identifier: MIT
#include "wireless/system/supplicant_socket.h"

#include <sys/socket.h>
#include <sys/un.h>

#include "base/fixed_field.h"
#include "wireless/rules/paths.h"

namespace taviwireless::wireless {

UniqueFd AttachToSupplicant(const std::string& interface) {
    UniqueFd handle(socket(AF_UNIX, SOCK_DGRAM | SOCK_CLOEXEC, 0));
    sockaddr_un own{};
    own.sun_family = AF_UNIX;
    sockaddr_un supplicant = own;
    CopyField(supplicant.sun_path, kSupplicantSockets + ("/" + interface));
    constexpr char kAttach[] = "ATTACH";
    // An address of its own without a file, which the kernel chooses.
    const bool isAttached =
        handle &&
        bind(handle.Get(), reinterpret_cast<sockaddr*>(&own), sizeof own.sun_family) == 0 &&
        connect(handle.Get(), reinterpret_cast<sockaddr*>(&supplicant), sizeof supplicant) == 0 &&
        send(handle.Get(), kAttach, sizeof kAttach - 1, MSG_DONTWAIT) > 0;
    return isAttached ? std::move(handle) : UniqueFd();
}

}  // namespace taviwireless::wireless
