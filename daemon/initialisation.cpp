#include "daemon/initialisation.h"

#include <syslog.h>
#include <unistd.h>

#include <algorithm>

#include "daemon/semaphore_sets.h"

namespace taviwireless::daemon {

namespace {

constexpr guint kFirstPause = 2;     // seconds
constexpr guint kLongestPause = 60;  // seconds

}  // namespace

Initialisation::Initialisation(usbmodem_lib::USBModemList& list, int interfaceId)
    : list_(list), interfaceId_(interfaceId), pause_(kFirstPause) {
    Try();
}

Initialisation::~Initialisation() {
    if (retry_ != 0) {
        g_source_remove(retry_);
    }
}

void Initialisation::Try() {
    probe_.emplace(interfaceId_, [this](bool answers) { Probed(answers); });
}

void Initialisation::Probed(bool answers) {
    probe_.reset();
    usbmodem_lib::USBModem& modem = list_.FindUSBModem(interfaceId_);
    if (answers && modem.InitInfo() == 0) {
        // A connection that was dialled before this process started is found by the IMSI, and taken
        // for a failed one without it.
        bool ignored = false;
        modem.GetIMSI(ignored);
        RemovePrivateSemaphoreSets(getpid());
        syslog(LOG_INFO, "usbmodem%d is ready", interfaceId_);
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
