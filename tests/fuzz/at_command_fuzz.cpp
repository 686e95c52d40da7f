// SPDX-License-Identifier: MIT
// What is sent to a modem for codes that may be anything, what comes of it, and what is logged of the
// codes whatever the modem answers.
#include <algorithm>
#include <cstring>

#include "tests/fuzz/fuzz.h"
#include "tests/fuzz/modem_line.h"
#include "tests/support/log_capture.h"

namespace taviwireless::fuzz {
namespace {

using usbmodem_lib::USBModem;

constexpr char kQuery[] = "AT+CPIN?";
constexpr char kLockQuery[] = "AT+CLCK=\"SC\",2";
enum Status { kReady, kPIN, kPUK, kBusy };
constexpr const char* kStatuses[] = {"+CPIN: READY", "+CPIN: SIM PIN", "+CPIN: SIM PUK", "BUSY"};
constexpr const char* kLocks[] = {"+CLCK: 0", "+CLCK: 1", "+CME ERROR: SIM PIN required"};

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
    const unsigned lock = input.Choice(std::size(kLocks));
    const bool enable = input.Flag();
    const std::string first = input.Text();
    const std::string second = input.Text();
    const std::string reply = input.Text();
    std::vector<std::string> sent;
    std::string said;
    bool isOver = false;
    ModemLine line(vendor, [&](const std::string& command) {
        if (command == kQuery || command == kLockQuery) {
            return std::string(command == kQuery ? kStatuses[status] : kLocks[lock]) + "\r\n";
        }
        if (!isOver) {
            sent.push_back(command);
        }
        const std::string answer =
            Filled(reply, isOver ? "" : first, sent.empty() ? "" : sent.back());
        said += answer;
        return answer;
    });
    USBModem& modem = line.record;
    modem.UpdateSIMStatus();
    Demand(modem.GetPINEnable() == (lock == 0 ? 0 : 1), "the protection is read");
    const test::LogCapture log;
    const int result = operation == kUnlock          ? modem.PINUnlock(first)
                       : operation == kUnlockWithPUK ? modem.PUKSet(first, second)
                       : operation == kChange        ? modem.ChangePIN(first, second)
                       : operation == kSwitch        ? modem.ChangePINEnable(first, enable)
                                                     : modem.PINSet(first, second, enable);
    isOver = true;
    const bool hasSecond = operation != kUnlock && operation != kSwitch;
    // Line ends are dropped, so that an OK may come of two lines.
    said.erase(std::remove_if(said.begin(), said.end(), [](char c) { return strchr("\r\n", c); }),
               said.end());
    const bool hasOK = said.find("OK") != said.npos;
    std::vector<std::string> wanted;
    if (IsFit(first) && (!hasSecond || IsFit(second))) {
        const bool isQuoted = ModemLine::kVendors[vendor] == std::string("2001");
        if (operation == kUnlock && status != kReady) {
            wanted = {"AT+CPIN=" + Quoted(first, isQuoted)};
        } else if (operation == kUnlockWithPUK && status == kPUK) {
            wanted = {"AT+CPIN=" + Quoted(first, isQuoted) + "," + Quoted(second, isQuoted)};
        }
        if (operation >= kSwitch && status == kReady && enable == (lock == 0)) {
            wanted = {"AT+CLCK=\"SC\"," + std::string(enable ? "1," : "0,") + Quoted(first)};
        }
        const bool isRefused = !wanted.empty() && (!hasOK || (result < 0 && sent.size() == 1));
        if ((operation == kChange || operation == kSet) && status == kReady && !isRefused &&
            !first.empty() && !second.empty()) {
            wanted.push_back("AT+CPWD=\"SC\"," + Quoted(first) + "," + Quoted(second));
        }
    } else {
        Demand(result == -1, "a code that does not fit is refused", first);
    }
    Demand(sent == wanted, "this is sent and nothing else", sent.empty() ? "" : sent.back());
    const bool lacksOld = operation == kSet && first.empty() && !second.empty();
    Demand(sent.empty() || reply != "OK\r\n" || result == (lacksOld ? -1 : 0),
           "what is done is done", reply);
    Demand(sent.empty() || result < 0 || hasOK, "what is not answered with OK fails", reply);
    Demand(operation == kChange || operation == kSwitch || !modem.IsNewPlugIn(), "it is known now");

    bool err = false;
    line.coming.clear();
    modem.UpdateSIMStatus();
    line.written.clear();
    modem.GetIMSI(err);
    modem.GetDefaultISP(err);
    modem.GetDefaultAPN(err);
    modem.GetSignalQuality(err);
    Demand(line.written.empty() == (status != kReady), "only a usable SIM is asked for");
    line.written.clear();
    modem.PINGetAttemptRemain();
    Demand(line.written.empty() == (status == kBusy), "only a SIM that is there has attempts");
    modem.GetProductName(err);
    modem.SetHardwareFuncLvl("1");
    modem.SetUnsolicitedReports(true);
    const bool isPIN = first.size() >= 4 && first.find_first_not_of("0123456789") == first.npos;
    Demand(!isPIN || reply.find(first) != reply.npos || !log.Has(first), "no PIN is logged",
           log.Text());
}

}  // namespace taviwireless::fuzz
