// SPDX-License-Identifier: MIT
#ifndef TAVIWIRELESS_CLI_WIFI_SUPPLICANT_EVENTS_H
#define TAVIWIRELESS_CLI_WIFI_SUPPLICANT_EVENTS_H

#include <string>
#include <thread>

#include "base/unique_pipe.h"

namespace taviwireless::cli {

// Hears what wpa_supplicant tells while a network is being joined: it writes no log, and the
// library only asks it whether it is done. A thread listens from the first moment there is one.
class SupplicantEvents {
  public:
    SupplicantEvents();
    ~SupplicantEvents();
    SupplicantEvents(const SupplicantEvents&) = delete;
    SupplicantEvents& operator=(const SupplicantEvents&) = delete;

    // Ends the listening. The reason that it gave, such as "its access point refused the key";
    // empty when it gave none.
    std::string WhyNotJoined();

  private:
    void Listen();
    // Listens to one supplicant, until it ends or nobody asks any more.
    void Hear(int socket);
    bool IsOver(int milliseconds, int socket = -1) const;
    void Note(const std::string& event);
    void Stop();

    UniquePipe stop_;
    int weight_ = 0;  // of the reason; a heavier one replaces it
    std::string reason_;
    std::thread thread_;
};

}  // namespace taviwireless::cli

#endif
