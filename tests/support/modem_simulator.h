// SPDX-License-Identifier: MIT
#ifndef TAVIWIRELESS_TESTS_SUPPORT_MODEM_SIMULATOR_H
#define TAVIWIRELESS_TESTS_SUPPORT_MODEM_SIMULATOR_H

#include <string>
#include <vector>

#include "tests/support/process.h"

namespace taviwireless::test {

constexpr char kDialler[] = "/usr/tavi/bin/wvdial";

// Puts a shell script in the dialler's place, which writes its arguments to "/tmp/arguments", does
// this and lives on; and the file that dialling changes.
void InstallDialler(const std::string& script = "");

// What the real one says in the end.
constexpr char kSaysConnected[] = "echo '--> Using interface lo secondary DNS address' >&2";

// modemsim beside the test, with its modems plugged in: ports linked as /dev/ttyUSBk, info files as
// /tmp/usbmodem.infoN. For tests in an appliance root, where both folders are private.
class ModemSimulator {
  public:
    // Returns once every port is there. `arguments` are modemsim's own, such as {"--modem",
    // "12d1,pin=1234"}. Every member throws std::runtime_error with what modemsim said, or that it
    // says nothing.
    // Links and info files lie in `folder`, if one is given, instead of "/dev" and "/tmp".
    explicit ModemSimulator(const std::vector<std::string>& arguments = {},
                            const std::string& folder = "");

    // As if modemsim was told to end, and waits until links and info files are gone.
    ~ModemSimulator();

    // One control line (see modemsim --help). Returns the lines printed before "ok", each ended.
    std::string Command(const std::string& line);

    // `target` is a modem's id, or with the position of a port behind it: "0", "0.2".

    // The command lines that arrived since the last call; carriage returns alone are none.
    std::vector<std::string> Received(const std::string& target);
    // `fault` is KIND or KIND=ARGUMENT, or "off".
    void Fault(const std::string& target, const std::string& fault) {
        Command("fault " + target + " " + fault);
    }
    // From now on the modem answers `command` with `text`, as it stands, behind the echo.
    void Reply(const std::string& id, const std::string& command, const std::string& text);
    // The modem answers `command` with `text` once, and then as before.
    void ReplyOnce(const std::string& id, const std::string& command, const std::string& text);
    void Set(const std::string& id, const std::string& name, const std::string& value) {
        Command("set " + id + " " + name + " " + value);
    }
    void Send(const std::string& target, const std::string& text);
    void Unplug(const std::string& target) { Command("unplug " + target); }
    void Plug(const std::string& target) { Command("plug " + target); }

  private:
    std::string ReadUntil(const std::string& last);

    Process process_;
};

}  // namespace taviwireless::test

#endif
