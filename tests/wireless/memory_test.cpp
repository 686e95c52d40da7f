// What happens when memory is short: every allocation of C++ fails once.
#include <taviwireless/wireless.h>

#include <functional>

#include "tests/support/failing_memory.h"
#include "tests/support/sleep_capture.h"
#include "tests/wireless/station_fixture.h"
#include "wireless/system/queue.h"

namespace taviwireless::test {
namespace {

constexpr char kSettings[] = "/usr/tavi/etc/wireless_ap.conf";

// Calls the function with its first allocation failing, then one further on, until none does. An
// exception would end the test.
void FailEach(
    const std::function<void()>& arrange, const std::function<void()>& call,
    const std::function<void()>& check = [] {}, int stride = 1) {
    bool hasFailed = true;
    for (int n = 0; hasFailed; n += stride) {
        arrange();
        FailAllocationAfter(n);
        call();
        hasFailed = HasAllocationFailed();
        check();
    }
}

WirelessAPSettings Encrypted(const char* ssid) {
    WirelessAPSettings settings{};
    settings.enabled = settings.unblock = 1;
    CopyField(settings.name, "a stick with a long name");
    CopyField(settings.ap.ssid, ssid);
    CopyField(settings.ap.bridge, "lbr0");
    settings.ap.security = WIRELESS_AP_WPA;
    CopyField(settings.ap.secret.wpa.passphrase, "a pass phrase of some length");
    return settings;
}

TEST(Memory, SettingsAreStoredAllOrNotAtAll) {
    const Station station;
    const WirelessAPSettings before = Encrypted("before"), after = Encrypted("after");
    ASSERT_EQ(TAVIWirelessSetAPConfig(&before), 1);
    const std::string old = ReadFile(kSettings);
    ASSERT_EQ(TAVIWirelessSetAPConfig(&after), 1);
    const std::string whole = ReadFile(kSettings);
    int result = 0;
    FailEach([&] { WriteFile(kSettings, old); }, [&] { result = TAVIWirelessSetAPConfig(&after); },
             [&] { EXPECT_EQ(ReadFile(kSettings), result == 1 ? whole : old); });

    WirelessConf conf = MakeConf();
    ASSERT_EQ(TAVIWirelessConfSet(&conf), 0);
    const auto keys = [] { return Shell("grep -v ACCESS_TIME " + std::string(kSavedFile)); };
    const std::string saved = keys();
    CopyField(conf.key, "another secret");
    ASSERT_EQ(TAVIWirelessConfSet(&conf), 0);
    const std::string savedAnew = keys();
    const std::string file = ReadFile(kSavedFile);
    CopyField(conf.key, kKey);
    FailEach([&] { WriteFile(kSavedFile, file); }, [&] { result = TAVIWirelessConfSet(&conf); },
             [&] { EXPECT_EQ(keys(), result == 0 ? saved : savedAnew); });
}

TEST(Memory, NoExceptionLeavesAFunction) {
    Station station;
    const std::string network = ScanLine(1, "net", "00:11:22:aa:bb:cc", 9, "b", "WPA2PSK/AES");
    WriteFile("/tmp/table", "\n\n" + network);
    station.tools.Add("/sbin/iwlist", "cat /tmp/table");
    station.tools.Add("/usr/sbin/udhcpc", "exit 1");
    station.tools.Add("/etc/rc.network");
    SetSupport("yes");
    station.driver.accessPoint = {2};
    WriteFile("/tmp/wireless.info", "PRODUCT=stick\nAP_SUPPORT=yes\n");
    WriteFile(kSettings, "[stick]\n\tenable=yes\n\tunblock=yes\n");
    WriteFile(kRecord, "net\n1\n2\n3\n0:1:2:3:4:5\n");
    WirelessConf conf = MakeConf();
    ASSERT_EQ(TAVIWirelessConfSet(&conf), 0);
    const SleepCapture sleeps;
    WirelessStatus status;
    char text[32];
    const std::function<void()> kCalls[] = {
        [&] { TAVIWirelessNetworkConnect(&conf); },
        [&] { TAVIWirelessStatusGet(&status); },
        [&] {
            wireless::OwnedList<WirelessConf> confs;
            TAVIWirelessConfEnumByAtime(confs.Head());
        },
        [&] { TAVIWirelessAutoConnect(); },
        [&] { TAVIWirelessDefaultGatewayConfGet_core(text, sizeof text); },
        [&] { TAVIWirelessAPDisable(); },
        [] { TAVIWirelessAPEnable(); },
    };
    // The scripted driver has its memory from here on.
    station.driver.modesSet.reserve(1000);
    TAVIWirelessOpmodeGet();
    for (const auto& call : kCalls) {
        FailEach([] {}, call, [] {}, 7);  // they have many
    }
    EXPECT_TRUE(station.log.Has("Failed to alloc memory"));
    EXPECT_EQ(TAVIWirelessAPEnable(), 1) << station.log.Text();
}

}  // namespace
}  // namespace taviwireless::test
