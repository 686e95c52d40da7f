// SPDX-License-Identifier: MIT
#ifndef TAVIWIRELESS_TESTS_WIRELESS_SCRIPTED_DRIVER_H
#define TAVIWIRELESS_TESTS_WIRELESS_SCRIPTED_DRIVER_H

#include <linux/wireless.h>

#include <array>
#include <functional>
#include <set>
#include <string>
#include <vector>

namespace taviwireless::test {

// What the driver of the wireless interface answers while this lives; at most one may live at a
// time. A program that links tavi_scripted_driver defines ioctl() itself: requests of the wireless
// extensions go to the living ScriptedDriver, all else, and everything when none lives, to the
// system.
struct ScriptedDriver {
    ScriptedDriver();
    ~ScriptedDriver();
    ScriptedDriver(const ScriptedDriver&) = delete;
    ScriptedDriver& operator=(const ScriptedDriver&) = delete;

    std::set<unsigned long> refused;  // these requests fail (SIOCGIW...)
    std::string name = "IEEE 802.11bgn";
    std::string essid;  // the bytes that are copied; no zero byte follows
    unsigned mode = IW_MODE_INFRA;
    std::array<unsigned char, 6> accessPoint{};
    unsigned short encodingFlags = IW_ENCODE_DISABLED;
    unsigned short keyLength = 0;

    std::function<void()> atEachRequest;  // called before it is answered

    std::vector<unsigned> modesSet;            // of SIOCSIWMODE, which sets mode as well
    std::set<std::string> interfacesAskedFor;  // of all requests
};

}  // namespace taviwireless::test

#endif
