#ifndef TAVIWIRELESS_DAEMON_PROBE_H
#define TAVIWIRELESS_DAEMON_PROBE_H

#include <glib.h>

#include <functional>

namespace taviwireless::daemon {

// Whether a modem answers, found out by a process of its own: a port that is silent or talks
// without end takes seconds or minutes, in which the service could answer nobody.
class Probe {
  public:
    // Starts. Calls back from the main loop with the answer, which comes within 15 seconds.
    Probe(int interfaceId, std::function<void(bool answers)> onEnd);
    // Does not call back any more.
    ~Probe();
    Probe(const Probe&) = delete;
    Probe& operator=(const Probe&) = delete;

    // What the process does: finds both ports of the modem. Returns its exit status.
    static int Run(int interfaceId);

  private:
    void Ended(bool answers);

    std::function<void(bool answers)> onEnd_;
    GPid process_ = 0;
    guint watch_ = 0;
    guint failure_ = 0;
};

}  // namespace taviwireless::daemon

#endif
