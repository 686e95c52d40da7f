// SPDX-License-Identifier: MIT
// The command sets by the shapes of 3GPP TS 27.007: the text that a reply carries is what the parser
// finds, and what the reply does not carry is not found.
#include <taviwireless/usbmodem_atif.h>

#include <memory>

#include "tests/fuzz/fuzz.h"
#include "tests/support/log_capture.h"

namespace taviwireless::fuzz {
namespace {

using Set = usbmodem_lib::USBModem_ATIF;
using Parser = int (Set::*)(const std::string& reply, std::string& result);

constexpr char kRefused[] = "(refused)";

bool Has(const std::string& text, const char* part) {
    return text.find(part) != text.npos;
}

std::string Parse(Set& set, Parser parser, const std::string& reply) {
    const test::LogCapture log;
    std::string result = kRefused;
    const bool isRefused = (set.*parser)(reply, result) != 0;
    Demand(isRefused == (reply.empty() || Has(reply, "ERROR")),
           "empty replies and errors are refused, and no others", reply);
    Demand((!isRefused || result == kRefused) && log.Lines().size() == (isRefused ? 1 : 0),
           "what is refused is logged and changes nothing", log.Text());
    return result;
}

}  // namespace

void Fuzz(Input input) {
    const std::string vendor = input.Text();
    const std::string value = input.Text();
    const std::string other = input.Text();
    const std::string reply = input.Rest();
    const test::LogCapture log;
    const std::unique_ptr<Set, void (*)(Set*)> set(Set::CreateATIF(vendor), Set::DeleteATIF);
    const bool isHuawei = vendor == "12d1";
    Demand(log.Has("Unknown vendor id") == (!isHuawei && vendor != "2001"), "others are logged");
    Demand(isHuawei == (set->GetATCommandPINPUKAttempt() == "AT^CPIN?") &&
               (vendor == "2001") == (set->GetATCommandSetSIMPIN("1") == "AT+CPIN=\"1\""),
           "the vendor has its set", vendor);
    const auto finds = [&](Parser parser, const std::string& text, const std::string& result) {
        Demand(Parse(*set, parser, text + "\nOK\n") == result, "the value is found", text);
    };
    const std::string both = value + other;
    if (both.find_first_of("\"\n:") == both.npos && !Has(both, "ERROR")) {
        finds(&Set::ParseRetStringDefaultISP, "+COPS: " + other + ",\"" + value + "\",2", value);
        finds(&Set::ParseRetStringDefaultAPN, "+CGDCONT: 1,\"" + other + "\",\"" + value + "\",0,0",
              value);
        finds(&Set::ParseRetStringDefaultFormat, "+CGMI: " + value, " " + value);
        finds(&Set::ParseRetStringDefaultFormat, value, value);
    }
    if (both.find_first_of(",\n:") == both.npos && !Has(both, "ERROR")) {
        finds(&Set::ParseRetStringGetRSSI, "+CSQ: " + value + "," + other, " " + value);
        finds(&Set::ParseRetStringGetRoaming, "+CREG: " + other + "," + value + ",\"1F4B\"",
              value == "5" ? "true" : "false");
        const std::string attempts = isHuawei ? "^CPIN: READY," + other + ",10," + value + ",11"
                                              : "+EPINC: " + value + "," + other + ",10,11";
        finds(&Set::ParseRetStringPINRemainAttempt, attempts, (isHuawei ? "" : " ") + value);
        finds(&Set::ParseRetStringPUKRemainAttempt, attempts, "10");
    }
    for (const Parser parser :
         {&Set::ParseRetStringGetRSSI, &Set::ParseRetStringPINRemainAttempt,
          &Set::ParseRetStringPUKRemainAttempt, &Set::ParseRetStringDefaultISP,
          &Set::ParseRetStringDefaultAPN, &Set::ParseRetStringDefaultFormat}) {
        const std::string result = Parse(*set, parser, reply);
        Demand(result == kRefused || Has(reply, result.c_str()), "the reply says so", result);
    }
    Demand(Parse(*set, &Set::ParseRetStringGetRoaming, reply) != "true" || Has(reply + ',', ",5,"),
           "roaming is told with the location", reply);
    constexpr const char* kStatuses[] = {"+CPIN: READY", "+CPIN: SIM PIN", "+CPIN: SIM PUK",
                                         "BUSY",         "ERROR",          "failure"};
    size_t status = 0;
    while (status < std::size(kStatuses) && !Has(reply, kStatuses[status])) {
        ++status;
    }
    Demand(set->ParseRetStringQuarySIMStatus(reply) ==
               static_cast<int>(status > 4 ? status - 1 : status),
           "the first text decides", reply);
    Demand((set->ParseRetStringIsOK(reply) == 0) == (Has(reply, "OK") && !Has(reply, "ERROR")),
           "OK without an error is OK", reply);
}

}  // namespace taviwireless::fuzz
