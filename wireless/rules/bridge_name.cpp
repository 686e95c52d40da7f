#include "wireless/rules/bridge_name.h"

#include <sys/stat.h>
#include <taviwireless/wireless.h>

#include "base/interface_name.h"

namespace taviwireless::wireless {

namespace {

// Names of interfaces of another kind, taken whether these are there now or not: the wired one,
// which is a member of bridges, and the two of guests.
constexpr const char* kTaken[] = {"eth0", "gbr", "gwlan"};

bool IsThere(const std::string& path) {
    struct stat status {};
    return stat(path.c_str(), &status) == 0;
}

bool IsTaken(const std::string& name) {
    for (const char* taken : kTaken) {
        if (name == taken) {
            return true;
        }
    }
    const std::string device = "/sys/class/net/" + name;
    return name == TAVIWirelessAPInterfaceGet() ||
           (IsThere(device) && !IsThere(device + "/bridge"));
}

}  // namespace

std::string WhyNoBridge(const std::string& name) {
    if (!IsInterfaceName(name)) {
        return "is the name of an interface, 1 to 15 letters, digits, \"_\", \".\" and \"-\", of "
               "which the first is a letter or a digit";
    }
    if (IsTaken(name)) {
        return "cannot be " + name + ", an interface that is no bridge of the main network";
    }
    return "";
}

}  // namespace taviwireless::wireless
