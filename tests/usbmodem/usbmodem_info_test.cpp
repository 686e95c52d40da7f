// What a modem tells about itself and its network, and the two settings made at the start.
#include "tests/support/files.h"
#include "tests/usbmodem/opened_modem.h"

namespace taviwireless::test {
namespace {

using testing::ElementsAre;
using testing::HasSubstr;
using testing::IsEmpty;
using usbmodem_lib::USBModem;

constexpr char kDatabase[] = "/usr/tavi/etc/usbmodem/wcdma_list.json";

using Query = std::string (USBModem::*)(bool&);

struct ReadyModem : OpenedModem {
    explicit ReadyModem(const std::string& description = "generic") : OpenedModem(description) {
        EXPECT_EQ(record.UpdateSIMStatus(), 1);
        Received();
    }
};

// The value, and what stands for a set err.
std::string Ask(OpenedModem& modem, Query query) {
    bool err = false;
    const std::string value = (modem.record.*query)(err);
    return err ? value + " (err)" : value;
}

TEST(Query, GivesTheValueOfTheReplyAndKeepsItWhenALaterOneFails) {
    const struct {
        Query query;
        const char* command;
        const char* reply;
        const char* value;
        const char* failure;  // what is logged for the reply ERROR
    } kQueries[] = {
        {&USBModem::GetDefaultAPN, "AT+CGDCONT?", "+CGDCONT: 1,\"IP\",\"net.example\",\"0.0.0.0\"",
         "net.example", "error on reading default APN, ret: ERROR"},
        {&USBModem::GetDefaultISP, "AT+COPS?", "+COPS: 0,0,\"Nord netz\",2", "Nord netz",
         "error on reading ISP, ret: ERROR"},
        {&USBModem::GetIMSI, "AT+CIMI", "466920123456789", "466920123456789",
         "error on parsing string, ret ERROR"},
        {&USBModem::GetProductName, "AT+CGMM", "E1752", "E1752",
         "error on parsing product name, ret: [ERROR"},
        {&USBModem::GetVendorName, "AT+CGMI", "+CGMI: maker", " maker", "error on parsing ERROR"},
    };
    ReadyModem modem;
    for (const auto& row : kQueries) {
        SCOPED_TRACE(row.command);
        modem.log.Clear();
        modem.Answer(row.command, {row.reply, "OK"});
        EXPECT_EQ(Ask(modem, row.query), row.value);
        EXPECT_EQ(modem.log.Text(), "");
        modem.Answer(row.command, {"ERROR"});
        EXPECT_EQ(Ask(modem, row.query), std::string(row.value) + " (err)");
        EXPECT_TRUE(modem.log.Has(row.failure)) << modem.log.Text();
        EXPECT_THAT(modem.Received(), ElementsAre(row.command, row.command));
    }
}

TEST(IMSI, IsSixToFifteenDigits) {
    const struct {
        std::vector<std::string> reply;
        const char* value;
    } kReplies[] = {
        {{"OK"}, " (err)"},
        {{"12345", "OK"}, " (err)"},
        {{"1234567890123456", "OK"}, " (err)"},
        {{"../4669201234", "OK"}, " (err)"},
        {{"^RSSI:18", "466920123456789", "OK"}, " (err)"},
        {{"+CIMI: 123456", "OK"}, " 123456"},
        {{"OK"}, " 123456 (err)"},
    };
    ReadyModem modem;
    for (const auto& row : kReplies) {
        SCOPED_TRACE(row.reply[0]);
        modem.log.Clear();
        modem.Answer("AT+CIMI", row.reply);
        EXPECT_EQ(Ask(modem, &USBModem::GetIMSI), row.value);
        EXPECT_EQ(modem.log.Has("error on parsing string, ret "),
                  std::string(row.value).find("(err)") != std::string::npos);
    }
}

TEST(Query, OfALockedCardSendsNothing) {
    OpenedModem modem("generic,pin=1234");
    ASSERT_EQ(modem.record.UpdateSIMStatus(), 0);
    modem.Received();
    EXPECT_EQ(Ask(modem, &USBModem::GetDefaultAPN), " (err)");
    EXPECT_TRUE(modem.log.Has("cannot get default APN when PIN is not ready"));
    EXPECT_EQ(Ask(modem, &USBModem::GetDefaultISP), "");
    EXPECT_EQ(Ask(modem, &USBModem::GetIMSI), " (err)");
    EXPECT_EQ(Ask(modem, &USBModem::GetRoaming), "false");
    bool err = false;
    EXPECT_EQ(modem.record.GetSignalQuality(err), 0);
    EXPECT_FALSE(err);
    EXPECT_THAT(modem.Received(), IsEmpty());
    EXPECT_EQ(Ask(modem, &USBModem::GetProductName), "3G Modem");
}

TEST(Signal, IsAPercentageOfTheScale) {
    const struct {
        const char* reply;
        int quality;
        const char* error;
    } kSignals[] = {
        {"+CSQ: 16,99", 51, ""},
        {"+CSQ: 31,99", 100, ""},
        {"+CSQ: 99,99", 0, ""},
        {"+CSQ: 32,99", 0, "returned RSSI 32 is not in range 0 ~ 31"},
        {"+CSQ: -1,99", 0, "returned RSSI -1 is not in range 0 ~ 31"},
        {"+CSQ: 99999999999,99", 0, "returned RSSI 2147483647 is not in range 0 ~ 31"},
        {"ERROR", 0, "error on getting RSSI: 2147483647"},  // the last one that was read
        {"OK", 0, ""},                                      // no value at all reads as 0
    };
    ReadyModem modem;
    for (const auto& signal : kSignals) {
        SCOPED_TRACE(signal.reply);
        modem.log.Clear();
        modem.Answer("AT+CSQ", {signal.reply});
        bool err = false;
        EXPECT_EQ(modem.record.GetSignalQuality(err), signal.quality);
        EXPECT_EQ(err, *signal.error != '\0');
        EXPECT_EQ(modem.log.Text().empty(), !err);
        EXPECT_THAT(modem.log.Text(), HasSubstr(signal.error));
    }
}

TEST(UnsolicitedReports, AreSwitchedUnlessTheReplyHoldsTheWantedDigit) {
    OpenedModem modem("12d1");
    modem.Answer("AT^CURC?", {"^CURC: 10", "OK"});  // any digit of the reply counts
    EXPECT_EQ(modem.record.SetUnsolicitedReports(false), 0);
    EXPECT_EQ(modem.record.SetUnsolicitedReports(true), 0);
    EXPECT_THAT(modem.Received(), ElementsAre("AT^CURC?", "AT^CURC?"));
    modem.Answer("AT^CURC?", {"^CURC: 0", "OK"});
    EXPECT_EQ(modem.record.SetUnsolicitedReports(true), 0);
    EXPECT_THAT(modem.Received(), ElementsAre("AT^CURC?", "AT^CURC=1"));
    EXPECT_EQ(modem.log.Text(), "");
}

TEST(Location, IsTheFirstThatListsTheOperatorInADatabaseThatCanBeRead) {
    const struct {
        std::string database;
        const char* id;  // null: it cannot be read
    } kDatabases[] = {
        {R"([{"id":"A","isp":[{"name":"Other"},{"name":"Example Mobile"}]},
             {"id":"B","isp":[{"name":"Example Mobile"}]}])",
         "A"},
        {R"([{"id":"A","isp":[{"name":"example mobile"},{"name":"Example Mobile "}]}])", ""},
        {"[{", nullptr},
        {R"([{"id":"A","isp":[{"name":"Example Mobile"}]},])", nullptr},
        {"", nullptr},
        {std::string(2000, '['), nullptr},
        {R"([7, null, [], {"isp":[{"name":"Example Mobile"}]}, {"id":"no isp"},
             {"id":"isp is text","isp":"Example Mobile"},
             {"id":{"an":"object"},"isp":[{"name":"Example Mobile"}]},
             {"id":"odd members","isp":[1, [], {}, {"name":{}}, {"nom":"Example Mobile"}]},
             {"id":5,"isp":[{"name":"Example Mobile","mcc":"001"}],"other":true}])",
         "5"},
    };
    ReadyModem modem;
    for (const auto& row : kDatabases) {
        SCOPED_TRACE(row.database.substr(0, 100));
        modem.log.Clear();
        WriteFile(kDatabase, row.database);
        bool err = row.id != nullptr;  // a lookup that was made takes it back
        EXPECT_EQ(modem.record.GetDefaultLocation(err), row.id ? row.id : "");
        EXPECT_EQ(err, row.id == nullptr);
        EXPECT_EQ(modem.log.Has(std::string("Failed to parse json file [") + kDatabase + "]"), err);
        EXPECT_EQ(modem.log.Has("Failed to read APN data"), err);
    }
}

}  // namespace
}  // namespace taviwireless::test
