// SPDX-License-Identifier: MIT
#include "daemon/probe.h"

#include <sys/wait.h>
#include <syslog.h>
#include <taviwireless/usbmodem.h>
#include <unistd.h>

#include <algorithm>
#include <cstdio>
#include <cstdlib>
#include <string>
#include <utility>
#include <vector>

#include "daemon/info_files.h"
#include "daemon/lock_files.h"
#include "daemon/semaphore_sets.h"
#include "usbmodem/rules/paths.h"

namespace taviwireless::daemon {

namespace {

// Each waits nearly all of its time, and has 0.9 MB of its own meanwhile.
constexpr int kMostAtOnce = 16;

// A port that does not answer takes 1.3 s, one that talks without end 2.5 s.
constexpr unsigned int kLimitPerPort = 3;  // seconds
// Seconds, for everything else: a lock that nobody gives back, and six exchanges that take long.
constexpr unsigned int kLimit = 39;

int running = 0;
std::vector<Probe*> waiting;

// Removes the semaphores of a probe and, if it had no time for that, its locks of ports.
void TidyUp(GPid process, gint status) {
    RemovePrivateSemaphoreSets(process);
    if (WIFSIGNALED(status)) {
        RemovePortLocks(process);  // reads those of all modems
    }
}

unsigned int TimeLimit(const std::string& info) {
    const auto commas = std::count(info.begin(), info.end(), ',');
    return kLimit + kLimitPerPort * static_cast<unsigned int>(commas + 2);
}

std::string ReadAll(const UniqueFd& output) {
    char text[256];  // a device path and two numbers
    const ssize_t length = read(output.Get(), text, sizeof text);
    return std::string(text, length > 0 ? static_cast<size_t>(length) : 0);
}

}  // namespace

Probe::Probe(int interfaceId, OnEnd onEnd) : interfaceId_(interfaceId), onEnd_(std::move(onEnd)) {
    waiting.push_back(this);
    StartWaiting();
}

// The process goes on, so that it gives back the port, and ends by itself. It is not waited for: a
// broken driver may hold it for long.
Probe::~Probe() {
    waiting.erase(std::remove(waiting.begin(), waiting.end(), this), waiting.end());
    if (failure_ != 0) {
        g_source_remove(failure_);
    }
    if (watch_ != 0) {
        g_source_remove(watch_);
        g_child_watch_add(process_, Reap, nullptr);
    }
}

void Probe::StartWaiting() {
    while (running < kMostAtOnce && !waiting.empty()) {
        Probe* next = waiting.front();
        waiting.erase(waiting.begin());
        next->Start();
    }
}

void Probe::Start() {
    char program[] = "/proc/self/exe";
    char option[] = "--probe";
    std::string id = std::to_string(interfaceId_);
    char* arguments[] = {program, option, id.data(), nullptr};
    gint output = -1;
    GError* error = nullptr;
    if (!g_spawn_async_with_pipes(nullptr, arguments, nullptr, G_SPAWN_DO_NOT_REAP_CHILD, nullptr,
                                  nullptr, &process_, nullptr, &output, nullptr, &error)) {
        syslog(LOG_ERR, "cannot look whether modem %d answers: %s", interfaceId_, error->message);
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
    output_ = UniqueFd(output);
    ++running;
    watch_ = g_child_watch_add(process_, Reap, this);
}

// probe is null when nobody wants its answer any more.
void Probe::Reap(GPid process, gint status, gpointer probe) {
    TidyUp(process, status);
    --running;
    if (probe != nullptr) {
        static_cast<Probe*>(probe)->watch_ = 0;
        static_cast<Probe*>(probe)->Ended(status == 0);
    }
    StartWaiting();
}

// The call back may destroy this object, so it comes last.
void Probe::Ended(bool answers) {
    const std::string findings = answers ? ReadAll(output_) : "";
    const auto onEnd = onEnd_;
    onEnd(findings);
}

int Probe::Run(int interfaceId) {
    const std::string info = ReadInfoFile(interfaceId).value_or("");
    alarm(TimeLimit(info));
    usbmodem_lib::USBModem modem(static_cast<unsigned int>(interfaceId),
                                 usbmodem_lib::InfoPath(interfaceId));
    std::string findings;
    if (modem.MakeReady(findings) != 0) {
        return EXIT_FAILURE;
    }
    std::fputs(findings.c_str(), stdout);
    return EXIT_SUCCESS;
}

}  // namespace taviwireless::daemon
