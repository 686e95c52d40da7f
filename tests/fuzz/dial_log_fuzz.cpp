// SPDX-License-Identifier: MIT
// The dialler's log, in which what the modem answered stands too: which interface is taken from it.
#include <tavisdk/network.h>
#include <unistd.h>

#include <cstring>

#include "base/interface_name.h"
#include "tests/fuzz/fuzz.h"
#include "tests/fuzz/modem_line.h"
#include "tests/support/files.h"

namespace taviwireless::fuzz {
namespace {

constexpr char kCommand[] = "--> Sending: ATZ\n";

bool Has(const std::string& text, const std::string& part) {
    return text.find(part) != text.npos;
}

// What AssignConnectInfo makes of the log, and the interface that is told of then.
std::pair<int, std::string> Take(usbmodem_lib::USBModem modem, const std::string& log) {
    test::WriteFile("/var/lib/usbmodem/wvdial.log.001010123456789", log);
    bool err = false;
    modem.GetIMSI(err);
    const int result = modem.AssignConnectInfo();
    modem.GetLinkStats();
    const std::string name = modem.GetNetIFName(err);
    Demand(name.empty() || (result == 1 && IsInterfaceName(name) && Has(log, name)),
           "an interface has its name from the log", log);
    return {result, name};
}

}  // namespace

void Fuzz(Input input) {
    ModemLine line(0, [](const std::string&) { return "001010123456789\r\nOK\r\n"; });
    test::WriteFile("/var/lib/usbmodem/usbmodem.pid.1", std::to_string(getpid()) + "\n");
    Take(line.record, input.Rest());

    const bool isNamed = input.Flag();
    const bool isUp = input.Flag();
    const std::string earlier = input.Text();
    const std::string last = input.Text();
    if (Has("\n" + last, "\n--> ")) {
        return;  // what looks like the dialler in the modem's last answer is believed
    }
    const std::string log = std::string("--> WvDial: a dialler\n") + kCommand + earlier + "\n" +
                            kCommand + last + "\n" + (isNamed ? "--> Using interface ppp0\n" : "") +
                            (isUp ? "--> secondary DNS address 10.64.64.3\n" : "");
    const auto& [result, name] = Take(line.record, log);
    const bool isReady =
        Has(log, "secondary DNS address") && (isNamed || !Has(log, "Using interface"));
    Demand(result == (Has(log, "Disconnecting") ? -1
                      : isReady                 ? 1
                                                : 2),
           "the dialler tells it", log);
    // Of a log without an interface the word behind the 14th character is taken.
    Demand(result != 1 || name == (isNamed ? "ppp0" : "dialler"), "the dialler names it", log);
}

}  // namespace taviwireless::fuzz

// Every interface that is asked for has an address.
extern "C" __attribute__((visibility("default"))) int TAVINetIFGetInfo(const char*,
                                                                       TAVINetIFInfo* info) {
    strcpy(info->address, "10.64.64.64");
    return 1;
}
