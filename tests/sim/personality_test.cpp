// The personalities that come with the program answer everything the library asks such a modem, in
// the shape it reads.
#include <gmock/gmock.h>
#include <taviwireless/usbmodem_atif.h>

#include <memory>
#include <set>
#include <sstream>

#include "tests/sim/client.h"
#include "tests/support/files.h"
#include "tests/support/modem_simulator.h"

namespace taviwireless::test {
namespace {

using usbmodem_lib::USBModem_ATIF;

struct DeleteCommandSet {
    void operator()(USBModem_ATIF* commands) const { USBModem_ATIF::DeleteATIF(commands); }
};

// A modem, its command set, and a line to it.
class Personality {
  public:
    explicit Personality(const std::string& name)
        : simulator_({"--modem", name + ",pin=1234,lock=off,imsi=466011234567890,roaming=yes"}),
          commands_(USBModem_ATIF::CreateATIF(name)),
          client_(name == "generic" || name == "2001" ? 1 : 2) {
        client_.Ask("ATE0");
    }

    USBModem_ATIF& Commands() { return *commands_; }
    ModemSimulator& Simulator() { return simulator_; }

    // The reply without carriage returns and blank lines.
    std::string Ask(const std::string& command) {
        std::string clean;
        for (const char c : client_.Ask(command)) {
            if (c != '\r' && !(c == '\n' && (clean.empty() || clean.back() == '\n'))) {
                clean += c;
            }
        }
        return clean;
    }

    std::string Parse(const std::string& command,
                      int (USBModem_ATIF::*parse)(const std::string&, std::string&)) {
        std::string result;
        EXPECT_EQ((*commands_.*parse)(Ask(command), result), 0) << command;
        return result.substr(std::min(result.size(), result.find_first_not_of(' ')));
    }

  private:
    ModemSimulator simulator_;
    std::unique_ptr<USBModem_ATIF, DeleteCommandSet> commands_;
    Client client_;
};

class PersonalityTest : public testing::TestWithParam<const char*> {};

INSTANTIATE_TEST_SUITE_P(All, PersonalityTest, testing::Values("generic", "12d1", "2001"));

TEST_P(PersonalityTest, AnswersEveryQueryInTheShapeThatIsRead) {
    Personality modem(GetParam());
    USBModem_ATIF& set = modem.Commands();
    EXPECT_EQ(set.ParseRetStringQuarySIMStatus(modem.Ask(set.GetATCommandQuarySIMStatus())), 0);
    EXPECT_EQ(modem.Parse(set.GetATCommandGetRSSI(), &USBModem_ATIF::ParseRetStringGetRSSI), "17");
    EXPECT_EQ(modem.Parse(set.GetATCommandGetIMSI(), &USBModem_ATIF::ParseRetStringDefaultFormat),
              "466011234567890");
    EXPECT_EQ(
        modem.Parse(set.GetATCommandGetDefaultISP(), &USBModem_ATIF::ParseRetStringDefaultISP),
        "Example Mobile");
    EXPECT_EQ(
        modem.Parse(set.GetATCommandGetDefaultAPN(), &USBModem_ATIF::ParseRetStringDefaultAPN),
        "internet");
    EXPECT_NE(
        modem.Parse(set.GetATCommandGetVendorName(), &USBModem_ATIF::ParseRetStringDefaultFormat),
        "");
    EXPECT_NE(
        modem.Parse(set.GetATCommandGetProductName(), &USBModem_ATIF::ParseRetStringDefaultFormat),
        "");
    // Without the cell behind it, the state of registration is not taken for roaming.
    EXPECT_EQ(modem.Parse(set.GetATCommandGetRoaming(), &USBModem_ATIF::ParseRetStringGetRoaming),
              std::string(GetParam()) == "generic" ? "false" : "true");
}

TEST(PersonalityFile, OfAPersonsOwnAddsToAnotherOne) {
    WriteFile("/tmp/mine.json", R"({"extends": "12d1", "vendor_id": "19d2", "ports": ["at"],
        "variables": {"band": "900"},
        "commands": {"AT+CSQ": null,
                     "AT+BAND?": {"reply": ["+BAND: {band}", "{imsi}"]},
                     "AT+BAND=*": {"set": {"band": 2, "operator": "none"}}}})");
    ModemSimulator simulator({"--modem", "/tmp/mine.json,ports=2"});
    EXPECT_EQ(ReadFile("/tmp/usbmodem.info0"),
              "USB_ID_VENDOR=19d2\nCONNECTNODE=\nDEVICENODE=0,1\n");
    Client client(1);
    client.Ask("ATE0");
    EXPECT_EQ(client.Ask("AT+CSQ"), "\r\nERROR\r\n");
    EXPECT_EQ(client.Ask("AT+BAND=1,\"18 00\""), "\r\nOK\r\n");
    EXPECT_EQ(client.Ask("AT+BAND?"), "\r\n+BAND: 18 00\r\n001010123456789\r\n\r\nOK\r\n");
    EXPECT_EQ(client.Ask("AT^CURC?"), "\r\n^CURC: 1\r\n\r\nOK\r\n");
}

}  // namespace
}  // namespace taviwireless::test
