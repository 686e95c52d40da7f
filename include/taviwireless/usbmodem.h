// SPDX-License-Identifier: MIT
#ifndef TAVIWIRELESS_USBMODEM_H
#define TAVIWIRELESS_USBMODEM_H

#include <taviwireless/export.h>
#include <taviwireless/semaphore.h>

#include <memory>
#include <string>
#include <vector>

class WvModem;  // WvStreams

namespace Json {
class Value;
}

namespace taviwireless {
class SzHash;
}

namespace taviwireless::usbmodem_lib {

class USBModem_ATIF;
enum class SimStatus : int;
enum class NetStatus : int;

// What is known of a modem without asking it: the last good answer to every question, and what the
// last look at its link found. Texts are as the modem gave them, perhaps with blanks in front and
// not UTF-8; empty: not known.
struct KnownModem {
    std::string vendor;
    std::string product;
    std::string carrier;  // empty while the SIM is not ready
    std::string imsi;
    int signal = 0;              // percent; 0 also while it is not known
    std::string simStatus;       // as GetPINStatus names it
    bool isPINProtected = true;  // true also when that cannot be told
    int pinRemains = -1;         // attempts left for the PIN and the PUK, -1: not known
    int pukRemains = -1;
    bool isRoaming = false;
    std::string netStatus;  // as GetNetStatus names it
    std::string interface;  // network interface and IPv4 address; empty unless connected
    std::string address;
    std::string connectNode;  // device paths of the dial port and the query port
    std::string queryNode;
};

// One plugged-in USB 3G modem: what its info file says, its serial channel and command set, and the
// last good answer to everything that was asked.
//
// Rules for all operations:
// - Nothing throws on a device, file or parse failure; each failure is one line in the system log.
// - An int result is 0 for success and -1 for failure where nothing else is said.
// - A bool& err is only ever set to true; the caller clears it before the call. GetDefaultLocation
//   alone also sets it to false, when it could look the operator up. With err set, the text
//   returned is the last good value, which may be empty, where nothing else is said.
// - "The SIM is ready" means: it was ready when it was last asked. UpdateSIMStatus asks, and so do
//   InitInfo and the PIN operations at their end. A record that has not asked yet is not ready.
// - "Busy" is the time from NetConnect until UpdateNetStatus sees the link settled: the dialler
//   uses the modem then. Nothing is sent, and queries give what they last knew.
// - Operations that talk to the modem send through the open channel (OpenFileDevice) with the
//   command set (SetATInterface); InitInfo sees to both. Each command takes at least 300 ms.
// - A record belongs to one thread at a time. The modem's semaphore keeps processes apart.
//
// The info file is a key/value file written at hot-plug, "/tmp/usbmodem.info" and the interface id:
//   USB_ID_VENDOR  USB vendor id, four lowercase hexadecimal digits
//   CONNECTNODE    number k of the dial port "/dev/ttyUSBk"
//   DEVICENODE     numbers of all serial ports of the modem, separated by ","
// Nothing is read from it unless it is a regular file of root or of the own user, of 64 KB at most.
class TAVIWIRELESS_API USBModem {
  public:
    // Makes a record with nothing known yet. Touches no file and no device.
    // interfaceId: the number in the info file's name, and the key of the modem's semaphore.
    // infoPath: the info file. It need not exist yet.
    USBModem(unsigned int interfaceId, const std::string& infoPath);

    // Copies what identifies the modem and its state, but not the names read from it: query node,
    // pid file, vendor and product name, IMSI, default ISP and APN, interface name and local
    // address are empty in the copy. Copies share the open channel and the command set; each is
    // released once, with the last record that holds it.
    USBModem(const USBModem& other);
    // Assignment copies everything, and shares the channel and the command set as a copy does.
    USBModem& operator=(const USBModem& other);
    // Moving loses nothing; the source is left without channel and command set.
    USBModem(USBModem&& other) noexcept;
    USBModem& operator=(USBModem&& other) noexcept;

    // Closes the channel, unless another record shares it. A running connection goes on.
    virtual ~USBModem();
    // The device id, by which clients name the modem: "usbmodem" and the interface id.
    virtual std::string GetDevId() const;
    // Whether this is the null object, which a lookup returns that found no modem.
    virtual bool IsNull() const;
    // True once InitInfo succeeded; false again after one that failed.
    virtual bool IsInited() const;
    // True while the info file exists, that is, while the modem is plugged in.
    virtual bool IsInfoExist() const;

    // The interface id: the number in the names of the modem's files.
    unsigned int GetIfid() const;
    // True from the sixth counted error on. A modem that does not stop talking when it is to be
    // asked something is one at once.
    bool IsError();
    // Counts one error and returns the new count. Nothing sets the count back.
    int IncreaseErrorCounter();
    // Whether a dialler has the modem; see "busy" above.
    bool IsUSBModemBusy();
    // All that the queries below last gave. Sends nothing, and looks at no file and no link.
    KnownModem Known() const;
    // True until SetNotNewPlugIn, PINSet, PINUnlock, ChangePINWithPUK, PUKSet, NetConnect or
    // NetDisconnect, whether these succeed or not.
    bool IsNewPlugIn();
    void SetNotNewPlugIn();
    // How often NetConnect has failed since the link was last seen connected.
    int GetConnectFailedAttempt();
    // Network interface, such as "ppp0", and local IPv4 address of the connection; empty unless
    // the link was connected when it was last looked at. Neither looks again nor sets err.
    std::string GetNetIFName(bool& err);
    std::string GetNetLocalIP(bool& err);

    // Makes a new record usable: chooses the command set, finds both ports (three attempts each,
    // one second apart), sets full functionality, silences unsolicited reports and reads the SIM
    // status, whose state does not matter. Returns 0; on failure -1 with the channel closed, and
    // the record may be initialised again.
    int InitInfo();

    // InitInfo for a modem of which another process has found out that it answers on queryNode, a
    // device path such as GetQueryNode returns: no port is searched and nothing is tried twice, so
    // that the caller is not kept waiting.
    int InitInfo(const std::string& queryNode);
    // InitInfo for another process, which is not to be kept waiting by a modem that does not answer:
    // nothing is tried twice, the dial port is not tested, and a SIM that was ready where the query
    // port was found is not asked whether it is. Fails also when the SIM cannot be told: its IMSI
    // is not read although it is ready, unless it is known from the dialler that runs.
    // findings: set on success only: for TakeOver in the other process, once this record is gone.
    int MakeReady(std::string& findings);
    // InitInfo by what MakeReady found in another process: opens the query port, and asks nothing.
    int TakeOver(const std::string& findings);
    // The query port's device path; empty while none was found.
    std::string GetQueryNode() const;
    // Whether the query port is open and still the one that its path names: false once it hung up,
    // as it does when the modem is unplugged or reset. Sends nothing.
    bool IsPortAlive() const;

    // Chooses the command set by USB_ID_VENDOR, the generic one if that is unknown or missing.
    void SetATInterface();
    // Lets the command set go. The generic one is then used.
    void UnsetATInterface();
    // Takes the dial port from CONNECTNODE. Its test with the SIM status query is advisory: a port
    // that does not answer is taken with a warning. Closes the channel. Fails when CONNECTNODE
    // cannot be read.
    int AssignConnectNode();
    // Takes as query port the first of DEVICENODE, the dial port aside, that answers the SIM status
    // query, and leaves the channel open on it.
    int AssignQuaryNode();
    // Reads the network interface name from the dialler's log,
    // "/var/lib/usbmodem/wvdial.log." and the IMSI that this record knows. Returns 1 when it was
    // read, 2 while the link is still coming up, -1 when the log cannot be read or the dialler is
    // disconnecting. What the modem answered to the dialler's commands ("--> Sending: ") names no
    // interface, and neither does a word that is more than letters, digits, "_", "." and "-".
    int AssignConnectInfo();

    // Opens the serial port at the device path node: 9600 baud, hardware flow control. Fails when
    // another process has it: by a lock file in "/var/lock" that root or the own user wrote and
    // whose process lives, or by flock on the port itself; leaves both behind for others. A channel
    // that is open already is replaced but stays open until CloseFileDevice.
    int OpenFileDevice(const std::string& node);
    // Closes the record's channel, if it is open. Records that share it keep it.
    void CloseFileDevice();
    // Ends a half-typed command line in the modem with five carriage returns, and discards input
    // until 100 ms pass without any. Fails when no channel is open, or when the modem is not quiet
    // within 1 s.
    int DrainDeviceBuffer();
    // Sends one AT command and collects the reply, under the modem's semaphore.
    //
    // cmd: the command, without its end; a carriage return is sent behind it. Not empty, and not
    //   longer than 1024 bytes.
    // reply: set on success only: the lines of the reply, each ended by a line feed, without blank
    //   lines and lines that repeat cmd, and without a line that was cut off before its end.
    //   What a modem sends behind a carriage return without a line feed stands in front of the
    //   next line. Whether it reported an error is for the caller to see: that is a reply too.
    //
    // The modem is drained first. A reply ends when 200 ms pass without input, after 2 s or 1024
    // bytes. Returns -1 when no reply begins within 1000 ms, when the modem is not quiet before it,
    // when it is unplugged within a line, or when the semaphore is not free within 5 s. A call
    // takes 9 s at most. PINs and PUKs in the command are not logged. With TAVIWIRELESS_TRACE in the
    // environment, command and reply are in the log at debug priority, these codes masked.
    int ModemCmd(const std::string& cmd, std::string& reply);
    // Opens the port at node, sends cmd and prints the dialogue on standard output, codes masked.
    // Returns -1 when the port cannot be opened, else the result of ModemCmd. Closes the channel.
    int TestATCmd(const std::string& cmd, const std::string& node);

    // SIM and PIN (3GPP TS 27.007: +CPIN 8.3, +CLCK 7.4, +CPWD 7.5).
    //
    // Operations that change something return 0 when it is done or need not be, -1 when it was
    // refused or could not be sent, -2 when the modem did not answer OK, 2 when busy. A code with a
    // quote, comma, semicolon or control character is refused before anything is sent: it would end
    // its place in the command. PINSet, PINUnlock, ChangePINWithPUK and PUKSet end with
    // UpdateSIMStatus. A wrong code costs one of the SIM's attempts.

    // Asks for the SIM status, unless busy. Returns 1 ready, 0 PIN or PUK required, 2 SIM busy or
    // error, which a missing SIM is, too; -1 unknown, also when the modem did not answer.
    int UpdateSIMStatus();
    // UpdateSIMStatus and the name of the status: "ready", "pin_protect", "puk_protect" or
    // "no_sim". A status that is not known gives "no_sim" with err.
    std::string GetPINStatus(bool& err);
    // Whether the SIM was ready when it was last asked; sends nothing. err is set when it was
    // neither ready nor waiting for a PIN or PUK.
    bool IsPINReady(bool& err);
    // Whether the SIM is protected by a PIN: 1 yes, 0 no (and while busy), -1 failure. A SIM that
    // waits for its PIN is protected, also where the modem refuses the question for that reason.
    int GetPINEnable();
    // GetPINEnable under the name that front ends know.
    int PINGetEnableProtection();
    // Switches PIN protection on or off, unless it is so already; the SIM must be ready.
    int ChangePINEnable(const std::string& pin, bool enable);
    // Changes the PIN; the SIM must be ready. Neither PIN may be empty.
    int ChangePIN(const std::string& oldPin, const std::string& newPin);
    // ChangePINEnable, then ChangePIN from pin to newPin unless newPin is empty. Returns the first
    // result that is not 0.
    int PINSet(const std::string& pin, const std::string& newPin, bool enable);
    // Enters the PIN. A SIM that answers that it is ready needs none: 0, and the code is not sent.
    int PINUnlock(const std::string& pin);
    // Sets a new PIN with the PUK; the SIM must have been waiting for its PUK when last asked.
    int ChangePINWithPUK(const std::string& puk, const std::string& newPin);
    // ChangePINWithPUK under the name that front ends know.
    int PUKSet(const std::string& puk, const std::string& newPin);
    // Attempts left to enter the PIN or the PUK, or -1. The last known number, 0 at first, when
    // busy, or when the SIM is busy, missing or unknown.
    int PINGetAttemptRemain();
    int PUKGetAttemptRemain();

    // Information (in parentheses: the command and its section of 3GPP TS 27.007). When busy, each
    // gives what it last knew.

    // The access point name of the modem's first PDP context (+CGDCONT, 10.1.1). The SIM must be
    // ready, or err is set.
    std::string GetDefaultAPN(bool& err);
    // The name of the operator that the modem is registered with (+COPS, 7.3). Empty, without err,
    // while the SIM is not ready.
    std::string GetDefaultISP(bool& err);
    // The location of the operator by the APN database, empty when it is not listed. Also empty,
    // and without err, while the SIM is not ready; empty with err when the operator or the database
    // cannot be read.
    std::string GetDefaultLocation(bool& err);
    // "true" or "false" (+CREG, 7.2). Asked only while connected, whatever the SIM; "false" at
    // first.
    std::string GetRoaming(bool& err);
    // The SIM's subscriber identity (+CIMI, 5.6): 6 to 15 digits, perhaps with blanks in front; any
    // other answer is a failure. The SIM must be ready, or err is set.
    std::string GetIMSI(bool& err);
    // The modem's model (+CGMM, 5.2) and maker (+CGMI, 5.1), perhaps with blanks in front. They
    // need no SIM.
    std::string GetProductName(bool& err);
    std::string GetVendorName(bool& err);
    // Asks for the signal strength (+CSQ, 8.5) and keeps it for GetSignalQuality; 0 also when there
    // was nothing to ask: when busy or while the SIM is not ready.
    int GetRSSI();
    // Signal strength in percent of the scale of +CSQ (0 to 31); 0 when the modem does not know it
    // (99) and, without err, while the SIM is not ready. Asks first.
    int GetSignalQuality(bool& err);
    // Sets +CFUN (8.2) to level ("1": full functionality). 0 also when the modem does not know
    // +CFUN; 2 when busy.
    int SetHardwareFuncLvl(const std::string& level);
    // Switches unsolicited reports on or off. 0 also when the command set or the modem cannot; 2
    // when busy.
    int SetUnsolicitedReports(bool enable);
    // Reads the APN database "/usr/tavi/etc/usbmodem/wcdma_list.json" into out: an array of
    // {"id": LOCATION, "isp": [{"name": OPERATOR}, ...]}. Returns false, with out untouched, when
    // the file cannot be read or is not JSON.
    bool ReadAPNData(Json::Value& out);

    // Profile: what a connection of this SIM needs, kept in the section "USBModem Profile" of
    // "/var/lib/usbmodem/usbmodem.profile." and the IMSI. The file has mode 0600, since it holds
    // the password; a new SIM gets one with defaults at its first read or write.
    //   number "*99#"   user, pass "Unknown"   IMSI   default_gw "false"
    //   location, apn   of the modem           isp    operator, and " - " and the APN
    // Refused, with the reason in the log, is a value that would not come back as it went in (of
    // 1024 bytes or more, or with a line break or a zero byte), and an APN or number that would end
    // its place in the modem's command (with a control character or a quote; a number with a
    // semicolon too).

    // Finds the SIM's file by asking for the IMSI and replaces it by one with defaults; of these,
    // what would be refused is left empty. When that fails the old file stays.
    int ResetProfile();
    // ResetProfile under the name that front ends know.
    int SetProfileToDefault();
    // Makes sure that there is a file, which is not empty, with mode 0600. A file once found is
    // kept although the SIM may have changed since; only ResetProfile looks again.
    int InitProfile();
    // Sets one key of the profile; any key is taken.
    int SetProfileWithKey(const std::string& key, const std::string& value);
    // Reads one key of the profile. Empty, without err, when the SIM is busy or missing, or when
    // there is no profile and none can be made; empty with err when the profile lacks the key. A
    // SIM of unknown status sets err, but the value is read.
    std::string GetProfileWithKey(const std::string& key, bool& err);
    // Reads several keys at once, which takes no longer than one: their values in this order, each
    // as GetProfileWithKey returns it.
    std::vector<std::string> GetProfileWithKeys(const std::vector<std::string>& keys, bool& err);

    // One key each, by SetProfileWithKey and GetProfileWithKey.
    // "number": what the modem dials.
    int SetProfilePhone(const std::string& number);
    std::string GetProfilePhone(bool& err);
    // "user": the name for the provider's login.
    int SetProfileUsername(const std::string& user);
    std::string GetProfileUsername(bool& err);
    // "pass": the password for the provider's login, as clear text.
    int SetProfilePassword(const std::string& password);
    std::string GetProfilePassword(bool& err);
    // "apn": the access point name. While it is empty, NetConnect takes the modem's own.
    int SetProfileAPN(const std::string& apn);
    std::string GetProfileAPN(bool& err);
    // "isp" and "location": what the user chose in a front end. Nothing here uses them.
    int SetProfileISP(const std::string& isp);
    std::string GetProfileISP(bool& err);
    int SetProfileLocation(const std::string& location);
    std::string GetProfileLocation(bool& err);
    // "default_gw". "true": the connection takes the default route; anything else: it does not.
    int SetProfileDefaultGW(const std::string& flag);
    std::string GetProfileDefaultGW(bool& err);
    // "IMSI": of the SIM that the profile was made for.
    std::string GetProfileIMSI(bool& err);

    // Connection: the dialler "/usr/tavi/bin/wvdial" runs as a process of its own, known by its pid
    // file "/var/lib/usbmodem/usbmodem.pid." and the interface id, with its log in
    // "/var/lib/usbmodem/wvdial.log." and the IMSI. So any process can ask about a connection, or
    // end it. The state of the link is derived anew at every look: is the dialler alive, what does
    // its log say, has the interface an address?

    // Starts the dialler with the settings of the profile, and makes the modem busy until
    // UpdateNetStatus sees the link settle. Loads the PPP modules, empties the dialler's log, and
    // sees to the default route: with the profile's "default_gw" "true" the link may take it, and
    // the gateway in force is saved. Returns 1 when the dialler was started; below 0 on failure,
    // which counts as a failed attempt: the SIM is not ready, there is a connection already, the
    // profile cannot be read or holds a value that is refused, there is no gateway to save, ...
    int NetConnect();
    // Ends the dialler (SIGTERM), and gives the default route back if the profile says that the
    // link took it. Returns -1 when there is no dialler, or the route could not be given back.
    int NetDisconnect();
    // Learns from files alone which connection this modem has, for a record that did not dial it:
    // the SIM by the name of the running dialler's log, and with it profile and interface. Returns
    // 1 when that is known, 0 when there is no dialler, -1 when the SIM cannot be told.
    int RecallConnection();
    // Ends what is left of the connection of a modem that was unplugged or reset, from files alone:
    // the dialler, its pid file, and the default route that the link took. The route is given back
    // also when the dialler has ended by itself. Closes the channel; the record is of no use
    // afterwards. Returns 0, also when there was no connection; -1 when the route could not be
    // given back.
    int EndConnection();
    // Looks at the link. Returns 1 when it is settled (up, down or lost: the modem is not busy any
    // more), 2 while it comes up, -1 on error. A dialler that gives up while it connects is ended.
    int UpdateNetStatus();
    // Looks at the link and names its state: "connected", "connecting" (also when the address was
    // lost while the dialler runs), "disconnected", or "connection_lost" when there is no dialler
    // after failed attempts; empty with err set on failure.
    std::string GetNetStatus(bool& err);
    // Looks at the link: whether it is disconnected or lost, so that NetConnect may dial. False
    // with err when that cannot be told.
    bool IsNetDisconnected(bool& err);
    // Looks at the link; -1, with the state as it was, when the pid file cannot be opened although
    // there is one, for want of descriptors for instance.
    int GetLinkStats();
    // Reads the address of the connection's interface; 0 also when there is none.
    int UpdateIP();

    // Removes the line "nodefaultroute" from "/etc/ppp/peers/wvdial" and adds it again, unless flag
    // is "true". Fails for an empty flag and when the file cannot be read or replaced.
    int SetDefaultRoute(const std::string& flag);
    // Saves the default gateway in force in "/etc/ppp/usbmodem_backup_gw"; -1 when there is none
    // or the file cannot be made.
    int BackupDefaultRoute();
    // Sets the saved gateway again, that of "/tmp/pppoe_gw_backup" if root or the own user has put
    // a regular file there; if it cannot be set, the configured one. Fails when
    // "/etc/ppp/usbmodem_backup_gw" does not exist or what was saved is no address.
    int RestoreDefaultRoute();
    // Loads slhc, ppp_generic and ppp_async from "/lib/modules" with "/sbin/insmod". Returns the
    // wait status of the last insmod, 0 for success; a module that is loaded already is a failure.
    int InsertPPPModules();
    // Runs program detached: in a session of its own, with its standard error going to
    // logFile (created with mode 0600), its pid in pidFile, and no other descriptor of the
    // caller. Its arguments are init1, init2, baud, phone, modem, username and password, each in
    // the dialler's form "Key=value", and "Dial Attempts=1", "Auto Reconnect=1", "Stupid Mode=1".
    // Returns 1 once the pid file is written, -1 when there is no process. A program that cannot be
    // run says so in the log; without a pid file, by which it could be ended, it is not run.
    int BackgroundExec(const std::string& program, const std::string& init1,
                       const std::string& init2, const std::string& baud, const std::string& modem,
                       const std::string& phone, const std::string& username,
                       const std::string& password, const std::string& pidFile,
                       const std::string& logFile);
    // Writes what is known of the modem into the key/value file
    // "/var/lib/usbmodem/usbmodem.conf." and the interface id: InterfaceID, ConnectUSB, QuaryUSB,
    // PINVerified (the SIM status code), isConnected and PidFile. Looks at the link. Returns 0.
    int TestConfToFile();

  private:
    struct DialSettings;

    enum InitState { kNotInited, kInited, kInitFailed };

    using Command = std::string (USBModem_ATIF::*)();
    using Parser = int (USBModem_ATIF::*)(const std::string& reply, std::string& result);

    USBModem_ATIF& CommandSet() const;
    bool FindPortsAndPrepare();
    bool Prepare();
    int CompleteInit(bool isPrepared);
    int FailInit();
    void AskForSIM();
    bool ReadConnectNode();
    bool TryQueryNode(const std::string& node, std::string& reply);
    bool FindQueryNode(std::string& reply);
    bool KnowsItsSIM();
    bool Open(const std::string& node, std::string& error);
    int Exchange(const std::string& cmd, std::string& reply);
    int QuerySIMStatus(std::string& reply);
    int EnterPIN(const std::string& pin);
    int EnterPUK(const std::string& puk, const std::string& newPin);
    int AttemptRemain(Parser parser, int& cache);
    bool ComputeProfilePath();
    bool FillDefaults(SzHash& profile);
    std::string PidFilePath() const;
    bool PrepareToDial(DialSettings& settings);
    void ReadDialSettings(DialSettings& settings, bool& err);
    bool Refresh(Command command, Parser parser, std::string& cache,
                 void (*logParseFailure)(const char* reply));

    unsigned int interfaceId_;
    int initState_ = kNotInited;
    SimStatus simStatus_;
    NetStatus netStatus_;
    std::string infoPath_;
    std::string connectNode_;
    std::string queryNode_;
    std::string pidFile_;
    int connectFailedAttempts_ = 0;
    int rssi_ = 0;
    int pinAttemptsRemaining_ = 0;
    int pukAttemptsRemaining_ = 0;
    std::string vendorName_;
    std::string productName_;
    std::string imsi_;
    std::string roaming_ = "false";
    std::string defaultISP_;
    std::string defaultAPN_;
    std::string netIFName_;
    std::string netLocalIP_;
    std::string profilePath_;
    semaphore::Semaphore semaphore_;
    bool busy_ = false;
    bool newPlugIn_ = true;
    signed char pinProtection_ = -1;  // the last result of GetPINEnable; was padding once
    int errorCounter_ = 0;
    std::shared_ptr<WvModem> device_;
    std::shared_ptr<USBModem_ATIF> atInterface_;
    std::vector<std::shared_ptr<WvModem>> replacedDevices_;
};

// The null object: what a lookup returns that found no modem. It has no device id and is never
// initialised; its operations fail as those of a modem without a channel.
class TAVIWIRELESS_API USBModemNull : public USBModem {
  public:
    // None of these looks at a file or a device.
    USBModemNull();
    ~USBModemNull() override;
    std::string GetDevId() const override;
    bool IsNull() const override;
    bool IsInited() const override;
    bool IsInfoExist() const override;
};

}  // namespace taviwireless::usbmodem_lib

#endif
