// SPDX-License-Identifier: MIT
#include "daemon/background_look.h"

#include <algorithm>
#include <iterator>
#include <utility>

#include "dbus/usbmodem_documents.h"
#include "usbmodem/rules/status.h"

namespace taviwireless::daemon {

namespace {

using usbmodem_lib::NameOf;
using usbmodem_lib::NetStatus;
using usbmodem_lib::USBModem;

constexpr guint kLinkPause = 2;          // seconds between looks at a connection that comes up
constexpr unsigned int kIdleFactor = 5;  // of the ticks while nobody listens
constexpr guint kGroupPause = 100;       // milliseconds, in which the next call of a group comes
constexpr auto kLongestGroup = std::chrono::seconds(1);

// What GetUSBModem asks; the SIM first, since most others need it. What does not change
// is asked once.
using Question = void (*)(USBModem& modem, bool& failed);
constexpr Question kQuestions[] = {
    [](USBModem& modem, bool& failed) { modem.GetPINStatus(failed); },
    [](USBModem& modem, bool& failed) { modem.GetSignalQuality(failed); },
    [](USBModem& modem, bool& failed) { modem.GetDefaultISP(failed); },
    [](USBModem& modem, bool& failed) {
        if (modem.Known().vendor.empty()) {
            modem.GetVendorName(failed);
        }
    },
    [](USBModem& modem, bool& failed) {
        if (modem.Known().product.empty()) {
            modem.GetProductName(failed);
        }
    },
    [](USBModem& modem, bool& failed) {
        if (modem.Known().imsi.empty()) {
            modem.GetIMSI(failed);
        }
    },
    [](USBModem& modem, bool& failed) { failed = modem.PINGetEnableProtection() < 0; },
    [](USBModem& modem, bool& failed) { failed = modem.PINGetAttemptRemain() < 0; },
    [](USBModem& modem, bool& failed) { failed = modem.PUKGetAttemptRemain() < 0; },
    [](USBModem& modem, bool& failed) { modem.GetRoaming(failed); },
};
constexpr size_t kSIMStatus = 0;
// From here on: not asked again once the modem refused, until its state is another; each refusal is
// an error in the log.
constexpr size_t kRefusable = 3;

// Calls a member function of self from the main loop until it returns false.
template <typename Self, bool (Self::*member)()>
gboolean Call(gpointer self) {
    return (static_cast<Self*>(self)->*member)() ? G_SOURCE_CONTINUE : G_SOURCE_REMOVE;
}

}  // namespace

BackgroundLook::BackgroundLook(usbmodem_lib::USBModemList& list, guint refresh,
                               std::function<bool()> isListenedTo, std::function<void()> onAnswer)
    : list_(list),
      refresh_(refresh),
      isListenedTo_(std::move(isListenedTo)),
      onAnswer_(std::move(onAnswer)) {}

BackgroundLook::~BackgroundLook() {
    for (const guint source : {tick_, turn_, link_}) {
        if (source != 0) {
            g_source_remove(source);
        }
    }
    for (auto& [id, modem] : modems_) {
        End(modem, "NotReady", "the service ends");
    }
}

void BackgroundLook::Follow() {
    for (auto modem = modems_.begin(); modem != modems_.end();) {
        const bool isThere = list_.FindUSBModem(static_cast<int>(modem->first)).IsInited();
        if (!isThere) {
            End(modem->second, "NotReady", "the modem does not answer any more");
        }
        modem = isThere ? std::next(modem) : modems_.erase(modem);
    }
    for (const USBModem& record : list_) {
        if (!record.IsInited()) {
            continue;
        }
        Modem& modem = modems_[record.GetIfid()];
        if (TakeState(record, modem) && refresh_ > 0) {
            Begin(modem);
        }
    }
    if (tick_ == 0 && refresh_ > 0 && !modems_.empty()) {
        tick_ = g_timeout_add_seconds(refresh_, Call<BackgroundLook, &BackgroundLook::Tick>, this);
    }
}

// Ends with the last modem.
bool BackgroundLook::Tick() {
    if (modems_.empty()) {
        tick_ = 0;
        return false;
    }
    if (++ticks_ % kIdleFactor == 0 || isListenedTo_()) {
        BeginAll();
    }
    return true;
}

// Whether SIM or connection are in another state than before.
bool BackgroundLook::TakeState(const USBModem& record, Modem& modem) {
    const auto known = record.Known();
    const std::string state = known.simStatus + ' ' + known.netStatus;
    const bool isOther = std::exchange(modem.state, state) != state;
    if (isOther) {
        modem.refused.clear();
    }
    return isOther;
}

void BackgroundLook::LookAtLinks() {
    bool isComingUp = false;
    for (USBModem& record : list_) {
        if (!record.IsInited()) {
            continue;
        }
        constexpr int kComesUp = 2;  // the first look finds the interface, the second its address
        if (record.UpdateNetStatus() == kComesUp) {
            record.UpdateNetStatus();
        }
        isComingUp = isComingUp || record.Known().netStatus == NameOf(NetStatus::kConnecting);
    }
    if (isComingUp && link_ == 0) {
        link_ = g_timeout_add_seconds(
            kLinkPause,
            [](gpointer data) -> gboolean {
                auto* self = static_cast<BackgroundLook*>(data);
                self->link_ = 0;
                self->LookAtLinks();
                return G_SOURCE_REMOVE;
            },
            this);
    }
    onAnswer_();
}

void BackgroundLook::Look(const std::string& id, const ModemObjects::Reply& reply) {
    USBModem& record = list_.FindUSBModem(id);
    if (!record.IsInited()) {
        reply("NotReady", id + " does not answer; its property Answers tells when it does");
    } else if (record.IsUSBModemBusy()) {
        reply("Busy", "the dialler has " + id + ", until its connection is up or has failed");
    } else {
        Modem& modem = modems_[record.GetIfid()];
        modem.waiting.push_back(reply);
        if (!modem.question) {
            Begin(modem);
        }
    }
}

time_t BackgroundLook::LastLook(const USBModem& modem) const {
    const auto known = modems_.find(modem.GetIfid());
    return known == modems_.end() ? 0 : known->second.lastLook;
}

void BackgroundLook::BeginAll() {
    for (auto& [id, modem] : modems_) {
        if (!modem.question) {
            Begin(modem);
        }
    }
}

// One that goes on begins again: what it learnt may be over.
void BackgroundLook::Begin(Modem& modem) {
    modem.question = kSIMStatus;
    modem.isDoubted = false;
    if (turn_ == 0) {
        turn_ = g_idle_add_full(G_PRIORITY_LOW, Call<BackgroundLook, &BackgroundLook::AskNext>,
                                this, nullptr);
        waitsSince_ = Clock::now();
    }
}

void BackgroundLook::GiveWay() {
    if (turn_ != 0 && Clock::now() - waitsSince_ < kLongestGroup) {
        g_source_remove(turn_);
        turn_ = g_timeout_add_full(G_PRIORITY_LOW, kGroupPause,
                                   Call<BackgroundLook, &BackgroundLook::AskNext>, this, nullptr);
    }
}

bool BackgroundLook::AskNext() {
    const auto isLookedAt = [](const auto& modem) { return modem.second.question.has_value(); };
    auto next = std::find_if(modems_.upper_bound(lastAsked_), modems_.end(), isLookedAt);
    if (next == modems_.end()) {
        next = std::find_if(modems_.begin(), modems_.end(), isLookedAt);
    }
    if (next == modems_.end()) {
        turn_ = 0;
        return false;
    }
    lastAsked_ = next->first;
    Ask(list_.FindUSBModem(static_cast<int>(next->first)), next->second);
    onAnswer_();
    waitsSince_ = Clock::now();
    return true;
}

// A modem that leaves a question unanswered may not know it; one that leaves that for the SIM
// status unanswered answers nothing. The record counts that as GetUSBModem does.
void BackgroundLook::Ask(USBModem& record, Modem& modem) {
    if (record.IsUSBModemBusy()) {
        End(modem, "Busy", "the dialler has taken the modem meanwhile");
        return;
    }
    const size_t question = modem.isDoubted ? kSIMStatus : *modem.question;
    bool failed = false;
    const auto begin = Clock::now();
    if (modem.refused.count(question) == 0) {
        kQuestions[question](record, failed);
    }
    const bool isMute = failed && Clock::now() - begin > dbus::kPatience;
    if (isMute && (question == kSIMStatus || record.IsError())) {
        record.IncreaseErrorCounter();
        End(modem, "NotReady", record.GetDevId() + " does not answer any more");
        return;
    }
    if (question == kSIMStatus) {
        TakeState(record, modem);  // what follows is asked in this state
    } else if (failed && question >= kRefusable) {
        modem.refused.insert(question);
    }
    modem.isDoubted = isMute;
    if (question == kSIMStatus && question != *modem.question) {
        return;  // the doubt is over
    }
    if (++*modem.question == std::size(kQuestions)) {
        modem.lastLook = time(nullptr);
        End(modem, "", "");
    }
}

void BackgroundLook::End(Modem& modem, const std::string& error, const std::string& sentence) {
    modem.question.reset();
    modem.isDoubted = false;
    for (const ModemObjects::Reply& reply : std::exchange(modem.waiting, {})) {
        reply(error, sentence);
    }
}

}  // namespace taviwireless::daemon
