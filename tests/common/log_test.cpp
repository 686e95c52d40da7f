// Lines of the system log.
#include "common/log.h"

#include <gmock/gmock.h>

#include "tests/support/log_capture.h"

namespace taviwireless::test {
namespace {

TEST(Log, IsPrintableWhateverStandsInIt) {
    const struct {
        const char* text;
        const char* logged;
    } kTexts[] = {
        {"+COPS: 0,0,\"plain ~\"", "+COPS: 0,0,\"plain ~\""},
        {"\033[2J\033]0;title\a", "?[2J?]0;title?"},
        {"OK\nusbmodem1 is ready\r", "OK?usbmodem1 is ready?"},
        {"\t\x7F", "??"},
        {"ERROR\n", "ERROR\n"},  // it ends the line in any case
        {"\n\n", "?\n"},
        {"Telef\xC3\xB3nica \xE4\xB8\xAD\xF0\x9F\x93\xB6",
         "Telef\xC3\xB3nica \xE4\xB8\xAD\xF0\x9F\x93\xB6"},
        {"\xC2\x9B"
         "2J \xC2\xA0",
         "??2J \xC2\xA0"},                                     // U+009B steers terminals, too
        {"\x9B \xC0\xAF \xE0\x9F\xBF", "? ?? ???"},            // bare, and written too long
        {"\xED\xA0\x80 \xF4\x90\x80\x80 \xFF", "??? ???? ?"},  // no characters
        {"cut \xE4\xB8", "cut ??"},
        {"cut \xF0\x9F\x93", "cut ???"},
    };
    for (const auto& row : kTexts) {
        LogCapture log;
        TAVI_LOG_ERROR("%s", row.text);
        const std::string place = "log_test.cpp:" + std::to_string(__LINE__ - 1) + " ";
        EXPECT_EQ(log.Text(), place + row.logged + "\n");
    }
}

}  // namespace
}  // namespace taviwireless::test
