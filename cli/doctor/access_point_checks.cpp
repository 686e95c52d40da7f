// SPDX-License-Identifier: MIT
// The access point, where the settings say that it is on.
#include <taviwireless/wireless.h>
#include <unistd.h>

#include "cli/ap/access_point.h"
#include "cli/ap/hostapd.h"
#include "cli/command_error.h"
#include "cli/doctor/check.h"

namespace taviwireless::cli {

namespace {

Findings AccessPoint() {
    if (geteuid() != 0) {
        return Unknown("only root may read its settings", "look as root");
    }
    try {
        const APStatus status = LookAtAP();
        if (!status.settings || status.settings->enabled == 0) {
            return Unknown("not to be on");
        }
        if (!status.isOn || !ServesHostapd(TAVIWirelessAPInterfaceGet())) {
            return Failed("to be on, but hostapd does not serve it", "taviwireless ap enable");
        }
        return IsServed(status.settings->ap)
                   ? Ok("on")
                   : Warning("on, with other settings than those stored", "taviwireless ap enable");
    } catch (const CommandError& error) {
        return Failed(error.what(), "look at the owner and the mode of the file");
    }
}

}  // namespace

Checks AccessPointChecks() {
    return {{"access point", AccessPoint}};
}

}  // namespace taviwireless::cli
