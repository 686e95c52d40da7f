// SPDX-License-Identifier: MIT
#include "daemon/initialisation.h"

#include <syslog.h>

#include <algorithm>
#include <utility>

#include "usbmodem/rules/paths.h"

namespace taviwireless::daemon {

namespace {

using usbmodem_lib::USBModem;

constexpr guint kFirstPause = 2;     // seconds
constexpr guint kLongestPause = 60;  // seconds

USBModem NewRecord(int interfaceId) {
    USBModem modem(static_cast<unsigned int>(interfaceId), usbmodem_lib::InfoPath(interfaceId));
    modem.RecallConnection();
    return modem;
}

}  // namespace

Initialisation::Initialisation(usbmodem_lib::USBModemList& list, int interfaceId,
                               std::function<void()> onReady)
    : list_(list), interfaceId_(interfaceId), onReady_(std::move(onReady)), pause_(kFirstPause) {
    list_.FindUSBModem(interfaceId_) = NewRecord(interfaceId_);
    Try();
}

Initialisation::~Initialisation() {
    if (retry_ != 0) {
        g_source_remove(retry_);
    }
}

void Initialisation::Try() {
    probe_.emplace(interfaceId_, [this](const std::string& findings) { Probed(findings); });
}

void Initialisation::Probed(const std::string& findings) {
    probe_.reset();
    USBModem& modem = list_.FindUSBModem(interfaceId_);
    if (!findings.empty() && modem.TakeOver(findings) == 0) {
        modem.RecallConnection();
        syslog(LOG_INFO, "usbmodem%d is ready", interfaceId_);
        const auto onReady = onReady_;
        onReady();  // which may drop the modem, and this with it
        return;
    }
    syslog(LOG_WARNING, "usbmodem%d does not answer; next try in %u s", interfaceId_, pause_);
    retry_ = g_timeout_add_seconds(
        pause_,
        [](gpointer data) -> gboolean {
            auto* self = static_cast<Initialisation*>(data);
            self->retry_ = 0;
            self->Try();
            return G_SOURCE_REMOVE;
        },
        this);
    pause_ = std::min(2 * pause_, kLongestPause);
}

}  // namespace taviwireless::daemon
