#include "cli/plugged_modem.h"

#include "cli/commands.h"
#include "cli/output.h"

namespace taviwireless::cli {

void FindModems(usbmodem_lib::USBModemList& list) {
    if (list.SearchInfoPath() != 0) {
        throw CommandError(kFailure, "cannot look for modems in /tmp/");
    }
}

usbmodem_lib::USBModem& InitialisedModem(usbmodem_lib::USBModemList& list, const std::string& id) {
    FindModems(list);
    usbmodem_lib::USBModem& modem = list.FindUSBModem(id);
    if (modem.IsNull()) {
        throw CommandError(kNotFound,
                           "there is no modem " + Printable(id) +
                               "; taviwireless modem list shows those that are plugged in");
    }
    ShowProgress("Finding the ports of " + id + " ...");
    if (modem.InitInfo() != 0) {
        ShowProgress("");
        throw CommandError(kFailure, "modem " + id + " does not answer on any of its ports; " +
                                         "unplug it and plug it in again");
    }
    return modem;
}

}  // namespace taviwireless::cli
