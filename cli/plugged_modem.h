#ifndef TAVIWIRELESS_CLI_PLUGGED_MODEM_H
#define TAVIWIRELESS_CLI_PLUGGED_MODEM_H

#include <taviwireless/usbmodem_list.h>

#include <string>

namespace taviwireless::cli {

// Fills list with the modems that are plugged in, none of them initialised yet.
void FindModems(usbmodem_lib::USBModemList& list);

// The modem with this device id, initialised; borrowed from list, which this fills.
// Throws CommandError when there is none or it does not answer.
usbmodem_lib::USBModem& InitialisedModem(usbmodem_lib::USBModemList& list, const std::string& id);

}  // namespace taviwireless::cli

#endif
