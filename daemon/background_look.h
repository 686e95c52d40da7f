// SPDX-License-Identifier: MIT
#ifndef TAVIWIRELESS_DAEMON_BACKGROUND_LOOK_H
#define TAVIWIRELESS_DAEMON_BACKGROUND_LOOK_H

#include <glib.h>
#include <taviwireless/usbmodem_list.h>

#include <chrono>
#include <ctime>
#include <functional>
#include <map>
#include <optional>
#include <set>
#include <string>
#include <vector>

#include "daemon/modem_objects.h"

namespace taviwireless::daemon {

// Keeps the records of the modems fresh: asks what GetUSBModem would ask, one question in a turn of
// the main loop that has nothing else to do, so that a call waits for one exchange at most. A modem
// is looked at when it is ready, when its SIM or its connection came into another state, and at
// times; never while the dialler has it.
class BackgroundLook {
  public:
    // list is borrowed. refresh: seconds between looks, 0 for none at all but those of Look;
    // while nobody listens one of five is made. onAnswer is called after every question.
    BackgroundLook(usbmodem_lib::USBModemList& list, guint refresh,
                   std::function<bool()> isListenedTo, std::function<void()> onAnswer);
    ~BackgroundLook();
    BackgroundLook(const BackgroundLook&) = delete;
    BackgroundLook& operator=(const BackgroundLook&) = delete;

    // To be called when records may have changed: begins looks that are due by that, and forgets
    // modems that are gone.
    void Follow();

    // Looks at the connections, which asks no modem; again every 2 s while one comes up.
    void LookAtLinks();

    // To be called after each call of a method. A program often calls again at once, and is to wait
    // for one question alone, not for one before each of its calls.
    void GiveWay();

    // Looks at one modem now. Replies when it is done, or why it cannot be.
    void Look(const std::string& id, const ModemObjects::Reply& reply);

    // When the modem last answered all questions; 0: never.
    time_t LastLook(const usbmodem_lib::USBModem& modem) const;

  private:
    using Clock = std::chrono::steady_clock;

    struct Modem {
        std::string state;  // of SIM and connection
        time_t lastLook = 0;
        std::optional<size_t> question;  // the next one, while it is looked at
        std::set<size_t> refused;        // questions
        bool isDoubted = false;          // whether it left a question unanswered
        std::vector<ModemObjects::Reply> waiting;
    };

    static bool TakeState(const usbmodem_lib::USBModem& record, Modem& modem);
    void Begin(Modem& modem);
    void BeginAll();
    bool Tick();
    bool AskNext();
    void Ask(usbmodem_lib::USBModem& record, Modem& modem);
    static void End(Modem& modem, const std::string& error, const std::string& sentence);

    usbmodem_lib::USBModemList& list_;
    guint refresh_;
    std::function<bool()> isListenedTo_;
    std::function<void()> onAnswer_;
    std::map<unsigned int, Modem> modems_;
    unsigned int lastAsked_ = 0;  // in turn: a slow modem keeps none of the others waiting
    unsigned int ticks_ = 0;
    guint tick_ = 0;  // GLib sources
    guint turn_ = 0;
    Clock::time_point waitsSince_;  // the next question
    guint link_ = 0;
};

}  // namespace taviwireless::daemon

#endif
