// SPDX-License-Identifier: MIT
// Files in "/tmp/", which everybody may make: which of them are modems, and which ports are tried.
#include <taviwireless/usbmodem_list.h>
#include <unistd.h>

#include <filesystem>
#include <regex>

#include "base/split.h"
#include "tests/fuzz/fuzz.h"
#include "tests/support/files.h"
#include "tests/support/log_capture.h"
#include "usbmodem/info_file.h"
#include "usbmodem/rules/paths.h"

namespace taviwireless::fuzz {
namespace {

using namespace usbmodem_lib;

enum Kind { kOurs, kStrangers, kHuge, kLink, kKinds };

// None of the ports is there.
void CheckPorts(USBModem& modem, const std::string& path) {
    const std::string dialled = ReadInfo(path, "CONNECTNODE");
    const std::string all = ReadInfo(path, "DEVICENODE");
    const test::LogCapture log;
    Demand((modem.AssignConnectNode() == 0) == !dialled.empty() && modem.AssignQuaryNode() == -1,
           "the dial port is taken as it stands there", dialled);
    Demand(log.Has("warning: cannot test CONNECTNODE") == !dialled.empty(), "with a warning");
    size_t ports = dialled.empty() ? 0 : 1;
    for (const std::string& port : Split(all, ',')) {
        ports += port != dialled || dialled.empty() ? 1 : 0;
    }
    for (const auto& line : log.Lines()) {
        ports -= line.text.rfind("usbmodem_channel.cpp", 0) == 0 ? 1 : 0;  // cannot be opened
    }
    Demand(ports == 0, "each port is tried once", log.Text());
    Demand(std::filesystem::is_empty(kLockDirectory), "no lock is left", all);
}

}  // namespace

void Fuzz(Input input) {
    const unsigned kind = input.Choice(kKinds);
    const std::string suffix = input.Text();
    if (suffix.size() > 200 || suffix.find('/') != suffix.npos) {
        return;
    }
    const std::string path = std::string(kInfoDirectory) + kInfoName + suffix;
    test::WriteFile(kind == kLink ? "/tmp/elsewhere" : path,
                    input.Rest() + (kind == kHuge ? std::string((1 << 16) + 1, '#') : ""));
    const bool isOurs = kind == kOurs ||
                        (kind == kStrangers && chown(path.c_str(), 65534, 65534) != 0) ||
                        (kind == kLink && symlink("/tmp/elsewhere", path.c_str()) != 0);
    const bool isNumber = std::regex_match(suffix, std::regex("0|-?[1-9][0-9]{0,9}")) &&
                          static_cast<int>(std::stoll(suffix)) == std::stoll(suffix) &&
                          suffix != "-1";
    const std::optional<int> id = InterfaceIdIn(kInfoName + suffix, kInfoName);
    Demand(id.has_value() == isNumber && (!id || InfoPath(*id) == path), "a number is an id",
           suffix);
    USBModemList list;
    Demand(list.SearchInfoPath() == 0 && list.end() - list.begin() == (isNumber && isOurs ? 1 : 0),
           "a file of ours with an id is a modem", suffix);
    for (USBModem& modem : list) {
        Demand(modem.GetDevId() == "usbmodem" + std::to_string(static_cast<unsigned>(*id)),
               "it has its id", suffix);
        CheckPorts(modem, path);
    }
    unlink(path.c_str());
    list.DropUnplugged();
    Demand(list.begin() == list.end(), "it goes with its file", suffix);
}

}  // namespace taviwireless::fuzz
