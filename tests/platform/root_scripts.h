#ifndef TAVIWIRELESS_TESTS_PLATFORM_ROOT_SCRIPTS_H
#define TAVIWIRELESS_TESTS_PLATFORM_ROOT_SCRIPTS_H

#include <sys/stat.h>

#include <cstring>
#include <string>

#include "tests/support/files.h"
#include "tests/support/process.h"

// The scripts and the network program of the host root, at the places where they are called.
namespace taviwireless::test {

inline void InstallScript(const std::string& from, const std::string& path) {
    WriteFile(path, ReadFile(from));
    chmod(path.c_str(), 0755);
}

inline void InstallRootScripts() {
    InstallScript(BuiltProgram("rc.network"), "/etc/rc.network");
    for (const char* path :
         {"/usr/tavi/bin/dhcp-lease", "/usr/tavi/bin/stop-program", "/usr/tavi/hotplug/usb.plug",
          "/usr/tavi/hotplug/usb.wireless.function"}) {
        InstallScript(TAVI_ROOT_FOLDER + std::string(strrchr(path, '/')), path);
    }
}

}  // namespace taviwireless::test

#endif
