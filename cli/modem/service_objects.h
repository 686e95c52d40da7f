// SPDX-License-Identifier: MIT
#ifndef TAVIWIRELESS_CLI_MODEM_SERVICE_OBJECTS_H
#define TAVIWIRELESS_CLI_MODEM_SERVICE_OBJECTS_H

#include <cstdint>
#include <map>
#include <optional>
#include <string>

#include "cli/modem/bus.h"
#include "cli/modem/modem_access.h"

namespace taviwireless::cli {

struct KnownModem {
    ModemState state;  // without the profile
    std::string logFile;
    bool answers = false;
    std::uint64_t lastLook = 0;  // Unix time; 0: never
};

// The modems as the objects of the modem service show them (daemon/modem_objects.xml): nobody is
// asked, and nobody waits.
class ServiceObjects {
  public:
    // All that are plugged in, by device id; nothing when there is no service, or one without such
    // objects.
    std::optional<std::map<std::string, KnownModem>> Read();

    // Has the service send one of them an AT command, and returns what it answers. Throws
    // CommandError.
    std::string Command(const std::string& id, const std::string& command);

    // Returns when a modem, or the service, may have changed since this was called last; the first
    // time at once.
    void WaitForChange();

  private:
    bool Connect();

    Bus bus_;
    bool isWatching_ = false;
};

}  // namespace taviwireless::cli

#endif
