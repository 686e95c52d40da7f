// SPDX-License-Identifier: MIT
// taviwireless modem --direct, end to end: the program, the library, serial lines and simulated
// modems; and what is the same with and without the modem service.
#include "tests/cli/cli_runs.h"
#include "tests/support/modem_simulator.h"
#include "usbmodem/rules/dial_log.h"

namespace taviwireless::test {
namespace {

using testing::HasSubstr;
using testing::StartsWith;

TEST(DirectCommands, ADeadModemDoesNotHideTheOneBehindIt) {
    WriteFile("/tmp/usbmodem.info0", "CONNECTNODE=77\nDEVICENODE=77,78\n");
    ModemSimulator simulator({"--modem", "12d1,id=1,ports=dial/at"});
    const Json::Value modems = Parse(DirectModem({"list", "--json"}).out);
    ASSERT_EQ(modems.size(), 2u);
    EXPECT_EQ(modems[0]["answers"], false);
    EXPECT_TRUE(modems[0]["vendor"].isNull() && modems[0]["sim_state"].isNull());
    EXPECT_EQ(modems[1]["sim_state"], "ready");
    EXPECT_EQ(modems[1]["signal"], 54);
    const std::string list = "'" + BuiltProgram("taviwireless") + "' modem --direct list";
    EXPECT_THAT(RunProgram(WithShortWaits({"script", "-qec", list, "/dev/null"})).out,
                testing::ContainsRegex("Asking usbmodem0, usbmodem1 .*DEVICE .*usbmodem0 +- .*"
                                       "usbmodem1 +E1752 +"));
}

TEST(DirectCommands, FailuresAreOneSentenceAndAnExitStatus) {
    const struct {
        std::vector<std::string> arguments;
        int status;
        std::string sentence;
    } kCases[] = {
        {{"show", "usbmodem0"}, kNotFound, "there is no modem usbmodem0; "},
        {{"status", "0"}, kNotFound, "there is no modem usbmodem0; "},
        {{"at", "0", "AT\rAT"}, kUsage, "an AT command is printable ASCII"},
    };
    for (const auto& failing : kCases) {
        SCOPED_TRACE(failing.sentence);
        const RunResult text = DirectModem(failing.arguments);
        EXPECT_EQ(text.status, failing.status);
        EXPECT_THAT(text.err, StartsWith("taviwireless: " + failing.sentence));
    }
    const RunResult json = DirectModem({"--json", "show", "usbmodem0"});
    EXPECT_EQ(json.status, kNotFound);
    EXPECT_THAT(Parse(json.out)["error"].asString(), StartsWith(kCases[0].sentence));
}

TEST(DirectCommands, WhyPortsCannotBeUsedIsSaidAtOnce) {
    TAVI_NEEDS_A_STRANGER();
    ModemSimulator simulator({"--modem", "generic,ports=dial/at"});
    Shell("chgrp tty /dev/pts/*; chmod 660 /dev/pts/*");
    const RunResult stranger =
        RunAsNobody({BuiltProgram("taviwireless"), "modem", "--direct", "show", "0"});
    EXPECT_EQ(stranger.status, kFailure);
    EXPECT_THAT(stranger.err,
                HasSubstr("you may not use /dev/ttyUSB1 of usbmodem0: that takes root "
                          "or a member of group tty"));
    const Process holder({"sleep", "1000"});
    WriteFile("/var/lock/LCK..ttyUSB1", std::to_string(holder.Pid()) + "\n");
    const RunResult held = DirectModem({"show", "0"});
    EXPECT_EQ(held.status, kFailure);
    EXPECT_THAT(held.err, HasSubstr("sleep (process " + std::to_string(holder.Pid()) +
                                    ") holds /dev/ttyUSB1 of usbmodem0; end it"));
    WriteFile("/tmp/usbmodem.info0", "CONNECTNODE=77\nDEVICENODE=77,78\n");
    EXPECT_THAT(DirectModem({"show", "0"}).err, HasSubstr("its port /dev/ttyUSB77 is not there"));
}

TEST(DirectCommands, WhatTheModemIsToldIsTracedWithoutCodes) {
    ModemSimulator simulator({"--modem", "generic,pin=1234"});
    const RunResult result = DirectModem({"-v", "at", "0", "AT+CPIN = 1234"});
    EXPECT_EQ(result.out, "OK\n");
    EXPECT_THAT(result.err, HasSubstr("usbmodem0 <- AT+CPIN =***"));
    EXPECT_THAT(result.err, testing::Not(HasSubstr("1234")));
    EXPECT_THAT(DirectModem({"at", "0"}, "AT+CPIN?\n").out, HasSubstr("+CPIN: READY\nOK\n"));
}

TEST(DialLog, TheReasonIsReadFromWhatTheDiallerSays) {
    const struct {
        const char* log;
        const char* reason;
    } kLogs[] = {
        {"--> Sending: ATDT*99#\nNO CARRIER\n--> No Carrier!  Trying again.\n", "(NO CARRIER)"},
        {"BUSY\n--> The line is busy. Trying again.\n", "(BUSY)"},
        {"--> No dial tone.  Trying again in 5 seconds.\n", "no dial tone"},
        {"--> Bad init string.\n--> Disconnecting at noon\n", "is the APN right?"},
        {"--> Authentication (PAP) failed\n--> The PPP daemon has died. (exit code = 19)\n",
         "(authentication failed)"},
        {"--> The PPP daemon has died: A modem hung up the phone (exit code = 16)\n",
         "The PPP daemon has died: A modem hung up the phone (exit code = 16)"},
        {"cannot run /usr/tavi/bin/wvdial: No such file\n", "cannot run /usr/tavi/bin/wvdial: No"},
    };
    for (const auto& log : kLogs) {
        EXPECT_THAT(usbmodem_lib::dial_log::ReasonIn(log.log), HasSubstr(log.reason));
    }
    EXPECT_EQ(usbmodem_lib::dial_log::ReasonIn("+CSQ: No Carrier\n--> Modem initialized.\n"), "");
}

TEST(DirectCommands, SetShowAndResetAProfile) {
    ModemSimulator simulator({"--modem", "generic"});
    // The service would take the user's name for a setting.
    EXPECT_EQ(DirectModem({"profile", "set", "usbmodem0", "user=apn=b"}).status, 0);
    EXPECT_THAT(DirectModem({"profile", "show", "usbmodem0"}).out,
                HasSubstr("User           apn=b\n"));
    EXPECT_EQ(DirectModem({"profile", "reset", "usbmodem0"}).status, 0);
    EXPECT_EQ(Parse(DirectModem({"profile", "show", "usbmodem0", "--json"}).out)["user"],
              "Unknown");
}

TEST(DirectCommands, ConnectShowTheStateAndHangUp) {
    InstallDialler(kSaysConnected);
    ModemSimulator simulator({"--modem", "generic"});
    const Json::Value connected = Parse(DirectModem({"--json", "connect", "usbmodem0"}).out);
    EXPECT_EQ(connected["state"], "connected");
    EXPECT_EQ(connected["address"], "127.0.0.1");
    EXPECT_EQ(DirectModem({"status", "0"}).out, "usbmodem0: connected, 127.0.0.1 on lo\n");
    EXPECT_EQ(DirectModem({"interfaces"}).out, "DEVICE     INTERFACE\nusbmodem0  lo\n");
    const Json::Value usage = Parse(DirectModem({"usage", "0", "--json"}).out)[0];
    EXPECT_TRUE(usage["bytes_sent"].isUInt64() && usage["dialled_at"].asUInt64() > 0) << usage;
    EXPECT_EQ(DirectModem({"disconnect", "usbmodem0"}).out, "usbmodem0: disconnected\n");
    EXPECT_EQ(DirectModem({"disconnect", "0"}).out, "usbmodem0: disconnected already\n");
}

TEST(ProfileCommands, AMistakeChangesNothing) {
    const struct {
        std::string setting;
        std::string sentence;
    } kCases[] = {
        {"apn=x\npass=y", "the value of apn holds a line break"},
        {"IMSI=1", "a profile has no setting IMSI; there are number, user, password, apn"},
        {"roaming=yes", "a profile has no setting roaming"},
        {"default-route=true", "default-route is yes or no"},
        {"number=abc", "number is what the modem dials: digits"},
        {"apn=a b", "apn is a name of the provider's"},
        {"password=x", "password stands alone: it is read from standard input"},
        {"apn", "apn needs a value: apn=VALUE"},
        {"user=" + std::string(1024, 'u'), "the value of user is longer than 1023 bytes"},
        {"user=apn=x", "the value of user holds \"apn=\", which the modem service would take"},
        {"isp=xlocation=1", "the value of isp holds \"location=\""},
        {"user=\xff", "the value of user is not UTF-8"}};
    for (const auto& wrong : kCases) {
        const RunResult result = Modem({"profile", "set", "usbmodem0", "number=1", wrong.setting});
        EXPECT_EQ(result.status, kUsage);
        EXPECT_THAT(result.err, HasSubstr(wrong.sentence));
    }
}

TEST(ModemCommands, NoModemIsNoFailure) {
    EXPECT_THAT(DirectModem({"list"}).out, StartsWith("No modem is plugged in"));
    EXPECT_EQ(DirectModem({"list", "--json"}).out, "[]\n");
}

}  // namespace
}  // namespace taviwireless::test
