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

RunResult Cli(std::vector<std::string> arguments) {
    arguments.insert(arguments.begin(), BuiltProgram("taviwireless"));
    return RunProgram(arguments);
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
