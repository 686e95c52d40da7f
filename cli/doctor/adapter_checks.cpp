// SPDX-License-Identifier: MIT
// The Wi-Fi adapter: hardware, driver, firmware, radio, and who else wants it.
#include <fcntl.h>
#include <tavisdk/wireless.h>
#include <taviwireless/wireless.h>
#include <unistd.h>

#include <algorithm>
#include <cerrno>
#include <cstring>
#include <filesystem>
#include <fstream>
#include <map>

#include "base/split.h"
#include "base/unique_fd.h"
#include "cli/adapter/requirements.h"
#include "cli/doctor/check.h"
#include "cli/doctor/processes.h"
#include "wireless/rules/paths.h"
#include "wireless/system/files.h"

namespace taviwireless::cli {

namespace {

namespace fs = std::filesystem;

std::string DeviceFolder() {
    return "/sys/class/net/" + WifiInterface();
}

bool HasAdapter() {
    return !WifiInterface().empty() && fs::exists(DeviceFolder());
}

Findings Model() {
    if (TAVIWirelessIsSupported() != 0) {
        return Ok("supports Wi-Fi");
    }
    return Warning(
        "does not support Wi-Fi",
        std::string("if it does, write support_wireless=yes into ") + wireless::kModelInfo);
}

Findings Adapter() {
    if (!HasAdapter()) {
        return Warning(
            "there is no interface " + WifiInterface(),
            "plug an adapter in; a lack of its driver or firmware is in the kernel's log");
    }
    if (wireless::IsMissing(wireless::kAdapterInfo)) {
        return Failed(WifiInterface() + " is there, but " + wireless::kAdapterInfo + " is not",
                      "/usr/tavi/hotplug/usb.plug writes it; plug the adapter in again");
    }
    return Ok(WifiInterface() + (TAVIWirelessAPIsSupported() == 1
                                     ? ", which can be an access point"
                                     : ", which cannot be an access point"));
}

Findings Driver() {
    if (!HasAdapter()) {
        return {};
    }
    std::error_code none;
    const fs::path driver = fs::read_symlink(DeviceFolder() + "/device/driver", none);
    return driver.empty() ? Unknown("the kernel does not tell that of " + WifiInterface())
                          : Ok(driver.filename());
}

// The kernel's log, a record a line. Nothing where it may not be read.
std::string KernelLog() {
    constexpr size_t kMost = 4 << 20;  // bytes
    const UniqueFd log(open("/dev/kmsg", O_RDONLY | O_NONBLOCK | O_CLOEXEC));
    std::string text;
    char record[8192];
    while (log && text.size() < kMost) {
        const ssize_t count = read(log.Get(), record, sizeof record);
        if (count > 0) {
            text.append(record, static_cast<size_t>(count));
        } else if (count == 0 || errno != EPIPE) {  // EPIPE: overwritten meanwhile
            break;
        }
    }
    return text;
}

// A driver may try several names, so this need not be what is wrong.
Findings Firmware() {
    if (access("/dev/kmsg", R_OK) != 0) {
        return Unknown("the kernel's log cannot be read", geteuid() == 0 ? "" : "look as root");
    }
    std::string last;
    for (const std::string& line : Lines(KernelLog())) {
        const bool isLoad =
            line.find("irmware") != line.npos && (line.find("failed with error") != line.npos ||
                                                  line.find("failed to load") != line.npos);
        last = isLoad ? line.substr(std::min(line.find(';') + 1, line.size())) : last;
    }
    return last.empty() ? Ok("the kernel misses none")
                        : Warning("the kernel says: " + last,
                                  "install the package that has this file, and plug in again");
}

std::string ValueOf(const fs::path& file) {
    std::string value;
    std::getline(std::ifstream(file), value);
    return value;
}

Findings Radio() {
    Findings wrong;
    std::error_code none;
    for (const auto& entry : fs::directory_iterator("/sys/class/rfkill", none)) {
        const std::string type = ValueOf(entry.path() / "type");
        if (type != "wlan" && type != "wwan") {
            continue;
        }
        const std::string what = type == "wlan" ? "Wi-Fi" : "mobile radio";
        if (ValueOf(entry.path() / "hard") == "1") {
            Append(wrong,
                   Failed(what + " is switched off by a switch or key of the machine", "use it"));
        } else if (ValueOf(entry.path() / "soft") == "1") {
            Append(wrong, Failed(what + " is switched off by software", "rfkill unblock " + type));
        }
    }
    if (geteuid() == 0 && TAVIWirelessCheckBlock() == 0) {
        Append(wrong, Failed("unblock=no is set for this adapter",
                             std::string("change it in ") + wireless::kAPSettings));
    }
    return wrong.empty() ? Ok("not switched off") : wrong;
}

Findings Managers() {
    static const std::map<std::string, const char*> kManagers = {
        {"NetworkManager", "nmcli device set wlan0 managed no"},
        {"connmand", "stop it, or leave it other interfaces alone"},
        {"iwd", "systemctl disable --now iwd"},
        {"wpa_supplicant", "systemctl disable --now wpa_supplicant"},
        {"ModemManager", "systemctl disable --now ModemManager: it opens the ports of modems"}};
    Findings wrong;
    for (const RunningProcess& process : RunningProcesses()) {
        const auto manager = kManagers.find(process.name);
        const bool isOurs = process.arguments.find(wireless::kSupplicantConf) != std::string::npos;
        if (manager != kManagers.end() && !isOurs) {
            Append(wrong, Warning(process.name + " runs (process " + std::to_string(process.pid) +
                                      ") and may hold the device",
                                  manager->second));
        }
    }
    return wrong.empty() ? Ok("none runs") : wrong;
}

}  // namespace

Checks AdapterChecks() {
    return {{"model", Model},       {"Wi-Fi adapter", Adapter}, {"Wi-Fi driver", Driver},
            {"firmware", Firmware}, {"radio", Radio},           {"other managers", Managers}};
}

}  // namespace taviwireless::cli
