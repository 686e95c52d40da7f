// SPDX-License-Identifier: MIT
// Which changes of the info files mean that a modem came or went. No modem answers here: what looks
// for one is left out.
#include "daemon/modem_keeper.h"

#include <dlfcn.h>
#include <gmock/gmock.h>
#include <tavicore/process.h>

#include <filesystem>

#include "tests/support/files.h"
#include "tests/support/log_capture.h"

namespace {

std::vector<std::string> hungUp;  // by their pid files

}  // namespace

// In place of the SDK's: while the first connection is ended, the second modem is unplugged.
int VEXACProcSignalByPidFile(const char* file, int /*signal*/) {
    hungUp.emplace_back(file);
    std::filesystem::remove("/tmp/usbmodem.info2");
    return 0;
}

namespace taviwireless::daemon {

Probe::Probe(int interfaceId, OnEnd onEnd) : interfaceId_(interfaceId), onEnd_(std::move(onEnd)) {}
Probe::~Probe() = default;

}  // namespace taviwireless::daemon

namespace taviwireless::test {
namespace {

using testing::ElementsAre;
using usbmodem_lib::USBModemList;

constexpr char kText[] = "CONNECTNODE=0\nDEVICENODE=0,1\nUSB_ID_VENDOR=12d1\n";

TEST(ModemKeeper, AModemThatGoesWhileAnotherIsHungUpIsHungUpToo) {
    for (const std::string id : {"1", "2"}) {
        WriteFile("/tmp/usbmodem.info" + id, kText);
        WriteFile("/var/lib/usbmodem/usbmodem.pid." + id, "1\n");
    }
    USBModemList list;
    daemon::ModemKeeper keeper(list);
    keeper.Rescan();
    std::filesystem::remove("/tmp/usbmodem.info1");
    keeper.Rescan();
    EXPECT_THAT(hungUp, ElementsAre("/var/lib/usbmodem/usbmodem.pid.1",
                                    "/var/lib/usbmodem/usbmodem.pid.2"));
    EXPECT_EQ(list.begin(), list.end());
}

TEST(ModemKeeper, WhatCountsIsWhatTheFileSays) {
    const std::string file = "/tmp/usbmodem.info1";
    const struct {
        const char* text;
        bool isAnother;
    } kWritings[] = {
        {kText, false},
        {"", false},  // is being written
        {"CONNECTNODE=0\n", false},
        {"CONNECTNODE=5\nDEVICENODE=5,6\n", true},
        {"CONNECTNODE=5\nDEVICENODE=5,6\n", false},
    };
    WriteFile(file, kText);
    USBModemList list;
    daemon::ModemKeeper keeper(list);
    keeper.Rescan();
    LogCapture log;
    for (const auto& writing : kWritings) {
        WriteFile(file, writing.text);
        keeper.Rescan();
        EXPECT_EQ(log.Has("usbmodem1 was plugged in anew"), writing.isAnother) << writing.text;
        log.Clear();
    }
    // Nobody's modem, but a link that somebody has put there.
    std::filesystem::rename(file, "/tmp/elsewhere");
    std::filesystem::create_symlink("/tmp/elsewhere", file);
    keeper.Rescan();
    EXPECT_TRUE(log.Has("usbmodem1 was unplugged"));
    EXPECT_EQ(list.begin(), list.end());
}

}  // namespace
}  // namespace taviwireless::test
