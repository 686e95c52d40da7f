// SPDX-License-Identifier: MIT
#ifndef TAVIWIRELESS_USBMODEM_LIST_H
#define TAVIWIRELESS_USBMODEM_LIST_H

#include <taviwireless/export.h>
#include <taviwireless/usbmodem.h>

#include <string>
#include <vector>

namespace taviwireless::usbmodem_lib {

// The modems that are plugged in, in the order in which they were found. Owns their records.
//
// A list has no lock: it belongs to the thread that owns it. References to records and iterators
// stay valid until the next SearchInfoPath, DropUnplugged, Drop or Update. A failure is one line in
// the system log.
class TAVIWIRELESS_API USBModemList {
  public:
    // An empty list. Nothing is looked for before SearchInfoPath or Update.
    USBModemList();
    virtual ~USBModemList();

    // Adds a record for every info file "/tmp/usbmodem.info" + n that has none yet, in the order of
    // the numbers; talks to no modem. Names are exact: no leading zeros, nothing behind the number.
    // Only regular files of root or of the own user count, of 64 KB at most. Returns 0, or -1 when
    // "/tmp/" cannot be listed.
    int SearchInfoPath();

    // Drops the modems whose info file is gone, or is not one that counts any more. Of two modems
    // unplugged at once whose records are neighbours, the second is dropped by the next call.
    void DropUnplugged();

    // Drops the modem of this interface id, whatever its info file; none is no failure.
    void Drop(int interfaceId);

    // Brings the list up to date: SearchInfoPath, DropUnplugged, and InitInfo for each modem that
    // is not initialised. Returns 0, or -1 as soon as one modem cannot be initialised (up to six
    // seconds); those behind it wait for the next call.
    int Update();

    // The modem with this device id ("usbmodem0") or interface id, else nullObject, which its
    // IsNull tells. Borrowed from the list.
    USBModem& FindUSBModem(const std::string& devId);
    USBModem& FindUSBModem(int interfaceId);

    // All records, those included that are not initialised: for (USBModem& modem : list).
    std::vector<USBModem>::iterator begin() { return records_.begin(); }
    std::vector<USBModem>::iterator end() { return records_.end(); }

    // What lookups return that found nothing; one for the process.
    static USBModemNull nullObject;

  private:
    std::vector<USBModem> records_;
};

}  // namespace taviwireless::usbmodem_lib

#endif
