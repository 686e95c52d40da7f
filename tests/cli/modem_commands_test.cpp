// taviwireless modem, end to end: the program, the library, serial lines and simulated modems.
#include <gmock/gmock.h>
#include <json/json.h>

#include "tests/support/files.h"
#include "tests/support/modem_simulator.h"
#include "tests/support/process.h"

namespace taviwireless::test {
namespace {

using testing::HasSubstr;
using testing::StartsWith;

constexpr int kFailure = 1;
constexpr int kUsage = 2;
constexpr int kNotFound = 3;
constexpr int kBusy = 4;

RunResult Cli(std::vector<std::string> arguments, const std::string& input = "") {
    arguments.insert(arguments.begin(), BuiltProgram("taviwireless"));
    return RunProgram(arguments, input);
}

Json::Value Parse(const std::string& text) {
    Json::Value document;
    std::istringstream stream(text);
    std::string errors;
    EXPECT_TRUE(Json::parseFromStream(Json::CharReaderBuilder(), stream, &document, &errors))
        << errors << text;
    return document;
}

TEST(ModemCommands, ListShowsWhatEveryModemSays) {
    ModemSimulator simulator({"--modem", "12d1,imsi=262019876543210,operator=Nordnetz,signal=31",
                              "--modem", "2001,id=7,pin=1234"});
    const RunResult result = Cli({"modem", "list"});
    EXPECT_EQ(result.status, 0);
    EXPECT_EQ(result.err, "");
    EXPECT_EQ(
        result.out,
        "DEVICE     VENDOR  PRODUCT   IMSI             OPERATOR  SIGNAL  SIM        PIN LOCK  "
        "PIN/PUK LEFT\n"
        "usbmodem0  huawei  E1752     262019876543210  Nordnetz  100%    ready      off       3 / "
        "10\n"
        "usbmodem7  D-Link  3G Stick  -                -         -       wants PIN  on        3 / "
        "10\n");
}

TEST(ModemCommands, ADeadModemDoesNotHideTheOneBehindIt) {
    ModemSimulator simulator({"--modem", "generic,fault=silent", "--modem", "12d1"});
    const Json::Value modems = Parse(Cli({"--json", "modem", "list"}).out);
    ASSERT_EQ(modems.size(), 2u);
    EXPECT_EQ(modems[0]["sim_status"], "no_answer");
    EXPECT_TRUE(modems[0]["vendor"].isNull());
    EXPECT_EQ(modems[1]["sim_status"], "ready");
    EXPECT_EQ(modems[1]["signal"], 54);
}

TEST(ModemCommands, ShowAddsAPNAndLocation) {
    WriteFile("/usr/tavi/etc/usbmodem/wcdma_list.json",
              R"([{"id": "DE", "isp": [{"name": "Nordnetz"}]}])");
    ModemSimulator simulator({"--modem", "generic,operator=Nordnetz,apn=web.nord"});
    const Json::Value modem = Parse(Cli({"modem", "show", "usbmodem0", "--json"}).out);
    EXPECT_EQ(modem["apn"], "web.nord");
    EXPECT_EQ(modem["location"], "DE");
    EXPECT_EQ(modem["pin_protected"], false);
    EXPECT_THAT(Cli({"modem", "show", "usbmodem0"}).out, HasSubstr("Location      DE\n"));
}

TEST(ModemCommands, FailuresAreOneSentenceAndAnExitStatus) {
    const struct {
        std::vector<std::string> arguments;
        int status;
        std::string sentence;
    } kCases[] = {
        {{"modem", "show", "usbmodem0"}, kNotFound, "there is no modem usbmodem0; "},
        {{"modem", "show"}, kUsage, "ID is required"},
        {{"modem"}, kUsage, "A subcommand is required"},
        {{"modem", "list", "--what"}, kUsage, "The following argument was not expected: --what"},
    };
    for (const auto& failing : kCases) {
        SCOPED_TRACE(failing.sentence);
        const RunResult text = Cli(failing.arguments);
        EXPECT_EQ(text.status, failing.status);
        EXPECT_EQ(text.out, "");
        EXPECT_THAT(text.err, StartsWith("taviwireless: " + failing.sentence));

        auto withJson = failing.arguments;
        withJson.insert(withJson.begin(), "--json");
        const RunResult json = Cli(withJson);
        EXPECT_EQ(json.status, failing.status);
        EXPECT_EQ(json.err, "");
        EXPECT_THAT(Parse(json.out)["error"].asString(), StartsWith(failing.sentence));
    }
}

TEST(ModemCommands, AModemThatDoesNotAnswerIsAFailureOfShow) {
    ModemSimulator simulator({"--modem", "generic,fault=silent"});
    const RunResult result = Cli({"modem", "show", "usbmodem0"});
    EXPECT_EQ(result.status, kFailure);
    EXPECT_EQ(result.err,
              "taviwireless: modem usbmodem0 does not answer on any of its ports; unplug it and "
              "plug it in again\n");
}

TEST(ProfileCommands, SetShowAndResetAProfile) {
    ModemSimulator simulator({"--modem", "generic"});
    EXPECT_EQ(
        Cli({"modem", "profile", "set", "usbmodem0", "user=a b", "pass"}, "s3cret  =\n").status, 0);
    const RunResult hidden = Cli({"modem", "profile", "show", "usbmodem0"});
    EXPECT_THAT(hidden.out, HasSubstr("User           a b\nPassword       ********\n"));
    const Json::Value shown =
        Parse(Cli({"--json", "modem", "profile", "show", "usbmodem0", "--show-secrets"}).out);
    EXPECT_EQ(shown["pass"], "s3cret  =");
    EXPECT_EQ(Cli({"modem", "profile", "reset", "usbmodem0"}).status, 0);
    EXPECT_THAT(Cli({"modem", "profile", "show", "usbmodem0"}).out,
                HasSubstr("User           Unknown\n"));
}

TEST(ProfileCommands, AMistakeChangesNothing) {
    const struct {
        std::string setting;
        std::string sentence;
    } kCases[] = {
        {"apn=x\npass=y", "the value of apn holds a line break"},
        {"IMSI=1", "a profile has no setting IMSI; there are number, user, pass, apn"},
        {"default_gw=yes", "default_gw is true or false"},
        {"user=" + std::string(1024, 'u'), "the value of user is longer than 1023 bytes"}};
    for (const auto& wrong : kCases) {
        const RunResult result =
            Cli({"modem", "profile", "set", "usbmodem0", "number=1", wrong.setting});
        EXPECT_EQ(result.status, kUsage);
        EXPECT_THAT(result.err, HasSubstr(wrong.sentence));
    }
}

// With a dialler that says at once what the real one says in the end.
TEST(ConnectionCommands, ConnectShowTheStateAndHangUp) {
    WriteFile("/etc/ppp/peers/wvdial", "noauth\n");
    WriteFile(
        "/usr/tavi/bin/wvdial",
        "#!/bin/sh\necho '--> Using interface lo secondary DNS address' >&2\nexec sleep 1000\n");
    RunProgram({"chmod", "755", "/usr/tavi/bin/wvdial"});
    ModemSimulator simulator({"--modem", "generic"});
    const Json::Value connected = Parse(Cli({"--json", "modem", "connect", "usbmodem0"}).out);
    EXPECT_EQ(connected["net_status"], "connected");
    EXPECT_EQ(connected["ip"], "127.0.0.1");
    EXPECT_EQ(Cli({"modem", "connect", "usbmodem0"}).status, kBusy);
    EXPECT_EQ(Cli({"modem", "status", "usbmodem0"}).out, "usbmodem0: connected, 127.0.0.1 on lo\n");
    EXPECT_EQ(Cli({"modem", "disconnect", "usbmodem0"}).status, 0);
    EXPECT_EQ(Cli({"modem", "status", "usbmodem0"}).out, "usbmodem0: disconnected\n");
    EXPECT_EQ(Cli({"modem", "disconnect", "usbmodem0"}).status, kFailure);
}

TEST(ConnectionCommands, ADiallerThatGivesUpOrTakesTooLongIsAFailure) {
    WriteFile("/etc/ppp/peers/wvdial", "noauth\n");
    ModemSimulator simulator({"--modem", "generic"});
    const RunResult gaveUp = Cli({"modem", "connect", "usbmodem0"});
    EXPECT_EQ(gaveUp.status, kFailure);
    EXPECT_THAT(gaveUp.err, HasSubstr("the dialler of usbmodem0 gave up; its log is in"));
    WriteFile("/usr/tavi/bin/wvdial", "#!/bin/sh\nexec sleep 1000\n");
    RunProgram({"chmod", "755", "/usr/tavi/bin/wvdial"});
    const RunResult late = Cli({"modem", "connect", "usbmodem0", "--timeout", "1"});
    EXPECT_EQ(late.status, kFailure);
    EXPECT_THAT(late.err, HasSubstr("usbmodem0 is not connected after 1 s; it goes on trying"));
    EXPECT_EQ(Cli({"modem", "connect", "usbmodem0", "--no-wait"}).status, kBusy);
}

TEST(ModemCommands, NoModemIsNoFailure) {
    EXPECT_THAT(Cli({"modem", "list"}).out, StartsWith("No modem is plugged in"));
    EXPECT_EQ(Cli({"modem", "list", "--json"}).out, "[]\n");
}

TEST(ModemCommands, AFullDiskBehindTheOutputIsAFailure) {
    const RunResult result =
        RunProgram({"sh", "-c", BuiltProgram("taviwireless") + " modem list > /dev/full"});
    EXPECT_EQ(result.status, kFailure);
    EXPECT_EQ(result.err, "taviwireless: cannot write the output\n");
}

}  // namespace
}  // namespace taviwireless::test
