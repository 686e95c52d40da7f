#ifndef TAVIWIRELESS_USBMODEM_ATIF_H
#define TAVIWIRELESS_USBMODEM_ATIF_H

#include <taviwireless/export.h>

#include <map>
#include <string>

namespace taviwireless::usbmodem_lib {

// The AT command set of a modem: what to send for an operation, and how to read the reply.
//
// This class speaks the commands of 3GPP TS 27.005 and TS 27.007; a vendor's subclass overrides
// what its modems do differently. Objects hold no data. Replies are the cleaned text of
// USBModem::ModemCmd: lines ended by a line feed, without echo and blank lines.
class TAVIWIRELESS_API USBModem_ATIF {
  public:
    // Commands. Arguments are inserted as they stand, without quoting or checking: USBModem refuses
    // codes that would end their place before it builds a command. The empty text means that this
    // command set does not support the operation.
    virtual std::string GetATCommandQuarySIMStatus();
    virtual std::string GetATCommandSetSIMPIN(const std::string& pin);
    virtual std::string GetATCommandSetSIMPUK(const std::string& puk, const std::string& newPin);
    virtual std::string GetATCommandChangePINCode(const std::string& oldPin,
                                                  const std::string& newPin);
    // lockMode is "1" to protect the SIM with the PIN, "0" to stop doing so (TS 27.007, 7.4).
    virtual std::string GetATCommandChangePINEnable(const std::string& lockMode,
                                                    const std::string& pin);
    virtual std::string GetATCommandGetPINEnable();
    virtual std::string GetATCommandGetRSSI();
    virtual std::string GetATCommandGetHardwareFuncLvl();
    virtual std::string GetATCommandSetHardwareFuncLvl(const std::string& level);
    virtual std::string GetATCommandGetVendorName();
    virtual std::string GetATCommandGetProductName();
    virtual std::string GetATCommandGetIMSI();
    virtual std::string GetATCommandGetRoaming();
    virtual std::string GetATCommandGetDefaultISP();
    virtual std::string GetATCommandGetDefaultAPN();
    virtual std::string GetATCommandPINPUKAttempt();
    virtual std::string GetATCommandGetUnsolicitedReports();
    virtual std::string GetATCommandSetUnsolicitedReports(bool enable);

    // Returns the SIM status code of the reply to the SIM status query: 0 ready, 1 PIN required,
    // 2 PUK required, 3 SIM busy, 4 error, 5 unknown. Tested in this order; "SIM PIN2" is 1.
    virtual int ParseRetStringQuarySIMStatus(const std::string& reply);

    // The parsers below return 0, or -1 when the reply is empty or reports an error. A reply of
    // another shape may still give 0 and an empty result.

    // result is the signal strength of +CSQ (TS 27.007, 8.5): 0 to 31, or 99 for not known, perhaps
    // with blanks in front.
    virtual int ParseRetStringGetRSSI(const std::string& reply, std::string& result);
    // result is "true" when +CREG reports "registered, roaming" (TS 27.007, 7.2), else "false".
    virtual int ParseRetStringGetRoaming(const std::string& reply, std::string& result);
    virtual int ParseRetStringPINRemainAttempt(const std::string& reply, std::string& result);
    virtual int ParseRetStringPUKRemainAttempt(const std::string& reply, std::string& result);
    // result is the operator's name: the first quoted item of +COPS (TS 27.007, 7.3).
    virtual int ParseRetStringDefaultISP(const std::string& reply, std::string& result);
    // result is the access point name: the second quoted item of +CGDCONT (TS 27.007, 10.1.1).
    virtual int ParseRetStringDefaultAPN(const std::string& reply, std::string& result);
    // For answers of one value: result is the text behind the first ":" (or all of it) up to the
    // next line feed, leading blanks included.
    virtual int ParseRetStringDefaultFormat(const std::string& reply, std::string& result);
    // Returns 0 when the reply holds "OK" and no "ERROR".
    virtual int ParseRetStringIsOK(const std::string& reply);

    virtual ~USBModem_ATIF();

    // Skips reply through its first ":" and splits what follows at delim; result is field number
    // field (from 1), with its blanks and line feeds, or empty when there are fewer. Returns 0; -1
    // for an empty reply, a field below 1, or a reply that holds "ERROR".
    int GetLineWithDelim(const std::string& reply, char delim, int field, std::string& result);

    using Creator = USBModem_ATIF* (*)();

    // Command sets by USB vendor id: four lowercase hexadecimal digits. Filled by the first
    // CreateATIF.
    static std::map<std::string, Creator> vendorTable;
    static int CreateVendorHash();

    // Returns a new command set for the USB vendor id, the generic one for an id that is not in
    // vendorTable. The caller frees it with DeleteATIF.
    static USBModem_ATIF* CreateATIF(const std::string& vendorId);
    static USBModem_ATIF* CreateATIFHuawei();
    static USBModem_ATIF* CreateATIFDLink();
    // Frees a command set; null is accepted.
    static void DeleteATIF(USBModem_ATIF* commandSet);
};

// USB vendor id "2001": wants the PIN and PUK quoted, and counts attempts in its own way, which is
// that of the generic set so far.
class TAVIWIRELESS_API USBModem_ATIF_DLink : public USBModem_ATIF {
  public:
    std::string GetATCommandSetSIMPIN(const std::string& pin) override;
    std::string GetATCommandSetSIMPUK(const std::string& puk, const std::string& newPin) override;
    std::string GetATCommandPINPUKAttempt() override;
};

// USB vendor id "12d1": counts attempts with AT^CPIN? and can silence its unsolicited reports.
class TAVIWIRELESS_API USBModem_ATIF_Huawei : public USBModem_ATIF {
  public:
    std::string GetATCommandPINPUKAttempt() override;
    std::string GetATCommandGetUnsolicitedReports() override;
    std::string GetATCommandSetUnsolicitedReports(bool enable) override;
    int ParseRetStringPINRemainAttempt(const std::string& reply, std::string& result) override;
};

}  // namespace taviwireless::usbmodem_lib

#endif
