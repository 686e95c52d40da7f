// SPDX-License-Identifier: MIT
// The connection profile of the SIM, over a simulated modem.
#include <gmock/gmock.h>
#include <sys/mount.h>
#include <sys/stat.h>

#include "tests/support/files.h"
#include "tests/usbmodem/opened_modem.h"

namespace taviwireless::test {
namespace {

constexpr char kOperators[] = "/usr/tavi/etc/usbmodem/wcdma_list.json";
constexpr char kDirectory[] = "/var/lib/usbmodem";
constexpr char kProfile[] = "/var/lib/usbmodem/usbmodem.profile.262019876543210";

struct ReadyModem : OpenedModem {
    ReadyModem() : OpenedModem("generic,imsi=262019876543210,operator=Nordnetz") {
        record.UpdateSIMStatus();
        Received();
        log.Clear();
    }
};

TEST(Profile, OfANewSIMHoldsTheDefaultsOfTheModem) {
    WriteFile(kOperators, R"([{"id": "Germany", "isp": [{"name": "Nordnetz"}]}])");
    ReadyModem modem;
    bool err = false;
    EXPECT_EQ(modem.record.GetProfilePhone(err), "*99#");
    EXPECT_FALSE(err);
    EXPECT_EQ(ReadFile(kProfile),
              "[USBModem Profile]\nnumber=*99#\nuser=Unknown\npass=Unknown\nIMSI=262019876543210\n"
              "default_gw=false\nlocation=Germany\napn=internet\nisp=Nordnetz - internet\n");
    EXPECT_EQ(FileMode(kProfile), 0600u);
    EXPECT_EQ(FileMode(kDirectory), 0755u);  // 0775 less the umask
    ASSERT_EQ(chmod(kProfile, 0644), 0);
    EXPECT_EQ(modem.record.SetProfileDefaultGW("true"), 0);
    EXPECT_EQ(FileMode(kProfile), 0600u);
}

TEST(Profile, TwoSIMsNeverTouchEachOthersFile) {
    ReadyModem modem;
    ASSERT_EQ(modem.record.SetProfileUsername("first"), 0);
    const std::string first = ReadFile(kProfile);
    modem.simulator.Set("1", "imsi", "208011234567890");
    EXPECT_EQ(modem.record.ResetProfile(), 0);
    EXPECT_EQ(modem.record.SetProfileUsername("second"), 0);
    EXPECT_EQ(ReadFile(kProfile), first);
    bool err = false;
    EXPECT_EQ(modem.record.GetProfileIMSI(err), "208011234567890");
}

TEST(Profile, ThatCannotBeWrittenStaysAsItWasAndALaterResetWorks) {
    ReadyModem modem;
    WriteFile(kDirectory, "a file in the directory's place");
    EXPECT_EQ(modem.record.SetProfileToDefault(), -1);
    EXPECT_TRUE(modem.log.Has("Error on reset profile: makedir /var/lib/usbmodem failed"));
    unlink(kDirectory);
    MakeDirectories(kDirectory);
    ASSERT_EQ(mount("tiny", kDirectory, "tmpfs", 0, "size=8k"), 0);
    const std::string filler = std::string(kDirectory) + "/filler";
    WriteFile(filler, std::string(8192, 'x'));
    EXPECT_EQ(modem.record.ResetProfile(), -1);
    EXPECT_TRUE(modem.log.Has("Error on reset profile: section USBModem Profile in profile "));
    EXPECT_FALSE(Exists(kProfile));
    unlink(filler.c_str());
    EXPECT_EQ(modem.record.SetProfileUsername("me"), 0);

    const std::string before = ReadFile(kProfile);
    WriteFile(filler, std::string(4096, 'x'));
    EXPECT_EQ(modem.record.ResetProfile(), -1);
    EXPECT_EQ(ReadFile(kProfile), before);
    unlink(filler.c_str());
    WriteFile(kProfile, "");  // an earlier version left such
    bool err = false;
    EXPECT_EQ(modem.record.GetProfilePhone(err), "*99#");
    EXPECT_FALSE(err);
}

TEST(Location, IsTheFirstThatListsTheOperatorInADatabaseThatCanBeRead) {
    const struct {
        std::string database;
        const char* id;  // null: it cannot be read
    } kDatabases[] = {
        {R"([{"id":"A","isp":[{"name":"Other"},{"name":"Nordnetz"}]},
             {"id":"B","isp":[{"name":"Nordnetz"}]}])",
         "A"},
        {"[{", nullptr},
        {"", nullptr},
        {std::string(2000, '['), nullptr},
        {R"([7, null, [], {"isp":[{"name":"Nordnetz"}]}, {"id":"no isp"},
             {"id":"isp is text","isp":"Nordnetz"},
             {"id":{"an":"object"},"isp":[{"name":"Nordnetz"}]},
             {"id":"odd members","isp":[1, [], {}, {"name":{}}, {"nom":"Nordnetz"}]},
             {"id":5,"isp":[{"name":"Nordnetz","mcc":"001"}],"other":true}])",
         "5"},
    };
    ReadyModem modem;
    for (const auto& row : kDatabases) {
        SCOPED_TRACE(row.database.substr(0, 100));
        modem.log.Clear();
        WriteFile(kOperators, row.database);
        bool err = row.id != nullptr;  // a lookup that was made takes it back
        EXPECT_EQ(modem.record.GetDefaultLocation(err), row.id ? row.id : "");
        EXPECT_EQ(err, row.id == nullptr);
        EXPECT_EQ(modem.log.Has(std::string("Failed to parse json file [") + kOperators + "]"),
                  err);
        EXPECT_EQ(modem.log.Has("Failed to read APN data"), err);
    }
}

}  // namespace
}  // namespace taviwireless::test
