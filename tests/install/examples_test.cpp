// SPDX-License-Identifier: MIT
// The examples do what they say, and say what went wrong.
#include "tests/support/bus.h"
#include "tests/wireless/station_fixture.h"

namespace taviwireless::test {
namespace {

using testing::HasSubstr;

RunResult RunExample(const std::string& program, std::vector<std::string> arguments = {},
                     const std::string& input = "") {
    arguments.insert(arguments.begin(), program);
    return RunProgram(WithShortWaits(arguments), input);
}

TEST(Examples, ScanAndJoinInC) {
    Station station;
    AddScanner(station.tools,
               {ScanLine(1, "Open", "00:11:22:AA:BB:CC", 40, "bg", "NONE/NONE") +
                ScanLine(6, "My Net", "00:11:22:AA:BB:CD", 70, "bgn", "WPA2PSK/AES")});
    const std::string join = BuiltProgram("example_wifi_join");
    EXPECT_THAT(RunExample(join).out,
                testing::ContainsRegex("\nMy Net +channel   6  signal  70  WPA2PSK\n$"));
    EXPECT_THAT(RunExample(join, {"Other"}).err, HasSubstr("Other is not in range"));
    WriteFile("/tmp/associated", "");
    station.tools.Add("/usr/sbin/udhcpc", "exit 1");
    const RunResult noLease = RunExample(join, {"My Net"}, "a secret\n");
    EXPECT_EQ(noLease.status, 1);
    EXPECT_THAT(noLease.err, HasSubstr("joined the network, but got no address"));
    EXPECT_FALSE(Exists(kRecord));
    station.tools.Add("/usr/sbin/udhcpc",
                      "{ sleep 60; :; } &\necho $! > /etc/dhcpc/dhcpcd-wlan0.pid\n"
                      "printf 'IPADDR=10.1.1.2\\nNETMASK=255.0.0.0\\n'"
                      " > /etc/dhcpc/dhcpcd-wlan0.info");
    const RunResult joined = RunExample(join, {"My Net"}, "a secret\n");
    EXPECT_EQ(joined.out, "connected to My Net\n") << joined.err;
    EXPECT_THAT(ReadFile(kSavedFile), HasSubstr("[00:11:22:AA:BB:CD]\n\tKEY=a secret\n"));
    WriteFile("/tmp/state", "wpa_state=SCANNING\n");
    EXPECT_THAT(RunExample(join, {"Open"}).err, HasSubstr("cannot join the network"));
}

TEST(Examples, ListUnlockAndDialInCpp) {
    const std::string dial = BuiltProgram("example_modem_dial");
    EXPECT_EQ(RunExample(dial).err, "modem_dial: there is no modem service on the session bus\n");
    InstallDialler(kSaysConnected);
    const ServedModems served("12d1,pin=1234,ports=dial/at");
    EXPECT_EQ(RunExample(dial).out, "usbmodem0: huawei E1752, SIM pin_protect, disconnected\n");
    const RunResult refused = RunExample(dial, {"usbmodem0"}, "4321\n");
    EXPECT_EQ(refused.status, 1);
    EXPECT_THAT(refused.err, HasSubstr("the SIM refused the PIN, which costs an attempt"));
    EXPECT_EQ(RunExample(dial, {"usbmodem0"}, "1234\n").out, "usbmodem0: connected, 127.0.0.1\n");
    EXPECT_EQ(RunExample(dial, {"usbmodem0"}).status, 0);
}

#ifndef __SANITIZE_ADDRESS__  // which Python was not built with
TEST(Examples, AWorkerScansForPython) {
    Station station;
    AddScanner(station.tools,
               {ScanLine(6, "My Net", "00:11:22:AA:BB:CC", 70, "bgn", "WPA2PSK/AES")});
    setenv("LD_LIBRARY_PATH", BuiltProgram("../lib").c_str(), 1);
    const std::string worker = TAVI_SOURCE_DIR "/examples/wifi_worker.py";
    EXPECT_EQ(RunExample(worker).out, "My Net: channel 6, signal 70\n");
    Shell("ip link delete wlan0");
    const RunResult failed = RunExample(worker);
    EXPECT_EQ(failed.status, 1);
    EXPECT_THAT(failed.err, HasSubstr("wifi_worker: cannot scan"));
    unsetenv("LD_LIBRARY_PATH");
}
#endif

}  // namespace
}  // namespace taviwireless::test
