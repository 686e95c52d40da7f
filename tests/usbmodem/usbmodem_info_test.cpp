// What a modem tells about itself and its network, and the two settings made at the start.
#include <json/json.h>

#include "tests/support/files.h"
#include "tests/usbmodem/opened_modem.h"

namespace taviwireless::test {
namespace {

using testing::ElementsAre;
using testing::IsEmpty;
using usbmodem_lib::USBModem;

constexpr char kDatabase[] = "/usr/tavi/etc/usbmodem/wcdma_list.json";

using Query = std::string (USBModem::*)(bool&);

struct QueryCase {
    const char* name;
    Query query;
    const char* command;
    bool needsCard;
    std::vector<std::string> reply;
    const char* value;
    const char* parseFailure;  // what is logged for the reply ERROR
};

const QueryCase kQueries[] = {
    {"APN",
     &USBModem::GetDefaultAPN,
     "AT+CGDCONT?",
     true,
     {"+CGDCONT: 1,\"IP\",\"internet.example\",\"0.0.0.0\",0,0", "OK"},
     "internet.example",
     "error on reading default APN, ret: ERROR"},
    {"ISP",
     &USBModem::GetDefaultISP,
     "AT+COPS?",
     true,
     {"+COPS: 0,0,\"Far EasTone\",2", "OK"},
     "Far EasTone",
     "error on reading ISP, ret: ERROR"},
    {"IMSI",
     &USBModem::GetIMSI,
     "AT+CIMI",
     true,
     {"466920123456789", "OK"},
     "466920123456789",
     "error on parsing string, ret ERROR"},
    {"product",
     &USBModem::GetProductName,
     "AT+CGMM",
     false,
     {"E1752", "OK"},
     "E1752",
     "error on parsing product name, ret: [ERROR"},
    {"vendor",
     &USBModem::GetVendorName,
     "AT+CGMI",
     false,
     {"+CGMI: maker", "OK"},
     " maker",
     "error on parsing ERROR"},
};

// The value, or what stands for a set err.
std::string Ask(OpenedModem& modem, Query query) {
    bool err = false;
    const std::string value = (modem.record.*query)(err);
    return err ? value + " (err)" : value;
}

TEST(Query, GivesTheValueOfTheReplyAndKeepsItWhenALaterOneFails) {
    OpenedModem modem("generic");
    ASSERT_EQ(modem.record.UpdateSIMStatus(), 1);
    modem.Received();
    for (const QueryCase& row : kQueries) {
        SCOPED_TRACE(row.name);
        modem.log.Clear();
        modem.Answer(row.command, row.reply);
        EXPECT_EQ(Ask(modem, row.query), row.value);
        EXPECT_EQ(modem.log.Text(), "");
        modem.Answer(row.command, {"ERROR"});
        EXPECT_EQ(Ask(modem, row.query), std::string(row.value) + " (err)");
        EXPECT_TRUE(modem.log.Has("usbmodem_info.cpp")) << modem.log.Text();
        EXPECT_TRUE(modem.log.Has(row.parseFailure)) << modem.log.Text();
        EXPECT_THAT(modem.Received(), ElementsAre(row.command, row.command));
    }
}

TEST(Query, OfALockedCardSendsNothing) {
    OpenedModem modem("generic,pin=1234");
    ASSERT_EQ(modem.record.UpdateSIMStatus(), 0);
    modem.Received();
    EXPECT_EQ(Ask(modem, &USBModem::GetDefaultAPN), " (err)");
    EXPECT_TRUE(modem.log.Has("cannot get default APN when PIN is not ready"));
    modem.log.Clear();
    EXPECT_EQ(Ask(modem, &USBModem::GetDefaultISP), "");
    EXPECT_EQ(Ask(modem, &USBModem::GetIMSI), " (err)");
    EXPECT_EQ(Ask(modem, &USBModem::GetRoaming), "false");
    EXPECT_EQ(modem.record.GetRSSI(), 0);
    bool err = false;
    EXPECT_EQ(modem.record.GetSignalQuality(err), 0);
    EXPECT_FALSE(err);
    EXPECT_EQ(modem.log.Text(), "");
    EXPECT_THAT(modem.Received(), IsEmpty());
    EXPECT_EQ(Ask(modem, &USBModem::GetProductName), "3G Modem");
    EXPECT_EQ(Ask(modem, &USBModem::GetVendorName), "Generic");
}

TEST(Signal, IsAPercentageOfTheScale) {
    const struct {
        const char* reply;
        int quality;
        const char* log;
    } kSignals[] = {
        {"+CSQ: 0,99", 0, ""},
        {"+CSQ: 1,99", 3, ""},
        {"+CSQ: 16,99", 51, ""},
        {"+CSQ: 31,99", 100, ""},
        {"+CSQ: 99,99", 0, ""},
        {"+CSQ: 32,99", 0, "returned RSSI 32 is not in range 0 ~ 31"},
        {"+CSQ: -1,99", 0, "returned RSSI -1 is not in range 0 ~ 31"},
    };
    OpenedModem modem;
    ASSERT_EQ(modem.record.UpdateSIMStatus(), 1);
    for (const auto& signal : kSignals) {
        SCOPED_TRACE(signal.reply);
        modem.log.Clear();
        modem.Answer("AT+CSQ", {signal.reply, "OK"});
        bool err = false;
        EXPECT_EQ(modem.record.GetSignalQuality(err), signal.quality);
        EXPECT_EQ(err, *signal.log != '\0');
        EXPECT_EQ(modem.log.Lines().size(), err ? 1u : 0u) << modem.log.Text();
        EXPECT_TRUE(modem.log.Has(signal.log) || !err) << modem.log.Text();
    }
}

TEST(Signal, ThatCannotBeReadIsAnErrorWithTheLastOneInTheLog) {
    const struct {
        const char* reply;
        const char* log;
    } kSignals[] = {
        {"+CSQ: 99999999999,99", "returned RSSI 2147483647 is not in range 0 ~ 31"},
        {"ERROR", "error on getting RSSI: 2147483647"},
    };
    OpenedModem modem;
    ASSERT_EQ(modem.record.UpdateSIMStatus(), 1);
    for (const auto& signal : kSignals) {
        SCOPED_TRACE(signal.reply);
        modem.Answer("AT+CSQ", {signal.reply});
        bool err = false;
        EXPECT_EQ(modem.record.GetSignalQuality(err), 0);
        EXPECT_TRUE(err);
        EXPECT_TRUE(modem.log.Has(signal.log)) << modem.log.Text();
    }
    modem.Answer("AT+CSQ", {"OK"});  // no value at all reads as 0
    bool err = false;
    EXPECT_EQ(modem.record.GetSignalQuality(err), 0);
    EXPECT_FALSE(err);
}

TEST(FunctionLevel, ThatIsRefusedIsAFailure) {
    OpenedModem modem;
    modem.simulator.Fault("1", "error=AT+CFUN=*");
    EXPECT_EQ(modem.record.SetHardwareFuncLvl("7"), -1);
    EXPECT_TRUE(modem.log.Has("error on setting hardware function lvl, ret: ERROR"));
    modem.simulator.Fault("1", "off");
    modem.Silence("AT+CFUN=*");
    EXPECT_EQ(modem.record.SetHardwareFuncLvl("7"), -1);
    EXPECT_TRUE(modem.log.Has("error on modem cmd: AT+CFUN=7"));
}

TEST(UnsolicitedReports, AreSwitchedUnlessTheReplyHoldsTheWantedDigit) {
    const struct {
        const char* reply;
        bool enable;
        std::vector<std::string> sent;
    } kReplies[] = {
        {"^CURC: 1", false, {"AT^CURC?", "AT^CURC=0"}},
        {"^CURC: 0", false, {"AT^CURC?"}},
        {"^CURC: 10", false, {"AT^CURC?"}},  // any digit of the reply counts
        {"^CURC: 0", true, {"AT^CURC?", "AT^CURC=1"}},
        {"^CURC: 1", true, {"AT^CURC?"}},
    };
    OpenedModem modem("12d1");
    for (const auto& reply : kReplies) {
        SCOPED_TRACE(reply.reply);
        modem.Answer("AT^CURC?", {reply.reply, "OK"});
        EXPECT_EQ(modem.record.SetUnsolicitedReports(reply.enable), 0);
        EXPECT_EQ(modem.Received(), reply.sent);
    }
    EXPECT_EQ(modem.log.Text(), "");
}

TEST(UnsolicitedReports, ThatAreNotSwitchedAreAFailure) {
    OpenedModem modem("12d1");
    modem.simulator.Fault("1", "error=AT^CURC=0");
    EXPECT_EQ(modem.record.SetUnsolicitedReports(false), -1);
    EXPECT_TRUE(modem.log.Has("error on changing unsolicited reports setting, ret: ERROR"));
    modem.simulator.Fault("1", "off");
    modem.Silence("AT^CURC=0");
    EXPECT_EQ(modem.record.SetUnsolicitedReports(false), -1);
    EXPECT_TRUE(modem.log.Has("error on modem cmd: change unsolicited reports setting"));
}

// What GetDefaultLocation makes of a database.
struct Location {
    std::string id;
    bool err;
    bool operator==(const Location& other) const { return id == other.id && err == other.err; }
};

std::ostream& operator<<(std::ostream& stream, const Location& location) {
    return stream << location.id << (location.err ? " (err)" : "");
}

Location LocationIn(OpenedModem& modem, const std::string& database) {
    WriteFile(kDatabase, database);
    Location location{"", true};  // a lookup that was made takes err back
    location.id = modem.record.GetDefaultLocation(location.err);
    return location;
}

TEST(Location, IsTheFirstThatListsTheOperator) {
    const struct {
        const char* database;
        Location location;
    } kDatabases[] = {
        {R"([{"id":"A","isp":[{"name":"Other"},{"name":"Example Mobile"}]},
             {"id":"B","isp":[{"name":"Example Mobile"}]}])",
         {"A", false}},
        {R"([{"id":"A","isp":[{"name":"example mobile"},{"name":"Example Mobile "}]}])",
         {"", false}},
        {R"([7, null, [], {"isp":[{"name":"Example Mobile"}]}, {"id":"no isp"},
             {"id":"isp is text","isp":"Example Mobile"},
             {"id":{"an":"object"},"isp":[{"name":"Example Mobile"}]},
             {"id":"odd members","isp":[1, [], {}, {"name":{}}, {"nom":"Example Mobile"}]},
             {"id":5,"isp":[{"name":"Example Mobile","mcc":"001"}],"other":true}])",
         {"5", false}},
        {R"({"id":"A","isp":[{"name":"Example Mobile"}]})", {"", false}},
        {"[]", {"", false}},
    };
    OpenedModem modem("generic");
    ASSERT_EQ(modem.record.UpdateSIMStatus(), 1);
    for (const auto& row : kDatabases) {
        EXPECT_EQ(LocationIn(modem, row.database), row.location) << row.database;
    }
    EXPECT_EQ(modem.log.Text(), "");
}

TEST(Location, NeedsADatabaseThatCanBeRead) {
    OpenedModem modem("generic");
    ASSERT_EQ(modem.record.UpdateSIMStatus(), 1);
    const std::string tooDeep(2000, '[');
    for (const std::string& database : {std::string("[{"), std::string(), tooDeep}) {
        SCOPED_TRACE(database.substr(0, 10));
        modem.log.Clear();
        WriteFile(kDatabase, database);
        EXPECT_EQ(Ask(modem, &USBModem::GetDefaultLocation), " (err)");
        EXPECT_TRUE(modem.log.Has(std::string("Failed to parse json file [") + kDatabase + "]"));
        EXPECT_TRUE(modem.log.Has("Failed to read APN data"));
    }
    EXPECT_EQ(LocationIn(modem, R"([{"id":"A","isp":[{"name":"Example Mobile"}]}])"),
              (Location{"A", false}));
}

}  // namespace
}  // namespace taviwireless::test
