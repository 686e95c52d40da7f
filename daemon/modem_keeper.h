#ifndef TAVIWIRELESS_DAEMON_MODEM_KEEPER_H
#define TAVIWIRELESS_DAEMON_MODEM_KEEPER_H

#include <taviwireless/usbmodem_list.h>

#include <map>
#include <memory>

#include "daemon/initialisation.h"

namespace taviwireless::daemon {

// Keeps the modems of the service up to date. USBModemList::Update is not used: it initialises the
// modems one behind the other and stops at the first that fails, for as long as that takes.
class ModemKeeper {
  public:
    // list is borrowed, and touched from the main loop only.
    explicit ModemKeeper(usbmodem_lib::USBModemList& list) : list_(list) {}

    // Compares the list with the info files: modems that are new are made ready, those that are
    // gone are dropped, and one whose file was written anew was plugged in anew.
    void Rescan();

  private:
    void Drop();
    void Take();

    struct Modem {
        FileStamp stamp;
        std::unique_ptr<Initialisation> initialisation;
    };
    usbmodem_lib::USBModemList& list_;
    std::map<int, Modem> modems_;
};

}  // namespace taviwireless::daemon

#endif
