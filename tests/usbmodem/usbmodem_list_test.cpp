// SPDX-License-Identifier: MIT
// The list: which files are modems, what an update does with them, and its records: copies, and what
// they keep while the list grows and shrinks.
#include <sys/resource.h>
#include <taviwireless/usbmodem_list.h>

#include <filesystem>
#include <type_traits>

#include "tests/support/descriptors.h"
#include "tests/support/files.h"
#include "tests/usbmodem/opened_modem.h"

namespace taviwireless::test {
namespace {

using testing::ElementsAre;
using testing::IsEmpty;
using usbmodem_lib::USBModem;
using usbmodem_lib::USBModemList;

std::vector<std::string> DevIds(USBModemList& list) {
    std::vector<std::string> ids;
    for (const USBModem& modem : list) {
        ids.push_back(modem.GetDevId());
    }
    return ids;
}

TEST(Search, DropsWhatIsALinkNow) {
    WriteFile(kInfo1, "CONNECTNODE=0\nDEVICENODE=0,1\n");
    USBModemList list;
    ASSERT_EQ(list.SearchInfoPath(), 0);
    Shell("mv /tmp/usbmodem.info1 /tmp/elsewhere; ln -s elsewhere /tmp/usbmodem.info1");
    EXPECT_EQ(list.FindUSBModem(1).AssignConnectNode(), -1);
    list.DropUnplugged();
    EXPECT_THAT(DevIds(list), IsEmpty());
}

TEST(Search, ThatFailsDropsNothing) {
    LogCapture log;
    WriteFile(kInfo1, "");
    USBModemList list;
    ASSERT_EQ(list.SearchInfoPath(), 0);
    std::filesystem::remove(kInfo1);
    rlimit limit{};
    ASSERT_EQ(getrlimit(RLIMIT_NOFILE, &limit), 0);
    const rlimit none = {0, limit.rlim_max};
    ASSERT_EQ(setrlimit(RLIMIT_NOFILE, &none), 0);
    EXPECT_EQ(list.Update(), -1);
    ASSERT_EQ(setrlimit(RLIMIT_NOFILE, &limit), 0);
    EXPECT_TRUE(log.Has("Failed to enum all files under /tmp/"));
    EXPECT_TRUE(log.Has("Failed to search info path"));
    EXPECT_THAT(DevIds(list), ElementsAre("usbmodem1"));
}

// Two modems; the info file of each names its own ports.
struct TwoModems {
    ModemSimulator simulator{
        {"--modem", "generic,id=1,ports=dial/at", "--modem", "2001,id=2,ports=dial/at"}};
    LogCapture log;
    USBModemList list;
};

TEST(Update, StopsAtTheFirstModemThatCannotBeInitialised) {
    TwoModems modems;
    WriteFile(kInfo1, "USB_ID_VENDOR=ffff\nCONNECTNODE=0\nDEVICENODE=0\n");
    EXPECT_EQ(modems.list.Update(), -1);
    EXPECT_TRUE(modems.log.Has("Failed to init info [1]"));
    EXPECT_FALSE(modems.list.FindUSBModem(1).IsInited());
    EXPECT_FALSE(modems.list.FindUSBModem(2).IsInited());
    EXPECT_THAT(modems.simulator.Received("2"), IsEmpty());
    std::filesystem::remove(kInfo1);
    EXPECT_EQ(modems.list.Update(), 0);
    EXPECT_THAT(DevIds(modems.list), ElementsAre("usbmodem2"));
    EXPECT_TRUE(modems.list.FindUSBModem(2).IsInited());
}

// A vector that grows moves its elements only if that cannot fail.
static_assert(std::is_nothrow_move_constructible_v<USBModem>);
static_assert(std::is_nothrow_move_assignable_v<USBModem>);
static_assert(std::has_virtual_destructor_v<USBModem>);

std::string AskFor(USBModem& record, const std::string& command) {
    std::string reply;
    return record.ModemCmd(command, reply) == 0 ? reply : "no reply";
}

TEST(Copy, HasTheStateAndOnlyAnAssignedOneTheNames) {
    OpenedModem modem("generic");
    ASSERT_EQ(modem.record.UpdateSIMStatus(), 1);
    bool err = false;
    modem.record.GetVendorName(err);
    modem.record.SetNotNewPlugIn();
    while (modem.record.IncreaseErrorCounter() < 6) {
        EXPECT_FALSE(modem.record.IsError());
    }
    USBModem copy(modem.record);
    USBModem assigned(2, "/tmp/usbmodem.info2");
    assigned = modem.record;
    for (USBModem* record : {&copy, &assigned}) {
        record->CloseFileDevice();  // from here on every query gives what is kept
        EXPECT_EQ(record->GetDevId(), "usbmodem1");
        EXPECT_TRUE(record->IsInfoExist());
        EXPECT_TRUE(record->IsError());
        EXPECT_FALSE(record->IsNewPlugIn());
        EXPECT_TRUE(record->IsPINReady(err));
        EXPECT_EQ(record->GetVendorName(err), record == &copy ? "" : "Generic");
    }
}

TEST(List, KeepsChannelsAndNamesOfItsRecordsWhileItGrowsAndShrinks) {
    ModemSimulator simulator({"--modem", "generic,id=1", "--modem", "generic,id=2,product=second"});
    const auto closed = OpenDescriptors();
    USBModemList list;
    ASSERT_EQ(list.Update(), 0);
    bool err = false;
    list.FindUSBModem(2).GetIMSI(err);
    EXPECT_EQ(OpenDescriptors().size(), closed.size() + 2);
    for (int id = 10; id < 30; ++id) {
        WriteFile("/tmp/usbmodem.info" + std::to_string(id), "");
        ASSERT_EQ(list.SearchInfoPath(), 0);
    }
    EXPECT_EQ(AskFor(list.FindUSBModem(1), "AT+CGMM"), "3G Modem\nOK\n");
    list.Drop(1);
    EXPECT_EQ(OpenDescriptors().size(), closed.size() + 1);
    USBModem& second = list.FindUSBModem("usbmodem2");
    EXPECT_TRUE(second.IsInited());
    EXPECT_EQ(AskFor(second, "AT+CGMM"), "second\nOK\n");
    second.CloseFileDevice();
    EXPECT_EQ(second.GetIMSI(err), "001010123456789");  // as it was asked before all this
    EXPECT_EQ(OpenDescriptors(), closed);
}

}  // namespace
}  // namespace taviwireless::test
