// SPDX-License-Identifier: MIT
#ifndef TAVIWIRELESS_USBMODEM_RULES_PROFILE_H
#define TAVIWIRELESS_USBMODEM_RULES_PROFILE_H

#include <cstddef>
#include <optional>
#include <string>
#include <string_view>

// What a connection profile can hold, as the library, the service and its front ends know it.
namespace taviwireless::usbmodem_lib::profile {

inline constexpr char kAPN[] = "apn";
inline constexpr char kNumber[] = "number";
inline constexpr char kUser[] = "user";
inline constexpr char kPassword[] = "pass";
inline constexpr char kIMSI[] = "IMSI";
inline constexpr char kLocation[] = "location";
inline constexpr char kISP[] = "isp";
inline constexpr char kDefaultGateway[] = "default_gw";  // "true", or anything else for false
// Stands in the documents only: the modem is asked for it.
inline constexpr char kRoaming[] = "roaming";

inline constexpr char kDefaultNumber[] = "*99#";
inline constexpr char kDefaultUser[] = "Unknown";  // and password

inline constexpr size_t kValueSize = 1024;  // bytes of a value and the zero behind it
// What no value holds: it would end its line, or itself.
inline constexpr std::string_view kLineEnds("\r\n\0", 3);

struct Setting {
    std::string key;
    std::string value;
};

// What a line "KEY=VALUE" sets when the service reads it. Compatible with clients that write lines
// such as "usbmodem_apn=x": the key counts wherever it stands in the line, and of several the first
// in this order. A line without a key sets nothing.
inline std::optional<Setting> ParseSetting(const std::string& line) {
    for (const char* key :
         {kAPN, kNumber, kUser, kPassword, kIMSI, kLocation, kISP, kDefaultGateway}) {
        const std::string begin = std::string(key) + '=';
        const size_t position = line.find(begin);
        if (position != std::string::npos) {
            return Setting{key, line.substr(position + begin.size())};
        }
    }
    return std::nullopt;
}

}  // namespace taviwireless::usbmodem_lib::profile

#endif
