// SPDX-License-Identifier: MIT
#ifndef TAVIWIRELESS_CLI_MODEM_MODEM_ACCESS_H
#define TAVIWIRELESS_CLI_MODEM_MODEM_ACCESS_H

#include <functional>
#include <map>
#include <memory>
#include <string>
#include <vector>

#include "cli/command_error.h"
#include "cli/options.h"
#include "usbmodem/rules/profile.h"
#include "usbmodem/rules/status.h"

namespace taviwireless::cli {

namespace profile = usbmodem_lib::profile;

// The connection profile of a SIM: its values by key, all as text.
using Profile = std::map<std::string, std::string>;

// Its keys, in the order in which they are shown, and how they are called in documents; a person
// sets them by that name with "-" for "_". One that is not stored is asked of the modem.
struct ProfileKey {
    const char* name;
    const char* shown;
    const char* title;
    bool isStored = true;
};
constexpr ProfileKey kProfileKeys[] = {
    {profile::kNumber, "number", "Number"},
    {profile::kUser, "user", "User"},
    {profile::kPassword, "password", "Password"},
    {profile::kAPN, "apn", "APN"},
    {profile::kISP, "isp", "ISP"},
    {profile::kLocation, "location", "Location"},
    {profile::kRoaming, "roaming", "Roaming", false},
    {profile::kDefaultGateway, "default_route", "Default route"},
};

// Statuses of a SIM. "no_answer" is that of a modem that is plugged in but not ready for use.
using usbmodem_lib::SimStatus;
constexpr const char* kReady = NameOf(SimStatus::kReady);
constexpr const char* kWantsPIN = NameOf(SimStatus::kPINRequired);
constexpr const char* kWantsPUK = NameOf(SimStatus::kPUKRequired);
constexpr const char* kNoSIM = NameOf(SimStatus::kError);
constexpr char kNoAnswer[] = "no_answer";

// Statuses of a connection that commands look for.
using usbmodem_lib::NetStatus;
constexpr const char* kConnected = NameOf(NetStatus::kConnected);
constexpr const char* kConnecting = NameOf(NetStatus::kConnecting);
constexpr const char* kDisconnected = NameOf(NetStatus::kDisconnected);
constexpr const char* kConnectionLost = NameOf(NetStatus::kConnectionLost);

// What is known of a modem. Texts are as the modem gave them, empty where it gave none.
struct ModemState {
    std::string id;
    std::string vendor;
    std::string product;
    int signal = 0;  // percent
    std::string ip;
    std::string carrier;
    std::string netStatus;
    std::string simStatus = kNoAnswer;
    bool pinProtected = false;
    int pinRemains = -1;  // attempts left; below 0 when not known
    int pukRemains = -1;
    std::string imsi;
    std::string interface;           // of the connection; empty unless connected
    std::vector<std::string> ports;  // device paths: the dialler's, then that of questions
    std::string trend;               // of the signal, drawn
    Profile profile;
};

// "disconnected", or "connection_lost" after failed attempts.
bool IsDisconnected(const std::string& netStatus);

struct Connection {
    std::string status;
    std::string interface;  // empty unless connected
    std::string address;
};

struct Interface {
    std::string id;    // of the modem
    std::string name;  // empty when it is not connected
};

// The way to the modems: through the modem service, or without it. All operations throw
// CommandError; an id that no modem has is kNotFound, whichever operation is asked.
class ModemAccess {
  public:
    // Results of the operations on PIN and PUK.
    static constexpr int kDone = 0;
    static constexpr int kNotAsked = -1;
    static constexpr int kRefused = -2;

    virtual ~ModemAccess() = default;

    // Gets a modem when it is known.
    using OnModem = std::function<void(const ModemState& state)>;

    // All modems that are plugged in, in the order of their numbers, as they are known: a modem
    // that was looked at lately is not asked. Profiles cost a call for each.
    std::vector<ModemState> KnownModems(
        bool withProfiles, const OnModem& onModem = [](const ModemState&) {});
    // Whether KnownModems has modems to ask, which takes about two seconds for each.
    virtual bool HasToAsk() { return true; }
    // One of them, with its profile.
    virtual ModemState Known(const std::string& id) { return Look(id); }
    virtual Connection KnownConnection(const std::string& id) { return LookAtConnection(id); }
    // Returns when what is known may have changed since this was called last, or after a pause.
    virtual void WaitForChange();

    // Asks the modem everything: about two seconds.
    virtual ModemState Look(const std::string& id) = 0;
    virtual Connection LookAtConnection(const std::string& id) = 0;
    // Adds what Look may leave out: IMSI and ports.
    virtual void AddDetails(ModemState& /*state*/) {}
    // The dialler's log of a modem that was looked at; empty when it cannot be told.
    virtual std::string LogFile(const ModemState& state);
    // The network interfaces of the modems that are ready for use. Asks no modem.
    virtual std::vector<Interface> Interfaces() = 0;
    // Sends the modem an AT command, and returns what it answers.
    virtual std::string Command(const std::string& id, const std::string& command) = 0;

    // The operations on PIN and PUK want a modem that was looked at before.
    virtual int EnterPIN(const std::string& id, const std::string& pin) = 0;
    virtual int EnterPUK(const std::string& id, const std::string& puk,
                         const std::string& newPin) = 0;
    // Switches the protection, then changes the PIN unless newPin is empty.
    virtual int SetPIN(const std::string& id, const std::string& pin, const std::string& newPin,
                       bool protection) = 0;

    virtual Profile ReadProfile(const std::string& id) = 0;
    virtual void ChangeProfile(const std::string& id,
                               const std::vector<profile::Setting>& settings) = 0;
    virtual void ResetProfile(const std::string& id) = 0;

    // Start dialling and hanging up; LookAtConnection tells what came of it.
    virtual void Connect(const std::string& id) = 0;
    virtual void Disconnect(const std::string& id) = 0;
    // Disconnect for a program that is about to end: at once, from any thread, and without a word.
    virtual void HangUp(const std::string& id) = 0;

  protected:
    // The modems of KnownModems that can be looked at.
    virtual std::vector<std::string> ReadyModems() = 0;
    // One of these, right after it.
    virtual ModemState ReadyModem(const std::string& id, bool /*withProfile*/) { return Look(id); }
};

std::unique_ptr<ModemAccess> MakeServiceAccess();
std::unique_ptr<ModemAccess> MakeDirectAccess();
std::unique_ptr<ModemAccess> MakeAccess(const Options& options);

// The device id that a person means who may give the number alone: "1" is "usbmodem1".
std::string FullId(const std::string& id);

// Device ids by the info files in "/tmp/"; touches no modem.
std::vector<std::string> PluggedModems();
// The error for a modem that is not among the ready ones: unplugged, unknown or not ready.
CommandError NotReadyError(const std::string& id);
// What failed with a profile, and why as far as that can be told.
CommandError ProfileError(const std::string& whatFailed, bool isSIMReady);

}  // namespace taviwireless::cli

#endif
