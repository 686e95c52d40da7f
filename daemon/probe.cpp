#include "daemon/probe.h"

#include <syslog.h>
#include <taviwireless/usbmodem.h>
#include <unistd.h>

#include <cstdlib>
#include <string>
#include <utility>

#include "daemon/info_files.h"
#include "daemon/semaphore_sets.h"

namespace taviwireless::daemon {

namespace {

constexpr unsigned int kLimit = 15;  // seconds; a modem with eight silent ports takes 11

// One that was killed had no time to tidy up.
void Forget(GPid process, gint /*status*/, gpointer /*data*/) {
    RemovePrivateSemaphoreSets(process);
}

}  // namespace

Probe::Probe(int interfaceId, std::function<void(bool answers)> onEnd) : onEnd_(std::move(onEnd)) {
    char program[] = "/proc/self/exe";
    char option[] = "--probe";
    std::string id = std::to_string(interfaceId);
    char* arguments[] = {program, option, id.data(), nullptr};
    GError* error = nullptr;
    if (!g_spawn_async(nullptr, arguments, nullptr, G_SPAWN_DO_NOT_REAP_CHILD, nullptr, nullptr,
                       &process_, &error)) {
        syslog(LOG_ERR, "cannot look whether modem %d answers: %s", interfaceId, error->message);
        g_error_free(error);
        failure_ = g_idle_add(
            [](gpointer self) -> gboolean {
                static_cast<Probe*>(self)->failure_ = 0;
                static_cast<Probe*>(self)->Ended(false);
                return G_SOURCE_REMOVE;
            },
            this);
        return;
    }
    watch_ = g_child_watch_add(
        process_,
        [](GPid ended, gint status, gpointer self) {
            Forget(ended, status, nullptr);
            static_cast<Probe*>(self)->watch_ = 0;
            static_cast<Probe*>(self)->Ended(status == 0);
        },
        this);
}

// The process goes on, so that it gives back the port, and ends by itself. It is not waited for: a
// broken driver may hold it for long.
Probe::~Probe() {
    if (failure_ != 0) {
        g_source_remove(failure_);
    }
    if (watch_ != 0) {
        g_source_remove(watch_);
        g_child_watch_add(process_, Forget, nullptr);
    }
}

// The call back may destroy this object, so it comes last.
void Probe::Ended(bool answers) {
    const auto onEnd = onEnd_;
    onEnd(answers);
}

int Probe::Run(int interfaceId) {
    alarm(kLimit);
    usbmodem_lib::USBModem modem(static_cast<unsigned int>(interfaceId), InfoPath(interfaceId));
    modem.SetATInterface();
    const bool answers = modem.AssignConnectNode() == 0 && modem.AssignQuaryNode() == 0;
    return answers ? EXIT_SUCCESS : EXIT_FAILURE;
}

}  // namespace taviwireless::daemon
