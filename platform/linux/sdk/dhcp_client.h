// SPDX-License-Identifier: MIT
#ifndef TAVIWIRELESS_PLATFORM_LINUX_SDK_DHCP_CLIENT_H
#define TAVIWIRELESS_PLATFORM_LINUX_SDK_DHCP_CLIENT_H

namespace tavisdk {

// Ends the DHCP client of the interface, if there is one, without its giving the lease back.
void StopDhcpClient(const char* interface);

}  // namespace tavisdk

#endif
