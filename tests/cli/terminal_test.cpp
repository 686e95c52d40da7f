// SPDX-License-Identifier: MIT
// What the program does to the terminal that it runs in.
#include "tests/support/terminal.h"

#include <clocale>
#include <csignal>
#include <cwchar>

#include "base/split.h"
#include "tests/cli/cli_runs.h"
#include "tests/wireless/wifi_fixture.h"

namespace taviwireless::test {
namespace {

using testing::HasSubstr;
using testing::Not;

constexpr char kEscape = '\033';

std::vector<std::string> In(const std::string& type, const std::string& locale,
                            const std::string& words, const std::string& program) {
    std::vector<std::string> argv = Split(words, ' ');
    argv.insert(argv.begin(), {"env", "TERM=" + type, "LC_ALL=" + locale, BuiltProgram(program)});
    return argv;
}

// Columns that the C library gives the text, without the switches of colours.
int WidthOf(const std::string& text) {
    setlocale(LC_CTYPE, "C.UTF-8");
    int width = 0;
    for (size_t place = 0; place < text.size();) {
        if (text[place] == kEscape) {
            place = text.find('m', place) + 1;
            continue;
        }
        wchar_t letter = 0;
        const int bytes = mbtowc(&letter, &text[place], text.size() - place);
        EXPECT_GT(bytes, 0) << text;
        if (bytes <= 0) {
            break;
        }
        width += wcwidth(letter);
        place += static_cast<size_t>(bytes);
    }
    return width;
}

TEST(Terminals, ListsFitAndAlign) {
    SetSupport("yes");
    WriteFile("/usr/tavi/etc/wireless.conf",
              "[00:11:22:33:44:55]\n\tESSID=Home\n"
              "[00:11:22:33:44:56]\n\tESSID=東京の無線\n"
              "[00:11:22:33:44:57]\n\tESSID=Cafe\u0301 \U0001F600\u202E\xff\n"
              "[00:11:22:33:44:58]\n\tESSID=This name has all 32 letters ...\n");
    const struct {
        unsigned short columns;
        const char* type;
        const char* locale;
    } kTerminals[] = {{40, "xterm", "C.UTF-8"},  {80, "xterm", "C.UTF-8"},
                      {200, "xterm", "C.UTF-8"}, {80, "dumb", "de_DE.UTF-8"},
                      {80, "xterm", "C"},        {200, "dumb", "C"}};
    for (const auto& [columns, type, locale] : kTerminals) {
        Terminal terminal(In(type, locale, "wifi saved list", "taviwireless"), columns);
        EXPECT_EQ(terminal.Wait(), 0);
        const std::string shown = terminal.Shown();
        SCOPED_TRACE(std::to_string(columns) + type + locale + ":\n" + shown);
        const bool isTable = columns >= 80;
        EXPECT_EQ(shown.find(kEscape) != std::string::npos, isTable && *type == 'x');
        const bool isASCII =
            std::all_of(shown.begin(), shown.end(), [](char c) { return (c & 0x80) == 0; });
        EXPECT_EQ(isASCII, std::string(locale) == "C");
        EXPECT_THAT(shown, HasSubstr("00:11:22:33:44:58"));
        if (columns == 80) {
            EXPECT_THAT(shown, HasSubstr(isASCII ? "letters ..  -" : "letters .\u2026  -"));
        }
        std::set<int> places;
        for (std::string line : Lines(shown)) {
            line.erase(line.find('\r'));
            EXPECT_LE(WidthOf(line), columns);
            const size_t bssid = line.find("00:11");
            if (bssid != std::string::npos) {
                places.insert(WidthOf(line.substr(0, bssid)));
            }
        }
        EXPECT_EQ(places.size(), 1u);
    }
}

TEST(Terminals, NothingIsCutInAFile) {
    SetSupport("yes");
    const std::string name = "A name that is long \u6771\xff";
    WriteFile("/usr/tavi/etc/wireless.conf", "[00:11:22:33:44:55]\n\tESSID=" + name + "\n");
    const RunResult list = RunProgram(In("xterm", "C", "wifi saved list", "taviwireless"));
    EXPECT_THAT(list.out, HasSubstr("\nA name that is long \u6771?  "));
    EXPECT_THAT(list.out, Not(HasSubstr("\033")));
}

TEST(Terminals, ASecretIsNotShownAndTheEchoComesBack) {
    const struct {
        const char* typed;
        int signal;
        int status;
    } kEnds[] = {{"secret\n", 0, kNotFound},
                 {"\003", 0, 128 + SIGINT},
                 {"", SIGTERM, 128 + SIGTERM},
                 {"", SIGHUP, 128 + SIGHUP}};
    for (const auto& [typed, signal, status] : kEnds) {
        Terminal terminal(
            In("xterm", "C", "modem --direct profile set usbmodem0 password", "taviwireless"), 80);
        ASSERT_TRUE(terminal.AwaitPrompt("Password: ")) << terminal.Shown();
        EXPECT_FALSE(terminal.Echoes());
        terminal.Type(typed);
        terminal.Signal(signal);
        EXPECT_EQ(terminal.Wait(), status) << typed << signal;
        EXPECT_TRUE(terminal.Echoes());
        EXPECT_THAT(terminal.Shown(), Not(HasSubstr("secret")));
    }
}

// A call of the library takes as long as iwlist does.
TEST(Terminals, ProgressGoesOnWhileTheLibraryWaits) {
    SetSupport("yes");
    const WirelessInterface interface;
    ToolStandIns tools;
    for (const std::string type : {"xterm", "dumb"}) {
        Shell("rm -f /tmp/scanned");
        tools.Add("/sbin/iwlist", "until [ -e /tmp/scanned ]; do sleep 0.01; done");
        Terminal terminal(In(type, "C", "wifi scan", "taviwireless_with_wifi"), 80);
        const bool isDumb = type == "dumb";
        EXPECT_TRUE(terminal.Await(isDumb ? "Looking for networks ...\r\n" : "networks ... 1 s"))
            << terminal.Shown();
        WriteFile("/tmp/scanned", "");
        terminal.Wait();
        EXPECT_EQ(terminal.Shown().find(kEscape) == std::string::npos, isDumb) << terminal.Shown();
    }
}

}  // namespace
}  // namespace taviwireless::test
