// SPDX-License-Identifier: MIT
#ifndef TAVIWIRELESS_USBMODEM_ATIF_H
#define TAVIWIRELESS_USBMODEM_ATIF_H

#include <taviwireless/export.h>

#include <map>
#include <string>

namespace taviwireless::usbmodem_lib {

// The AT command set of a modem: what to send for an operation, and how to read the reply.
//
// This class speaks the commands of 3GPP TS 27.007, whose sections stand in parentheses below; a
// vendor's subclass overrides what its modems do differently. Objects hold no data. Replies are the
// cleaned text of USBModem::ModemCmd: lines ended by a line feed, without echo and blank lines.
class TAVIWIRELESS_API USBModem_ATIF {
  public:
    // Commands, without the carriage return that ends them. Arguments are inserted as they stand,
    // without quoting or checking: USBModem refuses codes that would end their place before it
    // builds a command. The empty text means that this command set does not support the operation.

    // AT+CPIN? (8.3): does the SIM wait for a code?
    virtual std::string GetATCommandQuarySIMStatus();
    // AT+CPIN=PIN (8.3), enters the PIN.
    virtual std::string GetATCommandSetSIMPIN(const std::string& pin);
    // AT+CPIN=PUK,PIN (8.3), sets a new PIN with the PUK.
    virtual std::string GetATCommandSetSIMPUK(const std::string& puk, const std::string& newPin);
    // AT+CPWD="SC","OLD","NEW" (7.5), changes the PIN.
    virtual std::string GetATCommandChangePINCode(const std::string& oldPin,
                                                  const std::string& newPin);
    // AT+CLCK="SC",MODE,"PIN" (7.4). lockMode is "1" to protect the SIM with the PIN, "0" to stop
    // doing so.
    virtual std::string GetATCommandChangePINEnable(const std::string& lockMode,
                                                    const std::string& pin);
    // AT+CLCK="SC",2 (7.4): is the SIM protected by its PIN?
    virtual std::string GetATCommandGetPINEnable();
    // AT+CSQ (8.5), signal strength.
    virtual std::string GetATCommandGetRSSI();
    // AT+CFUN? and AT+CFUN=LEVEL (8.2), which parts of the modem are switched on; "1" is all.
    virtual std::string GetATCommandGetHardwareFuncLvl();
    virtual std::string GetATCommandSetHardwareFuncLvl(const std::string& level);
    // AT+CGMI (5.1), the maker.
    virtual std::string GetATCommandGetVendorName();
    // AT+CGMM (5.2), the model.
    virtual std::string GetATCommandGetProductName();
    // AT+CIMI (5.6), the subscriber identity of the SIM.
    virtual std::string GetATCommandGetIMSI();
    // AT+CREG? (7.2), registration, which tells roaming.
    virtual std::string GetATCommandGetRoaming();
    // AT+COPS? (7.3), the operator in use.
    virtual std::string GetATCommandGetDefaultISP();
    // AT+CGDCONT? (10.1.1), the PDP contexts with their access point names.
    virtual std::string GetATCommandGetDefaultAPN();
    // AT+EPINC?, attempts left for PIN and PUK. No standard has a command for that.
    virtual std::string GetATCommandPINPUKAttempt();
    // Whether the modem reports without being asked, and switching that. Empty here: the standard
    // has no command for all reports.
    virtual std::string GetATCommandGetUnsolicitedReports();
    virtual std::string GetATCommandSetUnsolicitedReports(bool enable);

    // Returns the SIM status code of the reply to the SIM status query. The first of these texts
    // that stands anywhere in the reply decides, so "SIM PIN2" is 1:
    //   0 ready "+CPIN: READY"           1 PIN required "+CPIN: SIM PIN"
    //   2 PUK required "+CPIN: SIM PUK"  3 SIM busy "BUSY"
    //   4 error "ERROR", "failure"       5 unknown, none of them
    virtual int ParseRetStringQuarySIMStatus(const std::string& reply);

    // The parsers below set result and return 0, or return -1, with a line in the log and result as
    // it was, when the reply is empty or holds "ERROR". A reply of another shape may still give 0
    // and an empty result.

    // result is the signal strength of +CSQ (8.5): 0 to 31, or 99 for not known, perhaps with
    // blanks in front.
    virtual int ParseRetStringGetRSSI(const std::string& reply, std::string& result);
    // result is "true" when +CREG reports "registered, roaming" (7.2), else "false". Roaming is
    // seen only where the modem reports its location behind it (AT+CREG=2).
    virtual int ParseRetStringGetRoaming(const std::string& reply, std::string& result);
    // result is the number of attempts left, of the reply to GetATCommandPINPUKAttempt: the first
    // number for the PIN, the third for the PUK.
    virtual int ParseRetStringPINRemainAttempt(const std::string& reply, std::string& result);
    virtual int ParseRetStringPUKRemainAttempt(const std::string& reply, std::string& result);
    // result is the operator's name: the first quoted item of +COPS (7.3).
    virtual int ParseRetStringDefaultISP(const std::string& reply, std::string& result);
    // result is the access point name: the second quoted item of +CGDCONT (10.1.1), which is that
    // of the first context.
    virtual int ParseRetStringDefaultAPN(const std::string& reply, std::string& result);
    // For answers of one value: result is the text behind the first ":" (or all of it) up to the
    // next line feed, leading blanks included.
    virtual int ParseRetStringDefaultFormat(const std::string& reply, std::string& result);
    // Returns 0 when the reply holds "OK" and no "ERROR", else -1; only an empty reply is logged.
    virtual int ParseRetStringIsOK(const std::string& reply);

    virtual ~USBModem_ATIF();

    // Skips reply through its first ":" and splits what follows at delim; result is field number
    // field (from 1), with its blanks and line feeds, or empty when there are fewer. Returns 0; -1
    // for an empty reply, a field below 1, or a reply that holds "ERROR".
    int GetLineWithDelim(const std::string& reply, char delim, int field, std::string& result);

    // Makes a new command set, which the caller frees with DeleteATIF.
    using Creator = USBModem_ATIF* (*)();

    // Command sets by USB vendor id: four lowercase hexadecimal digits. Filled by the first
    // CreateATIF.
    static std::map<std::string, Creator> vendorTable;
    // Enters the vendors that have a class below into vendorTable. Returns 0.
    static int CreateVendorHash();

    // Returns a new command set for the USB vendor id; for an id that is not in vendorTable the
    // generic one, with a line in the log. The caller frees it with DeleteATIF.
    static USBModem_ATIF* CreateATIF(const std::string& vendorId);
    // The creators of single vendors; the caller frees what they return with DeleteATIF.
    static USBModem_ATIF* CreateATIFHuawei();
    static USBModem_ATIF* CreateATIFDLink();
    // Frees a command set; null is accepted.
    static void DeleteATIF(USBModem_ATIF* commandSet);
};

// USB vendor id "2001": wants the PIN and PUK quoted, and counts attempts in its own way, which is
// that of the generic set so far.
class TAVIWIRELESS_API USBModem_ATIF_DLink : public USBModem_ATIF {
  public:
    // AT+CPIN="PIN"
    std::string GetATCommandSetSIMPIN(const std::string& pin) override;
    // AT+CPIN="PUK","PIN"
    std::string GetATCommandSetSIMPUK(const std::string& puk, const std::string& newPin) override;
    // AT+EPINC?
    std::string GetATCommandPINPUKAttempt() override;
};

// USB vendor id "12d1": has commands of its own for attempts and for unsolicited reports.
class TAVIWIRELESS_API USBModem_ATIF_Huawei : public USBModem_ATIF {
  public:
    // AT^CPIN?
    std::string GetATCommandPINPUKAttempt() override;
    // AT^CURC?
    std::string GetATCommandGetUnsolicitedReports() override;
    // AT^CURC=1 or AT^CURC=0
    std::string GetATCommandSetUnsolicitedReports(bool enable) override;
    // The fourth item of ^CPIN.
    int ParseRetStringPINRemainAttempt(const std::string& reply, std::string& result) override;
};

}  // namespace taviwireless::usbmodem_lib

#endif
