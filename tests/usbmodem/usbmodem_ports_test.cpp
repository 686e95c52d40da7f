// SPDX-License-Identifier: MIT
// Finding the ports of a modem and making its record usable.
#include "tests/support/descriptors.h"
#include "tests/support/files.h"
#include "tests/support/sleep_capture.h"
#include "tests/usbmodem/opened_modem.h"

namespace taviwireless::test {
namespace {

using testing::ElementsAre;
using testing::IsEmpty;
using usbmodem_lib::USBModem;

// A simulated modem, its record as new, and no real sleeping.
struct NewModem {
    explicit NewModem(const std::string& description)
        : simulator({"--modem", description + ",id=1"}), record(1, kInfo1) {}

    ModemSimulator simulator;
    SleepCapture sleeps;
    LogCapture log;
    USBModem record;
};

TEST(QueryNode, IsTheFirstPortThatAnswersAndOnlyItStaysOpen) {
    NewModem modem("generic,ports=dial/mute/at/at");
    ASSERT_EQ(modem.record.AssignConnectNode(), 0);
    modem.log.Clear();
    const auto before = OpenDescriptors();
    EXPECT_EQ(modem.record.AssignQuaryNode(), 0);
    EXPECT_EQ(modem.log.Lines().size(), 1u) << modem.log.Text();
    EXPECT_TRUE(modem.log.Has("No respond on modem cmd AT+CPIN?"));
    EXPECT_EQ(OpenDescriptors().size(), before.size() + 1);
    std::string reply;
    EXPECT_EQ(modem.record.ModemCmd("AT+CGMM", reply), 0);
    EXPECT_THAT(modem.simulator.Received("1.2"), ElementsAre("AT+CPIN?", "AT+CGMM"));
    EXPECT_THAT(modem.simulator.Received("1.3"), IsEmpty());
    modem.record.CloseFileDevice();
    EXPECT_EQ(OpenDescriptors(), before);
}

TEST(Init, AfterAFailedOneAsksForEverythingOnceInItsOrder) {
    NewModem modem("12d1,ports=dial/at");
    const std::string info = ReadFile(kInfo1);
    WriteFile(kInfo1, "CONNECTNODE=77\n");
    EXPECT_EQ(modem.record.InitInfo(), -1);
    WriteFile(kInfo1, info);
    modem.log.Clear();
    const auto sleeps = modem.sleeps.Calls();
    EXPECT_EQ(modem.record.InitInfo(), 0);
    EXPECT_TRUE(modem.record.IsInited());
    EXPECT_TRUE(modem.record.IsNewPlugIn());
    EXPECT_THAT(modem.simulator.Received("1.0"), ElementsAre("AT+CPIN?"));
    EXPECT_THAT(modem.simulator.Received("1.1"), ElementsAre("AT+CPIN?", "AT+CFUN?", "AT+CFUN=1",
                                                             "AT^CURC?", "AT^CURC=0", "AT+CPIN?"));
    EXPECT_EQ(modem.sleeps.Calls(), sleeps);
    EXPECT_EQ(modem.log.Text(), "");
}

TEST(Init, ForAnotherProcessAsksNothingTwiceAndThatOneNothingAtAll) {
    const struct {
        const char* sim;
        const char* asksLast;
        const char* status;
        const char* imsi;
    } kSIMs[] = {{"", "AT+CIMI", "ready", "001010123456789"},
                 {",pin=1234", "AT+CPIN?", "pin_protect", ""}};
    for (const auto& row : kSIMs) {
        SCOPED_TRACE(row.sim);
        NewModem modem(std::string("12d1,ports=dial/at") + row.sim);
        std::string findings;
        {
            USBModem prober(1, kInfo1);
            ASSERT_EQ(prober.MakeReady(findings), 0);
        }
        EXPECT_THAT(modem.simulator.Received("1"),
                    ElementsAre("AT+CPIN?", "AT+CFUN?", "AT+CFUN=1", "AT^CURC?", "AT^CURC=0",
                                row.asksLast));
        EXPECT_EQ(modem.record.TakeOver(findings), 0);
        EXPECT_TRUE(modem.record.IsInited());
        EXPECT_TRUE(modem.record.IsPortAlive());
        EXPECT_EQ(modem.record.Known().simStatus, row.status);
        EXPECT_EQ(modem.record.Known().imsi, row.imsi);
        EXPECT_THAT(modem.simulator.Received("1"), IsEmpty());
    }
}

TEST(Init, TriesThreeTimesForEachPortWithASecondBetween) {
    const struct {
        const char* info;
        const char* attempt;
        const char* failure;
    } kInfos[] = {
        {"", "no respond when get connect node, sleep 1 sec [",
         "failed on parsing connect device node"},
        {"CONNECTNODE=77\nDEVICENODE=77\n", "No respond on setting quary device node, wait 1 sec [",
         "failed on parsing quary device node"},
    };
    for (const auto& row : kInfos) {
        SCOPED_TRACE(row.info);
        SleepCapture sleeps;
        LogCapture log;
        WriteFile(kInfo1, row.info);
        USBModem record(1, kInfo1);
        const auto before = OpenDescriptors();
        EXPECT_EQ(record.InitInfo(), -1);
        EXPECT_FALSE(record.IsInited());
        EXPECT_THAT(sleeps.Calls(), ElementsAre(1, 1, 1));
        for (const char* index : {"0]", "1]", "2]"}) {
            EXPECT_EQ(log.Count(row.attempt + std::string(index)), 1) << log.Text();
        }
        EXPECT_EQ(log.Count(row.failure), 1);
        EXPECT_TRUE(log.Has("Cannot parsing USB_ID_VENDOR from /tmp/usbmodem.info1"));
        EXPECT_EQ(OpenDescriptors(), before);
    }
}

TEST(Init, FailsWithAClosedChannelWhenTheModemRefusesASettingOrDoesNotAnswerIt) {
    const struct {
        const char* command;
        const char* refused;
        const char* notAnswered;
        const char* log;
    } kSettings[] = {{"AT+CFUN=1", "error on setting hardware function lvl, ret: ERROR",
                      "error on modem cmd: AT+CFUN=1", "failed on setting hardware function lvl"},
                     {"AT^CURC=0", "error on changing unsolicited reports setting, ret: ERROR",
                      "error on modem cmd: change unsolicited reports setting",
                      "failed on disabling Unsolicited Reports"}};
    for (const auto& row : kSettings) {
        SCOPED_TRACE(row.command);
        NewModem modem("12d1,ports=dial/at");
        const auto before = OpenDescriptors();
        for (const bool isAnswered : {true, false}) {
            modem.simulator.Fault("1", isAnswered ? "off" : "noecho");
            modem.simulator.Reply("1", row.command, isAnswered ? Framed({"ERROR"}) : "");
            EXPECT_EQ(modem.record.InitInfo("/dev/ttyUSB1"), -1);
            EXPECT_TRUE(modem.log.Has(isAnswered ? row.refused : row.notAnswered));
            EXPECT_EQ(OpenDescriptors(), before);
        }
        EXPECT_EQ(modem.log.Count(row.log), 2) << modem.log.Text();
        EXPECT_FALSE(modem.record.IsInited());
    }
}

}  // namespace
}  // namespace taviwireless::test
