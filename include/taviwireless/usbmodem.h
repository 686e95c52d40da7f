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

// One plugged-in USB 3G modem: what its info file says, its serial channel and command set, and the
// last good answer to everything that was asked.
//
// Conventions of all operations:
// - Nothing throws on a device, file or parse failure; each failure is one line in the system log.
// - An int result is 0 for success and -1 for failure where nothing else is said.
// - A bool& err is only ever set to true; the caller clears it before the call. Only
//   GetDefaultLocation also sets it to false, when it could look the operator up. With err the text
//   returned is the last good value, which may be empty, where nothing else is said.
// - "The SIM is ready" means: was so when it was last asked (UpdateSIMStatus, and what ends with
//   it). A new record has not asked yet; InitInfo does.
// - "Busy" is the time in which a dial-up connection owns the modem: nothing is sent, and queries
//   give what they last knew.
// - Operations that talk to the modem send through the open channel (OpenFileDevice) with the
//   command set (SetATInterface); InitInfo sees to both. Each costs at least 300 ms.
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
    USBModem(unsigned int interfaceId, const std::string& infoPath);

    // Copies what identifies the modem and its state, but not the names read from it: query node,
    // PID file, vendor and product name, IMSI, default ISP and APN, interface name and local IP are
    // empty in the copy. Copies share the open channel and the command set; each is released once,
    // with the last record that holds it.
    USBModem(const USBModem& other);
    // Assignment copies everything and shares the channel and the command set likewise.
    USBModem& operator=(const USBModem& other);
    // Moving loses nothing; the source is left without channel and command set.
    USBModem(USBModem&& other) noexcept;
    USBModem& operator=(USBModem&& other) noexcept;

    virtual ~USBModem();
    // The device id, by which clients name the modem: "usbmodem" and the interface id.
    virtual std::string GetDevId() const;
    virtual bool IsNull() const;
    // True once InitInfo succeeded.
    virtual bool IsInited() const;
    // True while the info file exists, that is, while the modem is plugged in.
    virtual bool IsInfoExist() const;

    unsigned int GetIfid() const;
    // True from the sixth counted error on. A modem that does not stop talking when it is to be
    // asked something is one at once.
    bool IsError();
    // Counts one error and returns the new count.
    int IncreaseErrorCounter();
    bool IsUSBModemBusy();
    // True until SetNotNewPlugIn, PINSet, PINUnlock, ChangePINWithPUK, PUKSet, NetConnect or
    // NetDisconnect, whether these succeed or not.
    bool IsNewPlugIn();
    void SetNotNewPlugIn();
    int GetConnectFailedAttempt();
    // Network interface and local address of the running connection; empty when there is none.
    std::string GetNetIFName(bool& err);
    std::string GetNetLocalIP(bool& err);

    // Makes a new record usable: chooses the command set, finds both ports (three attempts each,
    // one second apart), sets full functionality, silences unsolicited reports and reads the SIM
    // status, whose state does not matter. Returns 0; on failure -1 with the channel closed, and
    // the record may be initialised again.
    int InitInfo();

    // The same when another process has found out that queryNode answers, as GetQueryNode told it:
    // no port is searched and nothing is tried twice, so that the caller is not kept waiting.
    int InitInfo(const std::string& queryNode);
    // The query port's device path; empty while none was found.
    std::string GetQueryNode() const;
    // Whether the query port is open and still the one that its path names: false once it hung up,
    // as it does when the modem is unplugged or reset. Sends nothing.
    bool IsPortAlive() const;

    // Chooses the command set by USB_ID_VENDOR, the generic one if that is unknown or missing.
    void SetATInterface();
    void UnsetATInterface();
    // Takes the dial port from CONNECTNODE. Its test with the SIM status query is advisory: a port
    // that does not answer is taken with a warning. Fails when CONNECTNODE cannot be read.
    int AssignConnectNode();
    // Takes as query port the first of DEVICENODE, the dial port aside, that answers the SIM status
    // query, and leaves the channel open on it.
    int AssignQuaryNode();
    // Reads the network interface name from the dialler's log,
    // "/var/lib/usbmodem/wvdial.log." and the IMSI. Returns 1 when it was read, 2 while the link is
    // still coming up, -1 when the log cannot be read or the dialler is disconnecting. What
    // the modem answered to the dialler's commands ("--> Sending: ") names no interface.
    int AssignConnectInfo();

    // Opens the serial port at the device path node: 9600 baud, hardware flow control. Fails when
    // another process has it: by a lock file in "/var/lock" that root or the own user wrote and
    // whose process lives, or by flock on the port itself; leaves both behind for others. A channel
    // that is open already is replaced but stays open until CloseFileDevice.
    int OpenFileDevice(const std::string& node);
    // Closes the record's channel, if it is open.
    void CloseFileDevice();
    // Ends a half-typed command line in the modem and discards input until 100 ms pass without any.
    // Fails when no channel is open, or when the modem is not quiet within 1 s.
    int DrainDeviceBuffer();
    // Sends cmd and a carriage return under the modem's semaphore and collects the reply, at most
    // 1024 bytes, until 200 ms pass without any or 2 s are over; -1 when none begins within 1000
    // ms, when the modem is not quiet before it, or when it is unplugged within a line. reply then
    // holds its lines, each ended by a line feed, without blank lines and lines that repeat cmd. A
    // line that was cut off before its end is dropped. Whether the modem reported an error is for
    // the caller to see: that is a reply too. With the wait for the semaphore a call takes 9 s at
    // most.
    int ModemCmd(const std::string& cmd, std::string& reply);
    // Opens the port at node, sends cmd and prints the dialogue on standard output. Returns -1 when
    // the port cannot be opened, else the result of ModemCmd. Closes the channel.
    int TestATCmd(const std::string& cmd, const std::string& node);

    // SIM and PIN. The operations that change something return 0 when it is done or need not be,
    // -1 when it was refused or could not be sent, -2 when the modem did not answer OK, 2 when
    // busy. A code with a quote, comma, semicolon or control character is refused before anything
    // is sent: it would end its place in the command. PINSet, PINUnlock, ChangePINWithPUK and
    // PUKSet end with UpdateSIMStatus.

    // Asks for the SIM status, unless busy. Returns 1 ready, 0 PIN or PUK required, 2 SIM busy or
    // error, -1 unknown.
    int UpdateSIMStatus();
    // UpdateSIMStatus and the name of the status: "ready", "pin_protect", "puk_protect" or
    // "no_sim". err is set when the status is not known.
    std::string GetPINStatus(bool& err);
    // Whether the SIM was ready when it was last asked; sends nothing. err is set when it was
    // neither ready nor waiting for a PIN or PUK.
    bool IsPINReady(bool& err);
    // Whether the SIM is protected by a PIN: 1 yes, 0 no (and while busy), -1 failure.
    int GetPINEnable();
    int PINGetEnableProtection();
    // Switches PIN protection; the SIM must be ready.
    int ChangePINEnable(const std::string& pin, bool enable);
    // Changes the PIN; the SIM must be ready.
    int ChangePIN(const std::string& oldPin, const std::string& newPin);
    // ChangePINEnable, then ChangePIN unless newPin is empty.
    int PINSet(const std::string& pin, const std::string& newPin, bool enable);
    // Enters the PIN, unless the SIM is ready already.
    int PINUnlock(const std::string& pin);
    // Sets a new PIN with the PUK; the SIM must be waiting for its PUK.
    int ChangePINWithPUK(const std::string& puk, const std::string& newPin);
    int PUKSet(const std::string& puk, const std::string& newPin);
    // Attempts left, or -1; the last known number, 0 at first, when busy or without a usable SIM.
    int PINGetAttemptRemain();
    int PUKGetAttemptRemain();

    // Information. When busy, each gives what it last knew.

    // The SIM must be ready, or err is set.
    std::string GetDefaultAPN(bool& err);
    // Empty, without err, while the SIM is not ready.
    std::string GetDefaultISP(bool& err);
    // The location of the operator by the APN database, empty when it is not listed. Also empty,
    // and without err, while the SIM is not ready; empty with err when the operator or the database
    // cannot be read.
    std::string GetDefaultLocation(bool& err);
    // "true" or "false"; asked only while connected, whatever the SIM.
    std::string GetRoaming(bool& err);
    // 6 to 15 digits; any other answer is a failure. The SIM must be ready, or err is set.
    std::string GetIMSI(bool& err);
    // These need no SIM.
    std::string GetProductName(bool& err);
    std::string GetVendorName(bool& err);
    // Asks for the signal strength and keeps it; 0 also when there was nothing to ask: when busy or
    // while the SIM is not ready.
    int GetRSSI();
    // Signal strength in percent of the scale of TS 27.007, 8.5 (0 to 31); 0 when it is not known
    // and, without err, while the SIM is not ready.
    int GetSignalQuality(bool& err);
    // Sets +CFUN to level ("1": full functionality). 0 also when the modem does not know +CFUN;
    // 2 when busy.
    int SetHardwareFuncLvl(const std::string& level);
    // Switches unsolicited reports. 0 also when the modem cannot; 2 when busy.
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

    // Finds the SIM's file and replaces it by one with defaults; what is to be refused is left
    // empty. When that fails the old file stays.
    int ResetProfile();
    int SetProfileToDefault();
    // Makes sure that there is a file, which is not empty, with mode 0600. A file once found is
    // kept although the SIM may have changed since; only ResetProfile looks again.
    int InitProfile();
    int SetProfileWithKey(const std::string& key, const std::string& value);
    // Empty, without err, when the SIM is busy or missing.
    std::string GetProfileWithKey(const std::string& key, bool& err);

    int SetProfilePhone(const std::string& number);
    std::string GetProfilePhone(bool& err);
    int SetProfileUsername(const std::string& user);
    std::string GetProfileUsername(bool& err);
    int SetProfilePassword(const std::string& password);
    std::string GetProfilePassword(bool& err);
    int SetProfileAPN(const std::string& apn);
    std::string GetProfileAPN(bool& err);
    int SetProfileISP(const std::string& isp);
    std::string GetProfileISP(bool& err);
    int SetProfileLocation(const std::string& location);
    std::string GetProfileLocation(bool& err);
    // "true": the connection takes the default route; anything else: it does not.
    int SetProfileDefaultGW(const std::string& flag);
    std::string GetProfileDefaultGW(bool& err);
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
    // profile cannot be read, ...
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
    // afterwards. Returns 0, also when there was no connection; -1 when there is no default route
    // to give back.
    int EndConnection();
    // Looks at the link. Returns 1 when it is settled (up, down or lost: the modem is not busy any
    // more), 2 while it comes up, -1 on error. A dialler that gives up while it connects is ended.
    int UpdateNetStatus();
    // "connected", "connecting" (also when the address was lost while the dialler runs),
    // "disconnected", or "connection_lost" after failed attempts; empty with err set on failure.
    std::string GetNetStatus(bool& err);
    bool IsNetDisconnected(bool& err);
    // Looks at the link; -1, with the state as it was, when the pid file cannot be opened although
    // there is one, for want of descriptors for instance.
    int GetLinkStats();
    // Reads the address of the connection's interface; 0 also when there is none.
    int UpdateIP();

    // Adds the line "nodefaultroute" to "/etc/ppp/peers/wvdial", or with flag "true" removes it.
    int SetDefaultRoute(const std::string& flag);
    // Saves the default gateway in force in "/etc/ppp/usbmodem_backup_gw"; -1 when there is none.
    int BackupDefaultRoute();
    // Sets the saved gateway again, that of "/tmp/pppoe_gw_backup" if root or the own user has put
    // a regular file there; if it cannot be set, the configured one.
    int RestoreDefaultRoute();
    // Loads the kernel's PPP modules from "/lib/modules". Returns the result of the last one.
    int InsertPPPModules();
    // Runs program detached, its standard error in logFile (created with mode 0600), its pid in
    // pidFile, with these arguments and the dialler's fixed ones. Returns 1 when it was forked.
    int BackgroundExec(const std::string& program, const std::string& init1,
                       const std::string& init2, const std::string& baud, const std::string& modem,
                       const std::string& phone, const std::string& username,
                       const std::string& password, const std::string& pidFile,
                       const std::string& logFile);
    // Writes what is known of the modem into "/var/lib/usbmodem/usbmodem.conf." and the interface
    // id.
    int TestConfToFile();

  private:
    struct DialSettings;

    enum InitState { kNotInited, kInited, kInitFailed };
    enum SIMStatus { kReady, kPINRequired, kPUKRequired, kSIMBusy, kSIMError, kSIMUnknown };
    enum NetStatus { kConnected, kConnecting, kReconnecting, kDisconnected, kConnectionLost };

    using Command = std::string (USBModem_ATIF::*)();
    using Parser = int (USBModem_ATIF::*)(const std::string& reply, std::string& result);

    USBModem_ATIF& CommandSet() const;
    bool FindPortsAndPrepare();
    bool Prepare();
    int CompleteInit(bool isPrepared);
    bool Open(const std::string& node, std::string& error);
    int Exchange(const std::string& cmd, std::string& reply);
    int QuerySIMStatus(std::string& reply);
    int EnterPIN(const std::string& pin);
    int EnterPUK(const std::string& puk, const std::string& newPin);
    int AttemptRemain(Parser parser, int& cache);
    bool ComputeProfilePath();
    void FillDefaults(SzHash& profile);
    std::string PidFilePath() const;
    bool PrepareToDial(DialSettings& settings);
    void ReadDialSettings(DialSettings& settings, bool& err);
    bool Refresh(Command command, Parser parser, std::string& cache,
                 void (*logParseFailure)(const char* reply));

    unsigned int interfaceId_;
    int initState_ = kNotInited;
    int simStatus_ = kSIMUnknown;
    int netStatus_ = kDisconnected;
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
    int errorCounter_ = 0;
    std::shared_ptr<WvModem> device_;
    std::shared_ptr<USBModem_ATIF> atInterface_;
    std::vector<std::shared_ptr<WvModem>> replacedDevices_;
};

// The null object: what a lookup returns that found no modem. It has no device id and is never
// initialised; its operations fail as those of a modem without a channel.
class TAVIWIRELESS_API USBModemNull : public USBModem {
  public:
    USBModemNull();
    ~USBModemNull() override;
    std::string GetDevId() const override;
    bool IsNull() const override;
    bool IsInited() const override;
    bool IsInfoExist() const override;
};

}  // namespace taviwireless::usbmodem_lib

#endif
