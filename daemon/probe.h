// SPDX-License-Identifier: MIT
#ifndef TAVIWIRELESS_DAEMON_PROBE_H
#define TAVIWIRELESS_DAEMON_PROBE_H

#include <glib.h>

#include <functional>
#include <string>

#include "base/unique_fd.h"

namespace taviwireless::daemon {

// Makes a modem ready in a process of its own: that takes seconds, with a port that is silent or
// talks without end minutes, in which the service could answer nobody. Few such processes run at a
// time; the others wait for their turn.
class Probe {
  public:
    // Gets what USBModem::TakeOver takes, or an empty text.
    using OnEnd = std::function<void(const std::string& findings)>;

    // Starts, or waits for its turn. Calls back from the main loop.
    Probe(int interfaceId, OnEnd onEnd);
    // Does not call back any more.
    ~Probe();
    Probe(const Probe&) = delete;
    Probe& operator=(const Probe&) = delete;

    // What the process does: makes the modem ready and prints its findings. Returns its exit status.
    static int Run(int interfaceId);

  private:
    static void StartWaiting();
    static void Reap(GPid process, gint status, gpointer probe);
    void Start();
    void Ended(bool answers);

    int interfaceId_;
    OnEnd onEnd_;
    GPid process_ = 0;
    UniqueFd output_;  // of the process
    guint watch_ = 0;
    guint failure_ = 0;
};

}  // namespace taviwireless::daemon

#endif
