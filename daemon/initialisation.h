// SPDX-License-Identifier: MIT
#ifndef TAVIWIRELESS_DAEMON_INITIALISATION_H
#define TAVIWIRELESS_DAEMON_INITIALISATION_H

#include <glib.h>
#include <taviwireless/usbmodem_list.h>

#include <functional>
#include <optional>
#include <string>

#include "daemon/probe.h"

namespace taviwireless::daemon {

// Makes one modem of the list ready for use, and tries again with growing pauses while it does not
// answer, or does not tell its SIM. Until then it has a record of which nothing can be asked, but
// which knows the connection that another process may have dialled.
class Initialisation {
  public:
    // Starts. The modem is looked up in list whenever something is done with it. Calls back once
    // it is ready.
    Initialisation(usbmodem_lib::USBModemList& list, int interfaceId,
                   std::function<void()> onReady);
    ~Initialisation();
    Initialisation(const Initialisation&) = delete;
    Initialisation& operator=(const Initialisation&) = delete;

  private:
    void Try();
    void Probed(const std::string& findings);

    usbmodem_lib::USBModemList& list_;
    int interfaceId_;
    std::function<void()> onReady_;
    guint pause_;  // seconds, before the next try
    guint retry_ = 0;
    std::optional<Probe> probe_;
};

}  // namespace taviwireless::daemon

#endif
