// SPDX-License-Identifier: MIT
// taviwireless modem, end to end through the modem service on a bus of its own.
#include <signal.h>

#include "tests/cli/cli_runs.h"
#include "tests/support/bus.h"
#include "tests/support/wait.h"

namespace taviwireless::test {
namespace {

using testing::HasSubstr;
using testing::StartsWith;

struct Step {
    std::string command;  // its words, with a blank between them
    const char* input;
    int status;
    std::string text;  // in what is printed
};

void Take(const std::vector<Step>& steps) {
    for (const Step& step : steps) {
        SCOPED_TRACE(step.command + ": " + step.text);
        std::istringstream words(step.command);
        const std::istream_iterator<std::string> first(words);
        const RunResult result = Modem({first, {}}, step.input);
        EXPECT_EQ(result.status, step.status);
        EXPECT_THAT(result.err, StartsWith(step.status == 0 ? "" : "taviwireless: "));
        EXPECT_THAT(result.out + result.err, HasSubstr(step.text));
    }
}

TEST(ServiceCommands, ListShowsWhatEveryModemSays) {
    ServedModems situation({"--modem", "12d1,operator=Nordnetz,signal=31,ports=dial/at", "--modem",
                            "2001,id=7,pin=1234,ports=dial/at"},
                           {"usbmodem0", "usbmodem7"});
    for (const char* modem : {"/usbmodem0", "/usbmodem7"}) {
        CallObject(modem, "com.merilond.usbmodem.Modem.Look");  // returns when made
    }
    WriteFile("/tmp/usbmodem.info9", "");  // a modem that the service cannot use
    const RunResult result = Modem({"list"});
    EXPECT_EQ(result.status, 0);
    EXPECT_EQ(result.err, "");
    EXPECT_EQ(
        result.out,
        "DEVICE     VENDOR  PRODUCT   OPERATOR  SIGNAL  SIM              PIN LOCK  PIN/PUK LEFT  "
        "STATE         ADDRESS\n"
        "usbmodem0  huawei  E1752     Nordnetz  100%    ready            no        3 / 10        "
        "disconnected  -\n"
        "usbmodem7  D-Link  3G Stick  -         -       wants PIN        yes       3 / 10        "
        "disconnected  -\n"
        "usbmodem9  -       -         -         -       modem not ready  -         - / -         "
        "-             -\n");
}

// A service that shows the modems as objects, or is older: then the bus does not know their name.
struct ServiceOfAge {
    ServiceOfAge(bool isOlder, const std::string& refresh, const std::string& modem)
        : simulator({"--modem", modem}) {
        if (isOlder) {
            std::string rules = ReadFile("/tmp/bus.conf");
            rules.insert(rules.find("</policy>"), "<deny own=\"com.merilond.usbmodem.Objects\"/>");
            WriteFile("/tmp/bus.conf", rules);
            bus.Restart();
        }
        service.emplace(WithShortWaits({"sh", "-c", "exec \"$0\" -f --refresh " + refresh + " 2>&1",
                                        BuiltProgram("usbmodemd")}));
        EXPECT_TRUE(service->Says("usbmodem0 is ready"));
        const bool warns = service->Log().find("are not shown as objects: ") != std::string::npos;
        EXPECT_EQ(warns, isOlder) << service->Log();
    }

    PrivateBus bus;
    ModemSimulator simulator;
    std::optional<ModemService> service;
};

TEST(ServiceCommands, WhatIsKnownIsShownWithoutAskingUnlessTheServiceIsOlder) {
    Json::Value shown;
    for (const bool isOlder : {false, true}) {
        SCOPED_TRACE(isOlder);
        ServiceOfAge situation(isOlder, "1000", "12d1,ports=dial/at");
        const auto asks = [&](const char* command) {
            situation.simulator.Received("0");
            Take({{command, "", 0, "disconnected"}});
            return !situation.simulator.Received("0").empty();
        };
        CallObject("/usbmodem0", "com.merilond.usbmodem.Modem.Look");  // returns when made
        for (const char* const command :
             {"list", "list --json", "status usbmodem0", "status --json usbmodem0"}) {
            EXPECT_TRUE(isOlder ? asks(command) : Eventually([&] { return !asks(command); }));
        }
        EXPECT_TRUE(asks("show usbmodem0"));
        EXPECT_TRUE(Eventually([&] {
            situation.simulator.Received("0");
            Take({{"interfaces", "", 0, "usbmodem0"}, {"usage", "", 0, "usbmodem0"}});
            return situation.simulator.Received("0").empty();
        }));
        Json::Value list = Parse(Modem({"list", "--json"}).out)[0];
        EXPECT_EQ(list["imsi"].isNull() && list["ports"].isNull(), isOlder);
        list["imsi"] = list["ports"] = Json::Value();  // only objects tell them
        EXPECT_EQ(std::exchange(shown, list), isOlder ? list : Json::Value());
    }
}

TEST(ServiceCommands, FailuresAreOneSentenceAndAnExitStatus) {
    ServedModems situation("generic");
    WriteFile("/tmp/usbmodem.info9", "");
    Take({
        {"show usbmodem1", "", kNotFound, "taviwireless: there is no modem usbmodem1; "},
        {"unlock \xff", "", kNotFound, "taviwireless: there is no modem ?; "},
        {"profile set usbmodem1 apn=x", "", kNotFound, "there is no modem usbmodem1; "},
        {"connect usbmodem9", "", kFailure, "modem usbmodem9 is not ready: "},
        {"profile reset usbmodem0", "", kUsage, "the modem service cannot reset a profile; "},
        {"puk usbmodem0", "", kFailure, "the SIM of usbmodem0 does not want its PUK"},
        {"disconnect 0", "", 0, "usbmodem0: disconnected already\n"},
        {"--direct show 0", "", kBusy, "the modem service (process "},
        {"at 0 AT+CREG?", "", 0, "+CREG: 0,1\nOK\n"},
        {"at 0", "AT+NONE\n", 0, "ERROR\n"},
        {"at 9 AT", "", kFailure, "modem usbmodem9 is not ready: "},
    });
    const Json::Value shown = Parse(Modem({"show", "0", "--json"}).out);
    EXPECT_EQ(shown["registration"], "home");
    EXPECT_EQ(shown["ports"][1], "/dev/ttyUSB1");
    EXPECT_EQ(shown["log_file"], "/var/lib/usbmodem/wvdial.log." + shown["imsi"].asString());
    EXPECT_TRUE(shown["interface"].isNull() && shown["bytes_sent"].isNull());
    situation.simulator.Fault("0", "slow=900");
    Take({{"show usbmodem0 --timeout 1", "", kFailure, "not done within 1 s; "}});
}

TEST(ServiceCommands, ADebuggedServiceLogsTheDialogueWithoutCodes) {
    PrivateBus bus;
    ModemSimulator simulator({"--modem", "generic,pin=9753"});
    ModemService service(WithShortWaits(
        {"sh", "-c", "exec \"$0\" --foreground --debug 2>&1", BuiltProgram("usbmodemd")}));
    EXPECT_TRUE(service.Says("usbmodem0 is ready"));
    Take({{"-v unlock 0", "9753\n", 0, "telling the service the PIN\n"}});
    EXPECT_TRUE(service.Says("usbmodem0 <- AT+CPIN=***"));
    EXPECT_THAT(service.Log(), testing::Not(HasSubstr("9753")));
}

TEST(ServiceCommands, WithoutTheServiceTheyNameWhatStartsIt) {
    PrivateBus bus;
    ModemSimulator simulator({"--modem", "generic"});
    const std::string line = "taviwireless: the modem service is not running; usbmodemd starts it";
    Take({
        {"list", "", kNoService, line},
        {"profile set usbmodem0 apn=x", "", kNoService, line},
    });
    unsetenv("DBUS_SESSION_BUS_ADDRESS");
    setenv("XDG_RUNTIME_DIR", "/tmp/none", 1);
    Take({{"list", "", kNoService, "there is no session bus here, "}});
    symlink("/tmp", "/tmp/none");  // where the bus has its socket
    Take({{"list", "", kNoService, line}});
    unsetenv("XDG_RUNTIME_DIR");
}

TEST(ServiceCommands, TheBusStartsTheServiceWhereItKnowsHow) {
    PrivateBus bus;
    ModemSimulator simulator({"--modem", "generic,ports=dial/at"});
    std::string rules = ReadFile("/tmp/bus.conf");
    rules.insert(rules.find("<auth>"), "<servicedir>/tmp/services</servicedir>");
    WriteFile("/tmp/bus.conf", rules);
    WriteFile("/tmp/services/com.merilond.usbmodem.service",
              "[D-BUS Service]\nName=com.merilond.usbmodem\nExec=\"" + BuiltProgram("usbmodemd") +
                  "\" --foreground\n");
    bus.Restart();
    Take({{"status usbmodem0", "", 0, "usbmodem0: disconnected\n"}});
}

TEST(ServiceCommands, OnlyAWellFormedPINIsTriedAndNothingElseBeforeItIsRight) {
    ServedModems situation("generic,pin=1234");
    Take({
        {"unlock usbmodem0", "", kFailure, "standard input ended before there was a line"},
        {"unlock usbmodem0", "12a4\n", kUsage, "a PIN has 4 to 8 digits; nothing was sent"},
        {"unlock usbmodem0", "1111\n", kFailure, "refused the PIN; 2 attempts are left\n"},
        {"connect usbmodem0", "", kFailure, "the SIM of usbmodem0 is not ready; "},
        {"profile set usbmodem0 apn=x", "", kFailure, "the modem service did not set"},
        {"profile show usbmodem0", "", kFailure, "cannot read the profile of usbmodem0; "},
        {"pin protect usbmodem0", "1234\n", kFailure, "wants its PIN; taviwireless modem"},
        {"unlock usbmodem0", "1234\n", 0, "usbmodem0: the SIM is ready\n"},
        {"unlock usbmodem0", "", 0, "usbmodem0: the SIM is ready already; "},
    });
}

TEST(ServiceCommands, TheLastAttemptIsKeptUnlessForced) {
    ServedModems situation("generic,pin=1234,attempts=1,puk=87654321");
    Take({
        {"unlock usbmodem0", "1111\n", kFailure,
         "allows one more PIN, and after a wrong one it wants its PUK; add --force to use it\n"},
        {"unlock --force usbmodem0", "1111\n", kFailure,
         "0 attempts are left, and the SIM wants its PUK: taviwireless modem puk usbmodem0\n"},
        {"puk usbmodem0", "1234\n", kUsage, "a PUK has 8 digits; nothing was sent"},
        {"puk usbmodem0", "11111111\n4321\n", kFailure, "refused the PUK; 9 attempts are "},
        {"puk usbmodem0", "87654321\n4321\n", 0, "usbmodem0: the SIM is ready\n"},
    });
}

TEST(ServiceCommands, TheProtectionIsSwitchedAndThePINChanged) {
    ServedModems situation("generic,pin=1234,lock=off");
    Take({
        {"pin set usbmodem0", "", kFailure, "taviwireless modem pin protect usbmodem0"},
        {"pin protect usbmodem0", "1234\n", 0, "is protected by its PIN from now on\n"},
        {"pin protect usbmodem0", "", 0, "the SIM is protected by its PIN already\n"},
        {"pin set usbmodem0", "1234\n4321\n", 0, "usbmodem0: the PIN is changed\n"},
        {"pin unprotect usbmodem0 --json", "4321\n", 0, "\"pin_lock\": false"},
    });
}

TEST(ServiceCommands, AProfileIsSetAndShownWithoutItsPassword) {
    ServedModems situation("generic,operator=Nordnetz,apn=web.nord");
    const Json::Value modem = Parse(Modem({"show", "usbmodem0", "--json"}).out);
    EXPECT_EQ(modem["pin_lock"], false);
    EXPECT_EQ(modem["profile"]["isp"], "Nordnetz - web.nord");
    EXPECT_EQ(modem["profile"]["password"], "********");
    EXPECT_EQ(modem["profile"]["default_route"], false);
    EXPECT_EQ(
        Modem({"profile", "set", "0", "user=a \"b\\", "isp=a=b", "password"}, "s3cret  =\n").status,
        0);
    Take({
        {"profile show usbmodem0", "", 0, "User           a \"b\\\nPassword       ********\n"},
        {"show usbmodem0 --show-secrets", "", 0, "Profile: Password       s3cret  =\n"},
        {"--json profile show usbmodem0", "", 0, "\"isp\": \"a=b\""},
        {"--json profile show usbmodem0 --show-secrets", "", 0, "\"s3cret  =\""},
    });
}

TEST(ServiceCommands, ConnectShowTheStateAndHangUp) {
    InstallDialler(kSaysConnected);
    ServedModems situation("generic");
    const Json::Value connected = Parse(Modem({"--json", "connect", "usbmodem0"}).out);
    EXPECT_EQ(connected["state"], "connected");
    EXPECT_EQ(connected["address"], "127.0.0.1");
    EXPECT_EQ(Modem({"connect", "0"}).out, "usbmodem0: connected already, 127.0.0.1 on lo\n");
    EXPECT_EQ(Modem({"status", "usbmodem0"}).out, "usbmodem0: connected, 127.0.0.1 on lo\n");
    EXPECT_EQ(Modem({"interfaces"}).out, "DEVICE     INTERFACE\nusbmodem0  lo\n");
    EXPECT_EQ(Modem({"disconnect", "usbmodem0"}).out, "usbmodem0: disconnected\n");
}

TEST(ServiceCommands, WhyTheDiallerGaveUpIsInTheSentence) {
    WriteFile("/etc/ppp/peers/wvdial", "noauth\n");  // there is no dialler
    ServedModems situation("generic");
    Take(
        {{"connect usbmodem0", "", kFailure, "is not connected: cannot run /usr/tavi/bin/wvdial"}});
    unlink("/etc/ppp/peers/wvdial");
    Take(
        {{"connect usbmodem0", "", kFailure, "cannot change /etc/ppp/peers/wvdial: No such file"}});
    InstallDialler("echo '--> No Carrier!  Trying again.\n--> Disconnecting at noon' >&2");
    Take({{"connect usbmodem0", "", kFailure, "did not take the call (NO CARRIER); are APN"}});
    InstallDialler();
    Take({
        {"connect usbmodem0 --no-wait", "", 0, "usbmodem0: connecting after"},
        {"unlock usbmodem0", "", kBusy, ""},
        {"connect usbmodem0", "", kBusy, "is connecting already; "},
    });
}

TEST(ServiceCommands, ADialThatTakesTooLongIsHungUp) {
    InstallDialler();
    ServedModems situation("generic");
    // On a machine so busy that the time is over before it dials, "nothing was dialled".
    Take({{"connect usbmodem0 --timeout 3", "", kFailure, " 3 s; "}});
    EXPECT_TRUE(Eventually([] { return !Exists("/var/lib/usbmodem/usbmodem.pid.0"); }));
}

TEST(ServiceCommands, AnInterruptedDialIsHungUp) {
    InstallDialler();
    for (const bool isDirect : {false, true}) {
        SCOPED_TRACE(isDirect);
        std::optional<ServedModems> situation;
        std::optional<ModemSimulator> simulator;
        isDirect ? void(simulator.emplace(std::vector<std::string>{"--modem", "generic"}))
                 : void(situation.emplace("generic"));
        Process connect(WithShortWaits({BuiltProgram("taviwireless"), "--json", "modem",
                                        isDirect ? "--direct" : "--json", "connect", "0"}));
        EXPECT_TRUE(Eventually([] { return Exists("/var/lib/usbmodem/usbmodem.pid.0"); }));
        connect.Signal(SIGINT);
        EXPECT_EQ(connect.ReadLine(), "{");
        EXPECT_EQ(connect.ReadLine(),
                  "  \"error\": \"usbmodem0: interrupted; the dialling is given up\"");
        EXPECT_EQ(connect.Wait(), 128 + SIGINT);
        EXPECT_TRUE(Eventually([] { return !Exists("/var/lib/usbmodem/usbmodem.pid.0"); }));
    }
}

TEST(ServiceCommands, WatchPrintsADocumentAtEachChangeUntilItIsEnded) {
    for (const bool isOlder : {false, true}) {
        SCOPED_TRACE(isOlder);
        ServiceOfAge situation(isOlder, "1", "generic,signal=31");
        Process watch({BuiltProgram("taviwireless"), "--json", "modem", "watch", "usbmodem0"});
        EXPECT_EQ(Parse(watch.ReadLine().value_or(""))["signal"], 100);
        situation.simulator.Set("0", "signal", "0");
        Json::Value signal = 100;
        while (signal == 100) {  // the first look may still tell more
            signal = Parse(watch.ReadLine().value_or(""))["signal"];
        }
        EXPECT_EQ(signal, 0);
        watch.Signal(SIGINT);
        EXPECT_EQ(watch.Wait(), 0);
        EXPECT_EQ(watch.ReadLine(), std::nullopt);
    }
}

TEST(ServiceCommands, WatchDrawsTheLastSignals) {
    ServiceOfAge situation(false, "1", "generic,signal=31");
    Process watch({"env", "LC_ALL=C", BuiltProgram("taviwireless"), "modem", "watch", "0"});
    const auto reads = [&watch](const std::string& text) {
        for (;;) {
            const auto line = watch.ReadLine();
            if (!line || line->find(text) != line->npos) {
                return line.has_value();
            }
        }
    };
    EXPECT_TRUE(reads("100% #"));
    situation.simulator.Set("0", "signal", "10");
    EXPECT_TRUE(reads("32% #-"));
}

TEST(ServiceCommands, WatchEndsWithTheService) {
    for (const bool withTheBus : {false, true}) {
        ServedModems situation("generic");
        Process watch({BuiltProgram("taviwireless"), "modem", "--json", "watch"});
        EXPECT_EQ(Parse(watch.ReadLine().value_or(""))[0]["id"], "usbmodem0");
        if (withTheBus) {
            situation.bus.Restart();
        } else {
            situation.service.End();
        }
        EXPECT_EQ(watch.Wait(), kNoService);
    }
}

}  // namespace
}  // namespace taviwireless::test
