// taviwireless modem --direct, end to end: the program, the library, serial lines and simulated
// modems; and what is the same with and without the modem service.
#include "tests/cli/cli_runs.h"
#include "tests/support/modem_simulator.h"

namespace taviwireless::test {
namespace {

using testing::HasSubstr;
using testing::StartsWith;

TEST(DirectCommands, ADeadModemDoesNotHideTheOneBehindIt) {
    WriteFile("/tmp/usbmodem.info0", "CONNECTNODE=77\nDEVICENODE=77,78\n");
    ModemSimulator simulator({"--modem", "12d1,id=1,ports=dial/at"});
    const Json::Value modems = Parse(DirectModem({"list", "--json"}).out);
    ASSERT_EQ(modems.size(), 2u);
    EXPECT_EQ(modems[0]["sim_status"], "no_answer");
    EXPECT_TRUE(modems[0]["vendor"].isNull());
    EXPECT_EQ(modems[1]["sim_status"], "ready");
    EXPECT_EQ(modems[1]["signal"], 54);
}

TEST(DirectCommands, FailuresAreOneSentenceAndAnExitStatus) {
    const struct {
        std::vector<std::string> arguments;
        int status;
        std::string sentence;
    } kCases[] = {
        {{"show", "usbmodem0"}, kNotFound, "there is no modem usbmodem0; "},
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
    EXPECT_EQ(connected["net_status"], "connected");
    EXPECT_EQ(connected["ip"], "127.0.0.1");
    EXPECT_EQ(DirectModem({"interfaces"}).out, "MODEM      INTERFACE\nusbmodem0  lo\n");
    EXPECT_EQ(DirectModem({"disconnect", "usbmodem0"}).out, "usbmodem0: disconnected\n");
}

TEST(ProfileCommands, AMistakeChangesNothing) {
    const struct {
        std::string setting;
        std::string sentence;
    } kCases[] = {
        {"apn=x\npass=y", "the value of apn holds a line break"},
        {"IMSI=1", "a profile has no setting IMSI; there are number, user, pass, apn"},
        {"default_gw=yes", "default_gw is true or false"},
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
