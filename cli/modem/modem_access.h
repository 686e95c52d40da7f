#ifndef TAVIWIRELESS_CLI_MODEM_MODEM_ACCESS_H
#define TAVIWIRELESS_CLI_MODEM_MODEM_ACCESS_H

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

// Its keys, in the order in which they are shown. One that is not stored is asked of the modem.
struct ProfileKey {
    const char* name;
    const char* title;
    bool isStored = true;
};
constexpr ProfileKey kProfileKeys[] = {
    {profile::kNumber, "Number"},
    {profile::kUser, "User"},
    {profile::kPassword, "Password"},
    {profile::kAPN, "APN"},
    {profile::kISP, "ISP"},
    {profile::kLocation, "Location"},
    {profile::kRoaming, "Roaming", false},
    {profile::kDefaultGateway, "Default route"},
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

    // All modems that are plugged in, in the order of their numbers, as they are known: a modem
    // that was looked at lately is not asked. Profiles cost a call for each.
    std::vector<ModemState> KnownModems(bool withProfiles);
    // One of them, with its profile.
    virtual ModemState Known(const std::string& id) { return Look(id); }
    virtual Connection KnownConnection(const std::string& id) { return LookAtConnection(id); }
    // Returns when what is known may have changed since this was called last, or after a pause.
    virtual void WaitForChange();

    // Asks the modem everything: about two seconds.
    virtual ModemState Look(const std::string& id) = 0;
    virtual Connection LookAtConnection(const std::string& id) = 0;
    // The network interfaces of the modems that are ready for use.
    virtual std::vector<Interface> Interfaces() = 0;

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

  protected:
    // The modems of KnownModems that can be looked at.
    virtual std::vector<std::string> ReadyModems() = 0;
    // One of these, right after it.
    virtual ModemState ReadyModem(const std::string& id, bool /*withProfile*/) { return Look(id); }
};

std::unique_ptr<ModemAccess> MakeServiceAccess();
std::unique_ptr<ModemAccess> MakeDirectAccess();
std::unique_ptr<ModemAccess> MakeAccess(const Options& options);

// Helpers of the implementations of ModemAccess.

// Device ids by the info files in "/tmp/"; touches no modem.
std::vector<std::string> PluggedModems();
// The error for a modem that is not among the ready ones: unplugged, unknown or not ready.
CommandError NotReadyError(const std::string& id);
CommandError ProfileUnreadableError(const std::string& id);

}  // namespace taviwireless::cli

#endif
