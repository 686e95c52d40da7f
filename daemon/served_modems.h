// SPDX-License-Identifier: MIT
#ifndef TAVIWIRELESS_DAEMON_SERVED_MODEMS_H
#define TAVIWIRELESS_DAEMON_SERVED_MODEMS_H

#include <taviwireless/usbmodem_list.h>

#include <memory>

#include "daemon/background_look.h"
#include "daemon/folder_watch.h"
#include "daemon/modem_keeper.h"
#include "daemon/modem_objects.h"
#include "daemon/network_watch.h"

namespace taviwireless::daemon {

// The modems of the service: their list and their records are kept up to date, and what is known of
// them is shown on the bus, if that has a place for it.
class ServedModems {
  public:
    // list is borrowed; refresh: see BackgroundLook. Throws std::exception when something cannot be
    // watched.
    ServedModems(usbmodem_lib::USBModemList& list, unsigned int refresh);
    ~ServedModems();
    ServedModems(const ServedModems&) = delete;
    ServedModems& operator=(const ServedModems&) = delete;

    // Looks for modems from now on, and ends the connections of those that went meanwhile.
    void Begin();

    // To be called after each call of a method, which may have dialled or hung up.
    void HasServed();

  private:
    void Command(const std::string& id, const std::string& command,
                 const ModemObjects::Reply& reply);
    void Update();
    bool FindDeadPorts();

    usbmodem_lib::USBModemList& list_;
    std::unique_ptr<ModemObjects> objects_;  // null when the bus does not let us show any
    BackgroundLook look_;
    ModemKeeper keeper_;
    FolderWatch infoFiles_;
    FolderWatch stateFiles_;
    NetworkWatch network_;
    unsigned int deadPorts_ = 0;  // GLib source, while there are modems
};

}  // namespace taviwireless::daemon

#endif
