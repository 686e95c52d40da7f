// Names and values: authentication, encryption, operation modes, protocols, addresses.
#include <gmock/gmock.h>
#include <taviwireless/wireless.h>

#include <algorithm>

#include "tests/support/log_capture.h"

namespace taviwireless::test {
namespace {

using Parse = int(const char*);

// Checks that each name gives its value in any case, and lists them.
template <size_t N>
std::string Parsed(const WirelessNameValue (&names)[N], Parse* parse, int unknown) {
    std::string text;
    for (const auto& [name, value] : names) {
        std::string other = name;
        std::transform(other.begin(), other.end(), other.begin(), ::tolower);
        EXPECT_EQ(parse(other.c_str()), value) << name;
        EXPECT_EQ(parse((other + " ").c_str()), unknown) << name;
        text += std::string(name) + "=" + std::to_string(value) + " ";
    }
    LogCapture log;
    EXPECT_EQ(parse(nullptr), unknown);
    EXPECT_EQ(log.Count(" Bad parameters"), 1);
    return text;
}

TEST(Names, AreUnderstoodWhateverTheirCase) {
    EXPECT_EQ(Parsed(gWirelessAuths, TAVIWirelessAuthParse, 0),
              "UNKNOW=0 OPEN=1 SHARED=2 WEPAUTO=3 AUTOWEP=3 WPA=4 WPAPSK=4 WPA1=4 WPA1PSK=4 "
              "WPANONE=6 WPA2=5 WPA2PSK=5 WPA1WPA2=5 WPA1PSKWPA2PSK=5 WPA1WPA2PSK=5 WPAEAP=7 "
              "WPA1EAP=7 WPA2EAP=8 WPA1WPA2EAP=8 ");
    EXPECT_EQ(Parsed(gWirelessEncrypts, TAVIWirelessEncryptParse, 0),
              "UNKNOW=0 NONE=1 WEP=2 TKIP=4 AES=8 TKIPAES=12 TKIP AES=12 ");
    EXPECT_EQ(Parsed(gWirelessOpmodes, TAVIWirelessOpmodeParse, 7),
              "Auto=0 Ad-Hoc=1 Managed=2 Master=3 Repeater=4 Secondary=5 Monitor=6 Unknown/bug=7 "
              "In=2 Ad=1 Infra=2 Adhoc=1 Any=2 ");
    EXPECT_EQ(Parsed(gWirelessProtocols, TAVIWirelessProtocolParse, 0),
              "unknown=0 11b=2 11a=3 11a/n=9 11b/g=1 11b/g/n=10 b=2 a=3 an=9 bg=1 bgn=10 a/n=9 "
              "b/g=1 b/n=12 b/g/n=10 11b/n=12 bn=12 ");
    EXPECT_EQ(TAVIWirelessAuthParse("WPA3"), 0);
    EXPECT_EQ(TAVIWirelessOpmodeParse("Secondeary"), 7);
    EXPECT_EQ(TAVIWirelessProtocolParse("11g"), 0);
}

template <typename StringGet>
std::string Printed(int last, StringGet stringGet) {
    std::string text;
    for (int value = -1; value <= last; ++value) {
        text += std::string(stringGet(value)) + "|";
    }
    return text;
}

TEST(Names, OfValuesAreOneEach) {
    EXPECT_EQ(Printed(9, TAVIWirelessAuthStringGet),
              "unknown|unknown|OPEN|SHARED|WEPAUTO|WPAPSK|WPA2PSK|WPANONE|WPAEAP|WPA2EAP|unknown|");
    EXPECT_EQ(Printed(8, TAVIWirelessOpmodeStringGet),
              "Unknown|Auto|Ad-Hoc|Managed|Master|Repeater|Secondeary|Monitor|Unknown|Unknown|");
    EXPECT_EQ(Printed(13, TAVIWirelessProtocolStringGet),
              "unknown|unknown|11b/g|11b|11a|11a/b/g|11g|11a/b/g/n|11n|11g/n|11a/n|11b/g/n|"
              "11a/g/n|11b/n|unknown|");
    EXPECT_EQ(Printed(4, [](int bit) { return TAVIWirelessEncryptStringGet(1 << (bit + 1), 0); }),
              "none|WEP|TKIP|AES|unknown|unknown|");
    EXPECT_STREQ(TAVIWirelessEncryptStringGet(3, 1), "unknown");
    EXPECT_STREQ(TAVIWirelessEncryptStringGet(8, 1), "CCMP");
    EXPECT_STREQ(TAVIWirelessEncryptStringGet(12, 0), "TKIP AES");
    EXPECT_STREQ(TAVIWirelessEncryptStringGet(12, 1), "TKIP CCMP");
}

TEST(Address, IsSixHexadecimalGroups) {
    const std::pair<const char*, const char*> kRows[] = {
        {"00:11:22:aa:BB:cc", "00:11:22:AA:BB:CC"},
        {" \t0:1:2:3:4:5", "00:01:02:03:04:05"},
        {"100:1ff:22:0033:44:55 and more", "00:FF:22:33:44:55"},
        {"00-11-22-33-44-55", nullptr},  // refused
        {"00:11:22:33:44:g5", nullptr},
        {"%s%n", nullptr}};
    for (const auto& [text, printed] : kRows) {
        LogCapture log;
        unsigned char bssid[6] = {9, 9, 9, 9, 9, 9};
        char all[18];
        EXPECT_EQ(TAVIWirelessBssidParse(text, bssid), printed != nullptr ? 0 : -1);
        EXPECT_STREQ(TAVIWirelessBssidStringGet(bssid, all, sizeof all),
                     printed != nullptr ? printed : "09:09:09:09:09:09");
        EXPECT_EQ(log.Has("BSSID '" + std::string(text) + "'"), printed == nullptr);
    }
    char cut[6];
    const unsigned char bssid[6] = {0x61, 0x62, 0x63, 0x64, 0x65, 0x66};
    EXPECT_STREQ(TAVIWirelessBssidStringGet(bssid, cut, sizeof cut), "61:62");
}

}  // namespace
}  // namespace taviwireless::test
