// What is sent for an operation, and how the replies are read.
#include <gmock/gmock.h>
#include <taviwireless/usbmodem_atif.h>

#include <typeinfo>

#include "tests/support/log_capture.h"

namespace taviwireless::test {
namespace {

using usbmodem_lib::USBModem_ATIF;
using usbmodem_lib::USBModem_ATIF_Huawei;

TEST(Atif, IsTheStandardOneForAnUnknownVendor) {
    LogCapture log;
    USBModem_ATIF* const set = USBModem_ATIF::CreateATIF("12D1");
    EXPECT_TRUE(typeid(*set) == typeid(USBModem_ATIF));
    EXPECT_TRUE(log.Has(" Unknown vendor id 12D1, assign default ATIF"));
    USBModem_ATIF::DeleteATIF(set);
}

TEST(Parsers, ReadGoodRepliesAndRefuseBadOnesWithALogLine) {
    USBModem_ATIF generic;
    EXPECT_EQ(generic.GetATCommandGetRoaming(), "AT+CREG?");  // asked of a connected modem alone
    USBModem_ATIF_Huawei huawei;
    constexpr auto kRSSI = &USBModem_ATIF::ParseRetStringGetRSSI;
    constexpr auto kRoaming = &USBModem_ATIF::ParseRetStringGetRoaming;
    constexpr auto kPIN = &USBModem_ATIF::ParseRetStringPINRemainAttempt;
    constexpr auto kPUK = &USBModem_ATIF::ParseRetStringPUKRemainAttempt;
    constexpr auto kISP = &USBModem_ATIF::ParseRetStringDefaultISP;
    constexpr auto kAPN = &USBModem_ATIF::ParseRetStringDefaultAPN;
    constexpr auto kValue = &USBModem_ATIF::ParseRetStringDefaultFormat;
    const struct {
        USBModem_ATIF& set;
        int (USBModem_ATIF::*parse)(const std::string&, std::string&);
        const char* reply;
        const char* result;  // null: refused
    } kCases[] = {
        {generic, kRSSI, "+CSQ: 17,99\nOK\n", " 17"},
        {generic, kRSSI, "+CSQ: 17\nOK\n", " 17\nOK\n"},
        {generic, kRSSI, "17,99\nOK\n", ""},
        {generic, kRSSI, "ERROR\nOK\n", nullptr},
        {generic, kRoaming, "+CREG: 2,5,\"1F4B\",\"00A2\"\nOK\n", "true"},
        {generic, kRoaming, "+CREG: 0,5\nOK\n", "false"},  // the field reaches to the end
        {generic, kRoaming, "+CREG: 2,1,\"1F4B\",\"00A2\"\nOK\n", "false"},
        {generic, kRoaming, "+CREG: 2,55,\"1F4B\"\nOK\n", "false"},
        {generic, kPIN, "+EPINC: 3,4,10,11\nOK\n", " 3"},
        {generic, kPUK, "+EPINC: 3,4,10,11\nOK\n", "10"},
        {generic, kPUK, "+EPINC: 3\nOK\n", ""},
        {huawei, kPIN, "^CPIN: READY,,10,3,11,4\nOK\n", "3"},
        {huawei, kPUK, "^CPIN: READY,,10,3,11,4\nOK\n", "10"},
        {huawei, kPIN, "", nullptr},
        {generic, kISP, "+COPS: 0,0,\"A, B: C\",2\nOK\n", "A, B: C"},
        {generic, kISP, "+COPS: 0\nOK\n", ""},
        {generic, kISP, "+COPS: 0,0,\"cut", "cut"},
        {generic, kAPN, "+CGDCONT: 1,\"IP\",\"internet\",\"0.0.0.0\",0,0\nOK\n", "internet"},
        {generic, kAPN, "+CGDCONT: 1,\"IP\",\"\",\"\",0,0\nOK\n", ""},
        {generic, kValue, "E1752\nOK\n", "E1752"},
        {generic, kValue, "+CGMI: Vendor\nOK\n", " Vendor"},
        {generic, kValue, "no line feed", "no line feed"},
        {generic, kValue, "4669\n^RSSI:21\nOK\n", "21"},  // the first ":" wherever it is
        {generic, kValue, "", nullptr},
    };
    for (const auto& row : kCases) {
        SCOPED_TRACE(row.reply);
        LogCapture log;
        std::string result = "kept";
        EXPECT_EQ((row.set.*row.parse)(row.reply, result), row.result ? 0 : -1);
        EXPECT_EQ(result, row.result ? row.result : "kept");
        EXPECT_EQ(log.Lines().size(), row.result ? 0u : 1u) << log.Text();
        EXPECT_EQ(log.Count("error on input "), row.result ? 0 : 1) << log.Text();
    }
}

TEST(Parsers, LogARefusedReplyOnOneLineAndWithoutTheCodesInIt) {
    const struct {
        const char* reply;
        const char* logged;
    } kReplies[] = {
        {"^RSSI:21\nERROR\n", "^RSSI:21 ERROR"},
        {"at+cpin=\"1357\",\"2468\"\nERROR\n", "at+cpin=*** ERROR"},
        {"AT+CPWD=\"P2\",\"1357\",\"2468\"\nERROR\n", "AT+CPWD=\"P2\",*** ERROR"},
        {"AT+CLCK=\"SC\",1,\"1357\"\nERROR\n", "AT+CLCK=\"SC\",1,*** ERROR"},
        {"AT+CLCK=\"SC\",2\nERROR\n", "AT+CLCK=\"SC\",2 ERROR"},
        {"\033[2JERROR\n", "?[2JERROR"},
    };
    for (const auto& row : kReplies) {
        LogCapture log;
        std::string result;
        EXPECT_EQ(USBModem_ATIF().ParseRetStringGetRSSI(row.reply, result), -1);
        EXPECT_THAT(log.Text(), testing::EndsWith(std::string("string: ") + row.logged + "\n\n"));
    }
}

}  // namespace
}  // namespace taviwireless::test
