// The file of saved networks, and the gateway that a connection should use.
#include <ctime>

#include "tests/wireless/station_fixture.h"
#include "wireless/system/queue.h"

namespace taviwireless::test {
namespace {

using testing::ElementsAre;

constexpr char kSection[] = "00:11:22:AA:BB:CC";

// The essids of the listed networks; frees them.
std::vector<std::string> Essids(int (*list)(WirelessLink*), int expectedResult = 0) {
    wireless::OwnedList<WirelessConf> confs;
    EXPECT_EQ(list(confs.Head()), expectedResult);
    std::vector<std::string> essids;
    for (const WirelessConf& conf : confs) {
        essids.emplace_back(conf.network.essid);
    }
    return essids;
}

WirelessConf Saved() {
    WirelessConf conf;
    EXPECT_EQ(TAVIWirelessConfGet(kSection, &conf), 0);
    return conf;
}

TEST(Saving, WritesASectionThatOnlyTheOwnerCanRead) {
    Station station;
    const WirelessConf conf = MakeConf();
    const time_t before = time(nullptr);
    EXPECT_EQ(TAVIWirelessConfSet(&conf), 0);
    const int accessTime = Saved().accessTime;
    EXPECT_TRUE(accessTime >= before && accessTime <= time(nullptr)) << accessTime;
    EXPECT_EQ(ReadFile(kSavedFile),
              "[00:11:22:AA:BB:CC]\n\tKEY=a secret\n\tIPADDR=DHCP\n\tNETMASK=\n\tGATEWAY=\n"
              "\tESSID=My Net\n\tBSSID=00:11:22:AA:BB:CC\n\tMODE=Managed\n\tACCESS_TIME=" +
                  std::to_string(accessTime) + "\n\tAUTH=WPA2PSK\n\tENCRYPT=AES\n");
    EXPECT_EQ(FileMode(kSavedFile), 0600u);
    EXPECT_EQ(station.log.Text(), "");
}

TEST(Saving, AgainKeepsOneSectionAndWhatIsNotWritten) {
    Station station;
    WirelessConf conf = MakeConf("Old", kKey, WIRELESS_AUTH_WPA2_EAP, WIRELESS_ENCRYPT_TKIP_AES);
    EXPECT_EQ(TAVIWirelessConfSet(&conf), 0);
    Shell("sed -i 's/ACCESS_TIME=.*/ACCESS_TIME=1/' " + std::string(kSavedFile));
    AppendFile(kSavedFile, "\tNOTE=mine\n[02:00:00:00:00:01]\n\tESSID=Other\n");
    EXPECT_EQ(Saved().network.auth, WIRELESS_AUTH_WPA2_EAP);
    EXPECT_EQ(Saved().network.encrypt, WIRELESS_ENCRYPT_TKIP_AES);
    conf = MakeConf("New");
    strcpy(conf.user, "nobody");
    EXPECT_EQ(TAVIWirelessConfSet(&conf), 0);
    const WirelessConf read = Saved();
    EXPECT_STREQ(read.user, "me@home");
    EXPECT_GT(read.accessTime, 1);
    EXPECT_THAT(ReadFile(kSavedFile), testing::HasSubstr("\tNOTE=mine\n"));
    EXPECT_THAT(Essids(TAVIWirelessConfEnum), ElementsAre("New", "Other"));
}

TEST(Saving, TextsComeOutAsTheyWentIn) {
    const char* kTexts[] = {" a b ", "\"q\"", "'",   "\\", "a#b;c",
                            "#",     "[x]",   "k=v", "\t", "caf\xc3\xa9",
                            "%s%n",  "$(",    "`|&", "",   "~!@#$%^&*()_+{}|:\"<>?-=[]\\;',."};
    for (const std::string text : kTexts) {
        Station station;
        const WirelessConf conf = MakeConf(text, text + text);
        EXPECT_EQ(TAVIWirelessConfSet(&conf), 0);
        const WirelessConf read = Saved();
        EXPECT_STREQ(read.network.essid, conf.network.essid);
        EXPECT_STREQ(read.key, conf.key);
        EXPECT_EQ(memcmp(read.network.bssid, conf.network.bssid, 6), 0);
        EXPECT_EQ(read.network.opmode, WIRELESS_OPMODE_MANAGED);
    }
}

TEST(Saving, FailuresAreLogged) {
    const std::string path = kSavedFile;
    const std::pair<const char*, std::string> kCases[] = {
        {"true", "Failed to add section: 00:11:22:AA:BB:CC from " + path + ", errno=0xD00"},
        {"echo '[00:11:22:AA:BB:CC]' >", "Failed to set section: 00:11:22:AA:BB:CC from " + path},
        {"mkdir", "Failed to get section: " + path + " from 00:11:22:AA:BB:CC, errno=0x800"},
        {"rm -r /usr/tavi/etc; true", "Failed to touch " + path},
    };
    for (const auto& [arrange, line] : kCases) {
        Station station;
        Shell(arrange + (" " + path));
        const WirelessConf conf = MakeConf("line\n[forged]");
        EXPECT_EQ(TAVIWirelessConfSet(&conf), -1);
        EXPECT_TRUE(station.log.Has(line)) << station.log.Text();
        EXPECT_TRUE(station.log.Has("wireless_conf_set.cpp:"));
    }
    EXPECT_EQ(TAVIWirelessConfSet(nullptr), -1);
}

TEST(Reading, MissingKeysAreEmptyAndLongValuesCut) {
    Station station;
    WirelessConf conf;
    EXPECT_EQ(TAVIWirelessConfGet("other", &conf), -1);
    EXPECT_TRUE(station.log.Has("Configuration /usr/tavi/etc/wireless.conf doen't exist"));
    WriteFile(kSavedFile, "[no address]\n\tESSID=" + std::string(100, 'e') + "\n\tIPADDR=" +
                              std::string(100, '1') + "\n\tACCESS_TIME=4294967297\n");
    memset(&conf, 0x55, sizeof conf);
    EXPECT_EQ(TAVIWirelessConfGet("no address", &conf), 0);
    EXPECT_EQ(conf.network.essid, std::string(32, 'e'));
    EXPECT_EQ(conf.ipAddr, std::string(19, '1'));
    EXPECT_EQ(conf.accessTime, 1);
    EXPECT_EQ(conf.key + std::string(conf.user), "");
    EXPECT_EQ(conf.network.auth + conf.network.encrypt + conf.network.bssid[0], 0);
    EXPECT_EQ(conf.network.opmode, WIRELESS_OPMODE_UNKNOWN);
    EXPECT_EQ(TAVIWirelessConfGet("other", &conf), -1);
    EXPECT_TRUE(
        station.log.Has("Not found or failed to get section: /usr/tavi/etc/wireless.conf "
                        "from other, errno=0x700"));
    EXPECT_EQ(TAVIWirelessConfGet(nullptr, &conf) + TAVIWirelessConfGet("other", nullptr), -2);
}

TEST(Listing, IsInTheOrderOfTheFileOrTheLastUsedFirst) {
    Station station;
    std::string text;
    const std::pair<const char*, int> kNetworks[] = {{"a", 100}, {"b", 300}, {"c", 200},
                                                     {"d", 300}, {"e", -5},  {"f", 100}};
    for (const auto& [essid, time] : kNetworks) {
        text += std::string("[02:00:00:00:00:0") + essid + "]\n\tESSID=" + essid +
                "\n\tACCESS_TIME=" + std::to_string(time) + "\n";
    }
    WriteFile(kSavedFile, text);
    EXPECT_THAT(Essids(TAVIWirelessConfEnum), ElementsAre("a", "b", "c", "d", "e", "f"));
    EXPECT_THAT(Essids(TAVIWirelessConfEnumByAtime), ElementsAre("b", "d", "c", "a", "f", "e"));
    std::filesystem::remove(kSavedFile);
    EXPECT_THAT(Essids(TAVIWirelessConfEnum, -1), ElementsAre());
    EXPECT_EQ(TAVIWirelessConfEnumByAtime(nullptr), -1);
    EXPECT_TRUE(station.log.Has("Failed to enumerate sections in '/usr/tavi/etc/wireless.conf'"));
    EXPECT_TRUE(station.log.Has(" Bad parameters"));
}

TEST(Gateway, IsThatOfTheLeaseOrElseThatOfTheSavedNetwork) {
    Station station;
    SetSupport("yes");
    char gateway[20];
    const auto get = TAVIWirelessDefaultGatewayConfGet_core;
    EXPECT_EQ(get(nullptr, 20) + get(gateway, 0) + get(gateway, sizeof gateway), -3);
    EXPECT_TRUE(station.log.Has("Failed to get configuration of 00:00:00:00:00:00"));

    station.driver.accessPoint = {0, 1};
    WriteFile(kRecord, "My Net\n0\n5\n8\n00:11:22:AA:BB:CC\n");
    WirelessConf conf = MakeConf();
    strcpy(conf.gateway, "10.0.0.1");
    EXPECT_EQ(TAVIWirelessConfSet(&conf), 0);
    EXPECT_EQ(get(gateway, sizeof gateway), 0);
    EXPECT_STREQ(gateway, "10.0.0.1");
    EXPECT_EQ(get(gateway, 5), 0);
    EXPECT_STREQ(gateway, "10.0");

    Shell("cp /bin/sleep /tmp/udhcpc");
    Process client({"/tmp/udhcpc", "1000"});
    WriteFile("/etc/dhcpc/dhcpcd-wlan0.pid", std::to_string(client.Pid()));
    EXPECT_EQ(get(gateway, sizeof gateway), 0);
    EXPECT_STREQ(gateway, "");
    WriteFile("/etc/dhcpc/dhcpcd-wlan0.info", "IPADDR=10.1.1.2\nGATEWAY=10.1.1.1\n");
    EXPECT_EQ(get(gateway, sizeof gateway), 0);
    EXPECT_STREQ(gateway, "10.1.1.1");
}

}  // namespace
}  // namespace taviwireless::test
