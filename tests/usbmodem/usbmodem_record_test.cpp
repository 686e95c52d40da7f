// The record itself: copies, and what it keeps while a list of records grows and shrinks.
#include <taviwireless/usbmodem_list.h>

#include <filesystem>
#include <type_traits>

#include "tests/support/descriptors.h"
#include "tests/support/files.h"
#include "tests/usbmodem/opened_modem.h"

namespace taviwireless::test {
namespace {

using testing::ElementsAre;
using usbmodem_lib::USBModem;
using usbmodem_lib::USBModemList;

// A vector that grows moves its elements only if that cannot fail.
static_assert(std::is_nothrow_move_constructible_v<USBModem>);
static_assert(std::is_nothrow_move_assignable_v<USBModem>);
static_assert(std::has_virtual_destructor_v<USBModem>);

std::string AskFor(USBModem& record, const std::string& command) {
    std::string reply;
    return record.ModemCmd(command, reply) == 0 ? reply : "no reply";
}

// What a record answers without asking the modem.
std::vector<std::string> CachedNames(USBModem& record) {
    bool err = false;
    std::vector<std::string> names;
    for (auto query : {&USBModem::GetIMSI, &USBModem::GetDefaultAPN, &USBModem::GetProductName,
                       &USBModem::GetVendorName}) {
        names.push_back((record.*query)(err));
    }
    return names;
}

TEST(Copy, HasTheStateButNotTheNames) {
    OpenedModem modem("generic");
    ASSERT_EQ(modem.record.UpdateSIMStatus(), 1);
    CachedNames(modem.record);
    modem.record.SetNotNewPlugIn();
    while (modem.record.IncreaseErrorCounter() < 6) {
        EXPECT_FALSE(modem.record.IsError());
    }
    USBModem copy(modem.record);
    modem.record.CloseFileDevice();
    copy.CloseFileDevice();  // from here on every query gives what is kept
    EXPECT_EQ(copy.GetDevId(), "usbmodem1");
    EXPECT_TRUE(copy.IsInfoExist());
    EXPECT_TRUE(copy.IsError());
    EXPECT_FALSE(copy.IsNewPlugIn());
    bool err = false;
    EXPECT_TRUE(copy.IsPINReady(err));
    EXPECT_THAT(CachedNames(copy), ElementsAre("", "", "", ""));

    USBModem assigned(2, "/tmp/usbmodem.info2");
    assigned = modem.record;
    assigned = *&assigned;
    EXPECT_EQ(assigned.GetDevId(), "usbmodem1");
    EXPECT_THAT(CachedNames(assigned),
                ElementsAre("001010123456789", "internet", "3G Modem", "Generic"));
}

TEST(Copy, SharesTheChannelUntilTheLastOneIsGone) {
    OpenedModem modem("generic");
    const auto open = OpenDescriptors();
    {
        USBModem copy(modem.record);
        USBModem assigned(2, "/tmp/usbmodem.info2");
        assigned = copy;
        copy.CloseFileDevice();
        EXPECT_EQ(AskFor(assigned, "AT+CGMI"), "Generic\nOK\n");
    }
    USBModem last(std::move(modem.record));
    EXPECT_EQ(OpenDescriptors(), open);
    EXPECT_EQ(AskFor(last, "AT+CGMI"), "Generic\nOK\n");
    last.CloseFileDevice();
    EXPECT_EQ(OpenDescriptors().size(), open.size() - 1);
}

// Two modems that are initialised and asked, and a list that then grows far beyond them.
TEST(List, KeepsChannelsAndNamesOfItsRecordsWhileItGrowsAndShrinks) {
    ModemSimulator simulator({"--modem", "generic,id=1", "--modem", "generic,id=2,product=second"});
    const auto closed = OpenDescriptors();
    USBModemList list;
    ASSERT_EQ(list.Update(), 0);
    bool err = false;
    list.FindUSBModem(2).GetIMSI(err);
    const auto open = OpenDescriptors();
    EXPECT_EQ(open.size(), closed.size() + 2);

    for (int id = 10; id < 30; ++id) {
        WriteFile("/tmp/usbmodem.info" + std::to_string(id), "");
        ASSERT_EQ(list.SearchInfoPath(), 0);
    }
    EXPECT_EQ(OpenDescriptors(), open);
    EXPECT_EQ(AskFor(list.FindUSBModem(1), "AT+CGMM"), "3G Modem\nOK\n");
    EXPECT_EQ(AskFor(list.FindUSBModem(2), "AT+CGMM"), "second\nOK\n");

    for (int id = 10; id < 30; ++id) {
        std::filesystem::remove("/tmp/usbmodem.info" + std::to_string(id));
    }
    std::filesystem::remove(kInfo1);
    while (list.end() - list.begin() > 1) {
        list.DropUnplugged();
    }
    EXPECT_EQ(OpenDescriptors().size(), open.size() - 1);
    USBModem& second = list.FindUSBModem("usbmodem2");
    EXPECT_TRUE(second.IsInited());
    EXPECT_EQ(AskFor(second, "AT+CGMM"), "second\nOK\n");
    second.CloseFileDevice();
    EXPECT_EQ(second.GetIMSI(err), "001010123456789");  // as it was asked before all this
    EXPECT_EQ(OpenDescriptors(), closed);
}

}  // namespace
}  // namespace taviwireless::test
