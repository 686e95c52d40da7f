// Discovery: which files are modems, what an update does with them, and what it opens.
#include <dlfcn.h>
#include <sys/stat.h>
#include <tavicore/error.h>
#include <tavicore/file.h>
#include <tavicore/szlist.h>
#include <taviwireless/usbmodem_list.h>
#include <unistd.h>

#include <cstdlib>
#include <filesystem>

#include "tests/support/files.h"
#include "tests/support/sleep_capture.h"
#include "tests/usbmodem/opened_modem.h"

namespace {

int listedWith = 0;   // what listing a directory returns instead of listing it, when negative
bool noList = false;  // whether there is no memory for a string list

template <typename Function>
Function* Next(const char* name) {
    return reinterpret_cast<Function*>(dlsym(RTLD_NEXT, name));
}

}  // namespace

// In place of the SDK's, for the library as well.
int VEXACFileEnumDir(const char* directory, const char* name, VEXACSzList** list, int flags) {
    if (listedWith < 0) {
        return listedWith;
    }
    return Next<decltype(VEXACFileEnumDir)>("VEXACFileEnumDir")(directory, name, list, flags);
}

VEXACSzList* VEXACSzListAlloc(int size) {
    return noList ? nullptr : Next<decltype(VEXACSzListAlloc)>("VEXACSzListAlloc")(size);
}

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

TEST(Search, TakesExactlyTheNamesOfInfoFiles) {
    for (const std::string name :
         {"usbmodem.info0", "usbmodem.info1", "usbmodem.info12", "usbmodem.info2147483647",
          "usbmodem.info-5", "usbmodem.info-2147483648",
          // And these are none:
          "usbmodem.info", "usbmodem.info01", "usbmodem.info+3", "usbmodem.info-1",
          "usbmodem.info-0", "usbmodem.info4.bak", "usbmodem.info 5", "usbmodem.info6 ",
          "usbmodem.info0x7", "usbmodem.info4294967295", "usbmodem.info2147483648",
          "usbmodem.info99999999999999999999", "usbmodem.info8\n", "Usbmodem.info9",
          "xusbmodem.info10", "usbmodem.infos", ".usbmodem.info11"}) {
        WriteFile("/tmp/" + name, "CONNECTNODE=0\n");
    }
    MakeDirectories("/tmp/usbmodem.info13");
    USBModemList list;
    EXPECT_EQ(list.SearchInfoPath(), 0);
    EXPECT_THAT(DevIds(list), testing::UnorderedElementsAre(
                                  "usbmodem0", "usbmodem1", "usbmodem12", "usbmodem2147483647",
                                  "usbmodem4294967291", "usbmodem2147483648"));
}

// Puts a file of somebody who is not the owner of the modems at path.
void PutStrangersFile(const std::string& path) {
    constexpr uid_t kStranger = 1;
    WriteFile(path, "USB_ID_VENDOR=12d1\nCONNECTNODE=0\nDEVICENODE=0,1\n");
    ASSERT_EQ(chown(path.c_str(), kStranger, kStranger), 0);
}

TEST(Search, TakesNothingThatAStrangerPutThere) {
    TAVI_NEEDS_A_STRANGER()
    WriteFile(kInfo1, "CONNECTNODE=0\n");
    WriteFile("/tmp/usbmodem.info2", "");
    ASSERT_EQ(truncate("/tmp/usbmodem.info2", 3LL << 30), 0);
    ASSERT_EQ(symlink(kInfo1, "/tmp/usbmodem.info3"), 0);
    ASSERT_EQ(mkfifo("/tmp/usbmodem.info4", 0666), 0);
    for (int i = 5; i < 305; ++i) {
        PutStrangersFile("/tmp/usbmodem.info" + std::to_string(i));
    }
    USBModemList list;
    EXPECT_EQ(list.SearchInfoPath(), 0);
    EXPECT_THAT(DevIds(list), ElementsAre("usbmodem1"));
    LogCapture log;
    for (int i = 2; i < 6; ++i) {
        USBModem modem(i, "/tmp/usbmodem.info" + std::to_string(i));
        modem.SetATInterface();
        EXPECT_EQ(modem.AssignConnectNode(), -1);
        EXPECT_EQ(modem.AssignQuaryNode(), -1);
        EXPECT_EQ(modem.IsInfoExist(), true);
    }
    EXPECT_EQ(log.Count("Cannot parsing USB_ID_VENDOR from "), 4) << log.Text();
}

TEST(Search, DropsAModemWhoseInfoFileIsAStrangersNow) {
    TAVI_NEEDS_A_STRANGER()
    WriteFile(kInfo1, "CONNECTNODE=0\n");
    USBModemList list;
    ASSERT_EQ(list.SearchInfoPath(), 0);
    std::filesystem::remove(kInfo1);
    PutStrangersFile(kInfo1);
    list.DropUnplugged();
    EXPECT_THAT(DevIds(list), IsEmpty());
}

TEST(Search, ThatFailsDropsNothing) {
    LogCapture log;
    WriteFile(kInfo1, "");
    USBModemList list;
    ASSERT_EQ(list.SearchInfoPath(), 0);
    std::filesystem::remove(kInfo1);
    noList = true;
    EXPECT_EQ(list.Update(), -1);
    EXPECT_EQ(VEXACErrGet(), 512);
    EXPECT_TRUE(log.Has("Failed to alloc for pFolderList"));
    noList = false;
    listedWith = -1;
    EXPECT_EQ(list.Update(), -1);
    EXPECT_TRUE(log.Has("Failed to enum all files under /tmp/"));
    EXPECT_EQ(log.Count("Failed to search info path"), 2);
    EXPECT_THAT(DevIds(list), ElementsAre("usbmodem1"));
}

// Two modems; the info file of each names its own ports.
struct TwoModems {
    ModemSimulator simulator{{"--modem", "generic,id=1", "--modem", "2001,id=2"}};
    SleepCapture sleeps;
    LogCapture log;
    USBModemList list;
};

TEST(Update, InitialisesEachNewModemOnce) {
    TwoModems modems;
    EXPECT_EQ(modems.list.Update(), 0);
    EXPECT_TRUE(modems.list.FindUSBModem(1).IsInited());
    EXPECT_TRUE(modems.list.FindUSBModem(2).IsInited());
    EXPECT_THAT(modems.simulator.Received("1"), testing::Not(IsEmpty()));
    EXPECT_THAT(modems.simulator.Received("2"), testing::Not(IsEmpty()));
    EXPECT_EQ(modems.list.Update(), 0);
    EXPECT_THAT(modems.simulator.Received("1"), IsEmpty());
    EXPECT_THAT(modems.simulator.Received("2"), IsEmpty());
    EXPECT_THAT(modems.sleeps.Calls(), IsEmpty());
}

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

TEST(Update, DropsOneOfTwoNeighboursThatAreGoneAndTheOtherTheNextTime) {
    TwoModems modems;
    ASSERT_EQ(modems.list.Update(), 0);
    std::filesystem::remove(kInfo1);
    std::filesystem::remove("/tmp/usbmodem.info2");
    EXPECT_EQ(modems.list.Update(), 0);
    EXPECT_THAT(DevIds(modems.list), ElementsAre("usbmodem2"));
    EXPECT_FALSE(modems.list.FindUSBModem(2).IsInfoExist());
    EXPECT_EQ(modems.list.Update(), 0);
    EXPECT_THAT(DevIds(modems.list), IsEmpty());
}

// Whoever is on the machine may write in "/tmp/".
TEST(Search, TakesNoFilesOfStrangers) {
    TAVI_NEEDS_A_STRANGER()
    const struct {
        const char* what;
        const char* made;  // by a command
    } kFiles[] = {
        {"a link", "ln -s /tmp/usbmodem.info0"},
        {"a pipe", "mkfifo"},
        {"a folder", "mkdir"},
        {"a large file", "truncate -s 3G"},
        {"somebody else's", "install -o 65534 /tmp/usbmodem.info0"},
    };
    WriteFile("/tmp/usbmodem.info0", "USB_ID_VENDOR=12d1\n");
    USBModemList list;
    for (const auto& file : kFiles) {
        SCOPED_TRACE(file.what);
        RunProgram({"sh", "-c", std::string(file.made) + " /tmp/usbmodem.info7"});
        ASSERT_TRUE(std::filesystem::is_symlink("/tmp/usbmodem.info7") ||
                    Exists("/tmp/usbmodem.info7"));
        EXPECT_EQ(list.SearchInfoPath(), 0);
        EXPECT_THAT(DevIds(list), ElementsAre("usbmodem0"));
        USBModem record(7, "/tmp/usbmodem.info7");
        EXPECT_EQ(record.AssignConnectNode(), -1);
        std::filesystem::remove("/tmp/usbmodem.info7");
    }
}

TEST(List, DropsTheOneModemThatItIsTold) {
    for (const std::string id : {"0", "1", "2"}) {
        WriteFile("/tmp/usbmodem.info" + id, "");
    }
    USBModemList list;
    ASSERT_EQ(list.SearchInfoPath(), 0);
    list.Drop(1);
    list.Drop(9);
    EXPECT_THAT(DevIds(list), ElementsAre("usbmodem0", "usbmodem2"));
}

}  // namespace
}  // namespace taviwireless::test
