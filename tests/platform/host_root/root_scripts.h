// SPDX-License-Identifier: MIT
#ifndef TAVIWIRELESS_TESTS_PLATFORM_HOST_ROOT_ROOT_SCRIPTS_H
#define TAVIWIRELESS_TESTS_PLATFORM_HOST_ROOT_ROOT_SCRIPTS_H

#include <string>

#include "tests/support/files.h"
#include "tests/support/process.h"

// The scripts and the network program of the host root, at the places where they are called.
namespace taviwireless::test {

inline void InstallScript(const std::string& from, const std::string& path) {
    WriteProgram(path, ReadFile(from));
}

inline void InstallRootScripts() {
    InstallScript(BuiltProgram("rc.network"), "/etc/rc.network");
    const std::string source = TAVI_SOURCE_DIR "/platform/host_root/";
    for (const std::string program : {"dhcp-lease", "stop-program"}) {
        InstallScript(source + program, "/usr/tavi/bin/" + program);
    }
    for (const std::string program : {"usb.plug", "usb.wireless.function"}) {
        InstallScript(source + "hotplug/" + program, "/usr/tavi/hotplug/" + program);
    }
}

}  // namespace taviwireless::test

#endif
