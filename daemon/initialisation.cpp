// SPDX-License-Identifier: MIT
#include "daemon/initialisation.h"

#include <syslog.h>
#include <unistd.h>

#include <algorithm>
#include <utility>

#include "daemon/semaphore_sets.h"
#include "usbmodem/rules/paths.h"

namespace taviwireless::daemon {

namespace {

using usbmodem_lib::USBModem;

constexpr guint kFirstPause = 2;     // seconds
constexpr guint kLongestPause = 60;  // seconds

// Whether the SIM is known: otherwise the next look at a running connection would take its log for
// missing and end it. A SIM that waits for its PIN, or is missing, has nothing to tell and counts
// as known.
bool KnowsItsSIM(USBModem& modem) {
    const int connection = modem.RecallConnection();
    if (connection > 0) {
        return true;
    }
    constexpr int kReady = 1;
    constexpr int kUnknown = -1;
    const int sim = modem.UpdateSIMStatus();
    if (sim != kReady) {
        return connection == 0 && sim != kUnknown;
    }
    bool failed = false;
    modem.GetIMSI(failed);
    return !failed;
}

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
    probe_.emplace(interfaceId_, [this](const std::string& queryNode) { Probed(queryNode); });
}

void Initialisation::Probed(const std::string& queryNode) {
    probe_.reset();
    USBModem& modem = list_.FindUSBModem(interfaceId_);
    if (!queryNode.empty() && modem.InitInfo(queryNode) == 0) {
        const bool isReady = KnowsItsSIM(modem);
        RemovePrivateSemaphoreSets(getpid());
        if (isReady) {
            syslog(LOG_INFO, "usbmodem%d is ready", interfaceId_);
            const auto onReady = onReady_;
            onReady();  // which may drop the modem, and this with it
            return;
        }
        modem = NewRecord(interfaceId_);
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
