// SPDX-License-Identifier: MIT
// The profile of a SIM: a file that may hold anything, values that may be anything, and what of them
// reaches the dialler.
#include <sys/mman.h>
#include <sys/stat.h>
#include <sys/wait.h>
#include <unistd.h>

#include <algorithm>
#include <cerrno>
#include <cstring>
#include <map>

#include "base/split.h"
#include "tests/fuzz/fuzz.h"
#include "tests/fuzz/modem_line.h"
#include "tests/support/files.h"

namespace taviwireless::fuzz {
namespace {

constexpr char kProfile[] = "/var/lib/usbmodem/usbmodem.profile.262019876543210";
constexpr const char* kKeys[] = {"apn",  "number",   "user", "pass",
                                 "IMSI", "location", "isp",  "default_gw"};

pid_t dialler = -1;
// The dialler's arguments, which it leaves to its parent here, each ended by a line feed.
char* const arguments = static_cast<char*>(
    mmap(nullptr, 1 << 16, PROT_READ | PROT_WRITE, MAP_SHARED | MAP_ANONYMOUS, -1, 0));

bool IsFit(const std::string& key, const std::string& value) {
    return value.size() < 1024 && std::none_of(value.begin(), value.end(), [&](unsigned char c) {
               return c == '\n' || c == '\r' || (key == "number" && c == ';') ||
                      ((key == "apn" || key == "number") && (c < ' ' || c == 0x7F || c == '"'));
           });
}

using Values = std::map<std::string, std::string>;

Values Read(usbmodem_lib::USBModem& modem) {
    Values values;
    for (const char* key : kKeys) {
        bool err = false;
        const std::string value = modem.GetProfileWithKey(key, err);
        values[key] = err ? "(error)" : value;
        err = false;
        const std::string same = modem.GetProfileWithKeys({"IMSI", key}, err).back();
        Demand(value == same, "all at once are read as one is", same);
    }
    return values;
}

// The values that the dialler was given, or else the modem's APN and the defaults, are those of the
// profile, and fit.
void CheckDialler(usbmodem_lib::USBModem& modem, Values values) {
    bool err = false;
    const std::string apn = modem.GetDefaultAPN(err);
    if (modem.NetConnect() != 1) {
        return;
    }
    while (waitpid(dialler, nullptr, 0) < 0 && errno == EINTR) {  // libFuzzer has a timer
    }
    unlink("/var/lib/usbmodem/usbmodem.pid.1");
    for (const auto& [key, standard] :
         {std::pair("apn", apn.c_str()), std::pair("number", "*99#"), std::pair("user", "Unknown"),
          std::pair("pass", "Unknown")}) {
        values[key] = values[key].empty() ? standard : values[key];
        Demand(IsFit(key, values[key]), "what is dialled with fits", values[key]);
    }
    Demand(arguments == "/usr/tavi/bin/wvdial\nInit1=ATZ\nInit2=AT+CGDCONT=1,\"ip\",\"" +
                            values["apn"] + "\"\nBaud=460800\nPhone=" + values["number"] +
                            "\nModem=/dev/ttyUSB0\nUsername=" + values["user"] + "\nPassword=" +
                            values["pass"] + "\nDial Attempts=1\nAuto Reconnect=1\nStupid Mode=1\n",
           "the arguments are the dialler's", arguments);
}

}  // namespace

void Fuzz(Input input) {
    const std::string key = kKeys[input.Choice(std::size(kKeys))];
    const bool isDialled = input.Choice(8) == 7;  // takes long
    const std::string value = input.Text();
    const std::string apn = input.Text();
    ModemLine line(0, [&](const std::string& command) {
        return (command == "AT+CIMI"       ? "262019876543210"
                : command == "AT+CPIN?"    ? "+CPIN: READY"
                : command == "AT+CGDCONT?" ? "+CGDCONT: 1,\"IP\",\"" + apn + "\""
                : command == "AT+COPS?"    ? "+COPS: 0,0,\"" + apn + "\",2"
                                           : std::string()) +
               "\r\nOK\r\n";
    });
    test::WriteFile("/etc/ppp/peers/wvdial", "noauth\n");
    test::WriteFile(kProfile, input.Rest());
    chmod(kProfile, 0644);  // as others may have left it
    Demand(line.record.InitProfile() == 0 && test::FileMode(kProfile) == 0600, "it is ours alone");
    const std::string text = test::ReadFile(kProfile);
    Demand(text == input.Rest() || input.Rest().empty(), "only an empty one is made anew", text);
    Demand(!input.Rest().empty() || Lines(text).size() == 9, "a new one is whole", text);
    Values values = Read(line.record);
    const bool isSet = line.record.SetProfileWithKey(key, value) == 0;
    const std::string changed = test::ReadFile(kProfile);
    Demand(isSet ? IsFit(key, value) : changed == text, "what does not fit is refused", changed);
    values[key] = isSet ? value : values[key];
    Demand(Read(line.record) == values, "the value is set, and no other", changed);
    if (isDialled) {
        CheckDialler(line.record, values);
    }
}

}  // namespace taviwireless::fuzz

#define TAKEN_OVER extern "C" __attribute__((visibility("default")))

TAKEN_OVER int system(const char*) {  // loads modules of the kernel
    return 0;
}

TAKEN_OVER pid_t VEXACProcForkChildNoWait() {
    return taviwireless::fuzz::dialler = fork();
}

TAKEN_OVER int execv(const char*, char* const argv[]) {
    char* to = taviwireless::fuzz::arguments;
    for (*to = '\0'; *argv != nullptr; ++argv) {
        to = stpcpy(stpcpy(to, *argv), "\n");
    }
    _exit(0);
}
