// SPDX-License-Identifier: MIT
#ifndef TAVIWIRELESS_DAEMON_MODEM_KEEPER_H
#define TAVIWIRELESS_DAEMON_MODEM_KEEPER_H

#include <taviwireless/usbmodem_list.h>

#include <functional>
#include <map>
#include <memory>
#include <string>
#include <utility>

#include "daemon/initialisation.h"

namespace taviwireless::daemon {

// Keeps the modems of the service up to date. USBModemList::Update is not used: it initialises the
// modems one behind the other and stops at the first that fails, for as long as that takes.
class ModemKeeper {
  public:
    // list is borrowed, and touched from the main loop only. Calls back when modems came, went, or
    // are ready.
    explicit ModemKeeper(
        usbmodem_lib::USBModemList& list, std::function<void()> onChange = [] {})
        : list_(list), onChange_(std::move(onChange)) {}

    // Ends the connections of modems that were unplugged while no service ran.
    static void EndOrphanedConnections();

    // Compares the list with the info files: modems that are new are made ready, those that are
    // gone are hung up and dropped, and one whose file says something else, or whose port is not
    // the same any more, was plugged in anew.
    void Rescan();

    // Takes modems of which nothing can be asked out of service, and those that were reset: they
    // are made ready again as new ones are.
    void LookAfterModems();

  private:
    struct Modem {
        std::string info;  // what its file said when it was plugged in
        std::unique_ptr<Initialisation> initialisation;
    };

    void Look(int interfaceId);
    void Initialise(int interfaceId);
    bool IsSame(const Modem& known, const std::string& info, int interfaceId);
    void Drop(int interfaceId);

    usbmodem_lib::USBModemList& list_;
    std::function<void()> onChange_;
    std::map<int, Modem> modems_;
};

}  // namespace taviwireless::daemon

#endif
