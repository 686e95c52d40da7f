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

// The modems as the objects of the modem service show them (daemon/modem_objects.xml).
class ServiceObjects {
  public:
    // All that are plugged in, by device id, without asking them; nothing when there is no service,
    // or one without such objects.
    std::optional<std::map<std::string, KnownModem>> Read();

    // Has the service ask one of them everything, and waits until it has; whether all was answered.
    // A look that goes on already is the one that is waited for.
    bool Look(const std::string& id);

    // Has the service send one of them an AT command, and returns what it answers. Throws
    // CommandError.
    std::string Command(const std::string& id, const std::string& command);

    // Returns when a modem, or the service, may have changed since this was called last; the first
    // time at once.
    void WaitForChange();

  private:
    bool Connect();
    // Null on failure.
    Message Call(const std::string& id, const char* method,
                 const std::vector<std::string>& arguments, const char* signature,
                 BusFailure& failure);

    Bus bus_;
    bool isWatching_ = false;
};

}  // namespace taviwireless::cli

#endif
