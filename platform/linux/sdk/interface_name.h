// SPDX-License-Identifier: MIT
#ifndef TAVIWIRELESS_PLATFORM_LINUX_SDK_INTERFACE_NAME_H
#define TAVIWIRELESS_PLATFORM_LINUX_SDK_INTERFACE_NAME_H

// Names of interfaces that become parts of paths and of other programs' configurations.
namespace tavisdk {

// The rule of base/interface_name.h; the text need not end within the size of a name.
bool IsInterfaceName(const char* name);

// Throws tavicore::Failure when it is none.
void RequireInterfaceName(const char* name);

// Creates a folder of settings unless it is there; who writes a file into it sees a failure.
void MakeFolder(const char* path);

}  // namespace tavisdk

#endif
