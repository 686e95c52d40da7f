// What is sent to a modem for codes that may be anything, and what is logged of them whatever the
// modem answers.
#include <algorithm>
#include <cstring>

#include "tests/fuzz/fuzz.h"
#include "tests/fuzz/modem_line.h"
#include "tests/support/log_capture.h"

namespace taviwireless::fuzz {
namespace {

using usbmodem_lib::USBModem;

const std::string kQuery = "AT+CPIN?";
const std::string kLockQuery = "AT+CLCK=\"SC\",2";
constexpr const char* kStatuses[] = {"READY", "SIM PIN", "SIM PUK"};

enum Operation { kUnlock, kUnlockWithPUK, kChange, kSwitch, kSet, kOperations };

bool IsFit(const std::string& code) {
    return std::none_of(code.begin(), code.end(), [](unsigned char c) {
        return c < ' ' || c == 0x7F || strchr("\",;", c) != nullptr;
    });
}

std::string Quoted(const std::string& text, bool isQuoted = true) {
    return isQuoted ? '"' + text + '"' : text;
}

// `text` with a code and a command in the places of two bytes. What comes late, as the answer to
// another command, is no code that can be known for one.
std::string Filled(const std::string& text, std::string code, const std::string& command) {
    std::string filled;
    for (const char c : text) {
        code = c == ModemLine::kPause ? "" : code;
        filled += c == '\x02' ? code : c == '\x03' ? command : std::string(1, c);
    }
    return filled;
}

}  // namespace

void Fuzz(Input input) {
    const unsigned vendor = input.Choice(std::size(ModemLine::kVendors));
    const unsigned operation = input.Choice(kOperations);
    const unsigned status = input.Choice(std::size(kStatuses));
    const bool isOn = input.Flag();
    const std::string first = input.Text();
    const std::string second = input.Text();
    const std::string reply = input.Text();
    std::string sent;
    bool isSent = false;
    ModemLine line(vendor, [&](const std::string& command) {
        if (command == kQuery) {
            return std::string("+CPIN: ") + kStatuses[status] + "\r\nOK\r\n";
        }
        if (command == kLockQuery) {
            return std::string(isOn ? "+CLCK: 1\r\n" : "+CLCK: 0\r\n");
        }
        sent += isSent ? "" : command;
        return Filled(reply, isSent ? "" : first, sent);
    });
    USBModem& modem = line.record;
    modem.UpdateSIMStatus();
    const test::LogCapture log;
    const int result = operation == kUnlock          ? modem.PINUnlock(first)
                       : operation == kUnlockWithPUK ? modem.PUKSet(first, second)
                       : operation == kChange        ? modem.ChangePIN(first, second)
                       : operation == kSwitch        ? modem.ChangePINEnable(first, !isOn)
                                                     : modem.PINSet(first, second, isOn);
    isSent = true;
    const bool isQuoted = ModemLine::kVendors[vendor] == std::string("2001");
    const std::string asSet = "AT+CPIN=" + Quoted(first, isQuoted);
    const std::string change = "AT+CPWD=\"SC\"," + Quoted(first) + "," + Quoted(second);
    const struct {
        bool isPossible;
        std::string command;
    } kWanted[] = {
        {status != 0, asSet},
        {status == 2, asSet + "," + Quoted(second, isQuoted)},
        {status == 0 && !first.empty() && !second.empty(), change},
        {status == 0, "AT+CLCK=\"SC\"," + std::string(isOn ? "0" : "1") + "," + Quoted(first)},
        {status == 0 && !first.empty() && !second.empty(), change}};
    const bool isFit =
        IsFit(first) && (operation == kUnlock || operation == kSwitch || IsFit(second));
    Demand(sent == (isFit && kWanted[operation].isPossible ? kWanted[operation].command : ""),
           "the command is sent, or none", sent);
    Demand(isFit || result < 0, "a code that does not fit is refused", first);
    for (const std::string& text : line.written) {
        Demand(text.find('\r') == text.size() - 1 || text.find_first_not_of('\r') == text.npos,
               "it is one line", text);
    }
    bool err = false;
    for (const auto ask : {&USBModem::GetIMSI, &USBModem::GetVendorName, &USBModem::GetProductName,
                           &USBModem::GetDefaultISP, &USBModem::GetDefaultAPN}) {
        (modem.*ask)(err);
    }
    modem.GetSignalQuality(err);
    modem.PINGetAttemptRemain();
    modem.SetHardwareFuncLvl("1");
    modem.SetUnsolicitedReports(true);
    const bool isPIN = first.size() >= 4 && first.find_first_not_of("0123456789") == first.npos;
    Demand(!isPIN || reply.find(first) != reply.npos || !log.Has(first), "no PIN is logged",
           log.Text());
}

}  // namespace taviwireless::fuzz
