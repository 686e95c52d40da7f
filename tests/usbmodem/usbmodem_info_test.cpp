// What a modem tells about itself and its network, and the two settings made at the start.
#include "tests/support/files.h"
#include "tests/usbmodem/opened_modem.h"

namespace taviwireless::test {
namespace {

using testing::ElementsAre;

constexpr char kDatabase[] = "/usr/tavi/etc/usbmodem/wcdma_list.json";

struct ReadyModem : OpenedModem {
    explicit ReadyModem(const std::string& description = "generic") : OpenedModem(description) {
        EXPECT_EQ(record.UpdateSIMStatus(), 1);
        Received();
    }
};

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
