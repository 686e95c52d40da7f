// SPDX-License-Identifier: MIT
#include "daemon/served_modems.h"

#include <syslog.h>
#include <unistd.h>

#include <algorithm>
#include <cerrno>
#include <stdexcept>
#include <system_error>
#include <utility>

#include "daemon/semaphore_sets.h"
#include "usbmodem/rules/paths.h"

namespace taviwireless::daemon {

namespace {

using namespace usbmodem_lib;

constexpr bool kEachWriting = true;
constexpr guint kLookPause = 5;  // seconds between looks for dead ports

std::string FileName(const std::string& path) {
    return path.substr(path.rfind('/') + 1);
}

// The methods are served all the same when the objects cannot be.
std::unique_ptr<ModemObjects> MakeObjects(ModemObjects::OnLook onLook,
                                          ModemObjects::OnCommand onCommand) {
    try {
        return std::make_unique<ModemObjects>(std::move(onLook), std::move(onCommand));
    } catch (const std::runtime_error& error) {
        syslog(LOG_WARNING, "the modems are not shown as objects: %s", error.what());
        return nullptr;
    }
}

bool HasControlCharacter(const std::string& text) {
    return std::any_of(text.begin(), text.end(),
                       [](unsigned char c) { return c < ' ' || c == 0x7F; });
}

}  // namespace

ServedModems::ServedModems(USBModemList& list, unsigned int refresh)
    : list_(list),
      objects_(MakeObjects([this](const auto& id, const auto& reply) { look_.Look(id, reply); },
                           [this](const auto& id, const auto& command, const auto& reply) {
                               Command(id, command, reply);
                           })),
      look_(
          list, objects_ ? refresh : 0, [this] { return objects_->HasClients(); },
          [this] { Update(); }),
      keeper_(list, [this] { look_.LookAtLinks(); }),
      infoFiles_(kInfoDirectory, {kInfoName}, !kEachWriting, [this] { keeper_.Rescan(); }),
      // The dialler's log is closed when it ends.
      stateFiles_(kStateDirectory, {FileName(kPidFilePrefix), FileName(kDialLogPrefix)},
                  kEachWriting, [this] { look_.LookAtLinks(); }),
      network_([this] { look_.LookAtLinks(); }) {
    if (!infoFiles_.Begin()) {
        throw std::system_error(errno, std::generic_category(), "cannot watch /tmp/");
    }
}

ServedModems::~ServedModems() {
    if (deadPorts_ != 0) {
        g_source_remove(deadPorts_);
    }
}

void ServedModems::Begin() {
    ModemKeeper::EndOrphanedConnections();
    keeper_.Rescan();
}

void ServedModems::HasServed() {
    keeper_.LookAfterModems();
    look_.LookAtLinks();
    look_.GiveWay();
}

void ServedModems::Command(const std::string& id, const std::string& command,
                           const ModemObjects::Reply& reply) {
    USBModem& modem = list_.FindUSBModem(id);
    std::string answer;
    if (command.empty() || HasControlCharacter(command)) {
        reply("BadCommand", "a command has characters, and no control characters");
    } else if (!modem.IsInited()) {
        reply("NotReady", id + " does not answer; its property Answers tells when it does");
    } else if (modem.IsUSBModemBusy()) {
        reply("Busy", "the dialler has " + id + ", until its connection is up or has failed");
    } else if (modem.ModemCmd(command, answer) != 0) {
        reply("NotReady", id + " did not answer the command");
    } else {
        reply("", answer);
    }
    HasServed();
}

// After everything that may have changed a record. Ports are not looked at: when a link goes because
// its modem does, the dialler would be ended while it still puts the name servers back.
void ServedModems::Update() {
    RemovePrivateSemaphoreSets(getpid());
    look_.Follow();
    stateFiles_.Begin();  // the folder may come with the first connection
    if (deadPorts_ == 0 && list_.begin() != list_.end()) {
        deadPorts_ = g_timeout_add_seconds(
            kLookPause,
            [](gpointer self) -> gboolean {
                return static_cast<ServedModems*>(self)->FindDeadPorts() ? G_SOURCE_CONTINUE
                                                                         : G_SOURCE_REMOVE;
            },
            this);
    }
    if (!objects_) {
        return;
    }
    std::vector<ModemState> states;
    for (const USBModem& modem : list_) {
        states.push_back(StateOf(modem, look_.LastLook(modem)));
    }
    objects_->Publish(states);
}

// False when there are no modems any more.
bool ServedModems::FindDeadPorts() {
    if (list_.begin() == list_.end()) {
        deadPorts_ = 0;
        return false;
    }
    keeper_.LookAfterModems();
    return true;
}

}  // namespace taviwireless::daemon
