#ifndef TAVIWIRELESS_TESTS_PLATFORM_ROOT_SCRIPTS_H
#define TAVIWIRELESS_TESTS_PLATFORM_ROOT_SCRIPTS_H

#include <sys/stat.h>

#include <string>

#include "tests/support/files.h"

// The scripts of the host root, at the places where they are called.
namespace taviwireless::test {

inline void InstallRootScript(const std::string& name, const std::string& folder) {
    WriteFile(folder + '/' + name, ReadFile(TAVI_ROOT_FOLDER "/" + name));
    chmod((folder + '/' + name).c_str(), 0755);
}

inline void InstallRootScripts() {
    InstallRootScript("rc.network", "/etc");
    InstallRootScript("dhcp-lease", "/usr/tavi/bin");
    InstallRootScript("stop-program", "/usr/tavi/bin");
    InstallRootScript("usb.plug", "/usr/tavi/hotplug");
    InstallRootScript("usb.wireless.function", "/usr/tavi/hotplug");
}

}  // namespace taviwireless::test

#endif
