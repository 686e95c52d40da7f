// What is sent for an operation, and how the replies are read.
#include <gmock/gmock.h>
#include <taviwireless/usbmodem_atif.h>

#include <functional>
#include <memory>
#include <thread>

#include "tests/support/log_capture.h"

namespace taviwireless::test {
namespace {

using usbmodem_lib::USBModem_ATIF;
using usbmodem_lib::USBModem_ATIF_DLink;
using usbmodem_lib::USBModem_ATIF_Huawei;

using CommandSet = std::unique_ptr<USBModem_ATIF, void (*)(USBModem_ATIF*)>;

CommandSet Create(const std::string& vendorId) {
    return {USBModem_ATIF::CreateATIF(vendorId), USBModem_ATIF::DeleteATIF};
}

TEST(Atif, BuildsTheCommandOfEachOperationForEachVendor) {
    using Build = std::function<std::string(USBModem_ATIF&)>;
    const struct {
        Build build;
        const char* generic;
        const char* huawei;  // null: the generic one
        const char* dLink;
    } kCommands[] = {
        {[](auto& set) { return set.GetATCommandQuarySIMStatus(); }, "AT+CPIN?", nullptr, nullptr},
        {[](auto& set) { return set.GetATCommandSetSIMPIN("1234"); }, "AT+CPIN=1234", nullptr,
         "AT+CPIN=\"1234\""},
        {[](auto& set) { return set.GetATCommandSetSIMPUK("12345678", "4321"); },
         "AT+CPIN=12345678,4321", nullptr, "AT+CPIN=\"12345678\",\"4321\""},
        {[](auto& set) { return set.GetATCommandChangePINCode("1234", "4321"); },
         "AT+CPWD=\"SC\",\"1234\",\"4321\"", nullptr, nullptr},
        {[](auto& set) { return set.GetATCommandChangePINEnable("1", "1234"); },
         "AT+CLCK=\"SC\",1,\"1234\"", nullptr, nullptr},
        {[](auto& set) { return set.GetATCommandGetPINEnable(); }, "AT+CLCK=\"SC\",2", nullptr,
         nullptr},
        {[](auto& set) { return set.GetATCommandGetRSSI(); }, "AT+CSQ", nullptr, nullptr},
        {[](auto& set) { return set.GetATCommandGetHardwareFuncLvl(); }, "AT+CFUN?", nullptr,
         nullptr},
        {[](auto& set) { return set.GetATCommandSetHardwareFuncLvl("1"); }, "AT+CFUN=1", nullptr,
         nullptr},
        {[](auto& set) { return set.GetATCommandGetVendorName(); }, "AT+CGMI", nullptr, nullptr},
        {[](auto& set) { return set.GetATCommandGetProductName(); }, "AT+CGMM", nullptr, nullptr},
        {[](auto& set) { return set.GetATCommandGetIMSI(); }, "AT+CIMI", nullptr, nullptr},
        {[](auto& set) { return set.GetATCommandGetRoaming(); }, "AT+CREG?", nullptr, nullptr},
        {[](auto& set) { return set.GetATCommandGetDefaultISP(); }, "AT+COPS?", nullptr, nullptr},
        {[](auto& set) { return set.GetATCommandGetDefaultAPN(); }, "AT+CGDCONT?", nullptr,
         nullptr},
        {[](auto& set) { return set.GetATCommandPINPUKAttempt(); }, "AT+EPINC?", "AT^CPIN?",
         nullptr},
        {[](auto& set) { return set.GetATCommandGetUnsolicitedReports(); }, "", "AT^CURC?",
         nullptr},
        {[](auto& set) { return set.GetATCommandSetUnsolicitedReports(true); }, "", "AT^CURC=1",
         nullptr},
        {[](auto& set) { return set.GetATCommandSetUnsolicitedReports(false); }, "", "AT^CURC=0",
         nullptr},
        // Arguments stand as they are given.
        {[](auto& set) { return set.GetATCommandSetSIMPIN("a\"b,c"); }, "AT+CPIN=a\"b,c", nullptr,
         "AT+CPIN=\"a\"b,c\""},
        {[](auto& set) { return set.GetATCommandSetHardwareFuncLvl(""); }, "AT+CFUN=", nullptr,
         nullptr},
    };
    USBModem_ATIF generic;
    USBModem_ATIF_Huawei huawei;
    USBModem_ATIF_DLink dLink;
    for (const auto& command : kCommands) {
        SCOPED_TRACE(command.generic);
        EXPECT_EQ(command.build(generic), command.generic);
        EXPECT_EQ(command.build(huawei), command.huawei ? command.huawei : command.generic);
        EXPECT_EQ(command.build(dLink), command.dLink ? command.dLink : command.generic);
    }
}

TEST(Atif, IsChosenByTheExactVendorId) {
    const struct {
        const char* vendorId;
        const std::type_info& type;
    } kVendors[] = {
        {"12d1", typeid(USBModem_ATIF_Huawei)}, {"2001", typeid(USBModem_ATIF_DLink)},
        {"12D1", typeid(USBModem_ATIF)},        {"12d1 ", typeid(USBModem_ATIF)},
        {"19d2", typeid(USBModem_ATIF)},        {"", typeid(USBModem_ATIF)},
    };
    for (const auto& vendor : kVendors) {
        SCOPED_TRACE(vendor.vendorId);
        LogCapture log;
        const CommandSet set = Create(vendor.vendorId);
        EXPECT_TRUE(typeid(*set) == vendor.type) << typeid(*set).name();
        const bool isUnknown = vendor.type == typeid(USBModem_ATIF);
        EXPECT_EQ(log.Lines().size(), isUnknown ? 1u : 0u);
        EXPECT_EQ(
            log.Has(std::string(" Unknown vendor id ") + vendor.vendorId + ", assign default ATIF"),
            isUnknown);
    }
}

TEST(SIMStatusParser, TakesTheFirstTextOfItsOrder) {
    const struct {
        const char* reply;
        int status;
    } kReplies[] = {
        {"+CPIN: READY\nOK\n", 0},
        {"+CPIN: SIM PIN\nOK\n", 1},
        {"+CPIN: SIM PIN2\nOK\n", 1},
        {"+CPIN: SIM PUK\nOK\n", 2},
        {"+CPIN: SIM PUK2\nOK\n", 2},
        {"+CME ERROR: SIM BUSY\n", 3},
        {"BUSY\n", 3},
        {"ERROR\n", 4},
        {"+CME ERROR: SIM not inserted\n", 4},
        {"+CME ERROR: SIM failure\n", 4},
        {"SIM failure\n", 4},
        {"SIM Failure\n", 5},
        {"sim busy\n", 5},
        {"+CPIN:READY\nOK\n", 5},
        {"+CPIN: PH-SIM PIN\nOK\n", 5},
        {"OK\n", 5},
        {"", 5},
        {"^RSSI:21\n+CPIN: READY\nOK\n", 0},
        {"ERROR\n+CPIN: READY\n", 0},
        {"+CPIN: SIM PUK\n+CPIN: SIM PIN\n", 1},
    };
    USBModem_ATIF set;
    LogCapture log;
    for (const auto& reply : kReplies) {
        EXPECT_EQ(set.ParseRetStringQuarySIMStatus(reply.reply), reply.status) << reply.reply;
    }
    EXPECT_EQ(log.Text(), "");
}

constexpr char kEmpty[] = "error on input string for parsing should not be empty";
constexpr char kInputArgs[] = "error on input args of GetLineWithDelim";
constexpr char kInputString[] = "error on input string: ";

// Every parser of a value: its result, what it stores and what it logs ("" for nothing).
struct ParserCase {
    int (USBModem_ATIF::*parse)(const std::string&, std::string&);
    const char* reply;
    int status;
    const char* result;  // "kept" when nothing is to be stored
    const char* log;
};

void Check(USBModem_ATIF& set, const ParserCase& row) {
    SCOPED_TRACE(row.reply);
    LogCapture log;
    std::string result = "kept";
    EXPECT_EQ((set.*row.parse)(row.reply, result), row.status);
    EXPECT_EQ(result, row.result);
    const std::string expected = row.log;
    EXPECT_EQ(log.Lines().size(), expected.empty() ? 0u : 1u) << log.Text();
    EXPECT_TRUE(expected.empty() || log.Has(" " + expected)) << log.Text();
}

TEST(Parsers, ReadGoodRepliesAndRefuseBadOnes) {
    constexpr auto kRSSI = &USBModem_ATIF::ParseRetStringGetRSSI;
    constexpr auto kRoaming = &USBModem_ATIF::ParseRetStringGetRoaming;
    constexpr auto kPIN = &USBModem_ATIF::ParseRetStringPINRemainAttempt;
    constexpr auto kPUK = &USBModem_ATIF::ParseRetStringPUKRemainAttempt;
    constexpr auto kISP = &USBModem_ATIF::ParseRetStringDefaultISP;
    constexpr auto kAPN = &USBModem_ATIF::ParseRetStringDefaultAPN;
    constexpr auto kValue = &USBModem_ATIF::ParseRetStringDefaultFormat;
    const ParserCase kCases[] = {
        {kRSSI, "+CSQ: 17,99\nOK\n", 0, " 17", ""},
        {kRSSI, "+CSQ:17,99\nOK\n", 0, "17", ""},
        {kRSSI, "+CSQ: 17\nOK\n", 0, " 17\nOK\n", ""},
        {kRSSI, "17,99\nOK\n", 0, "", ""},
        {kRSSI, "+CSQ:", 0, "", ""},
        {kRSSI, "ERROR\nOK\n", -1, "kept", kInputString},
        {kRSSI, "", -1, "kept", kInputArgs},
        {kRoaming, "+CREG: 2,5,\"1F4B\",\"00A2\"\nOK\n", 0, "true", ""},
        {kRoaming, "+CREG: 0,5\nOK\n", 0, "false", ""},  // the field reaches to the end
        {kRoaming, "+CREG: 2,1,\"1F4B\",\"00A2\"\nOK\n", 0, "false", ""},
        {kRoaming, "+CREG: 2, 5,\"1F4B\",\"00A2\"\nOK\n", 0, "false", ""},
        {kRoaming, "+CREG: 2,55,\"1F4B\"\nOK\n", 0, "false", ""},
        {kRoaming, "OK\n", 0, "false", ""},
        {kRoaming, "+CME ERROR: no network service\n", -1, "kept", kInputString},
        {kRoaming, "", -1, "kept", kInputArgs},
        {kPIN, "+EPINC: 3,3,10,10\nOK\n", 0, " 3", ""},
        {kPUK, "+EPINC: 3,3,10,10\nOK\n", 0, "10", ""},
        {kPUK, "+EPINC: 3\nOK\n", 0, "", ""},
        {kPUK, "ERROR\n", -1, "kept", kInputString},
        {kISP, "+COPS: 0,0,\"Example Mobile\",2\nOK\n", 0, "Example Mobile", ""},
        {kISP, "+COPS: 0,0,\"A, B: C\",2\nOK\n", 0, "A, B: C", ""},
        {kISP, "+COPS: 0\nOK\n", 0, "", ""},
        {kISP, "+COPS: 0,0,\"cut", 0, "cut", ""},
        {kISP, "+CME ERROR: 30\n", -1, "kept", kInputString},
        {kAPN, "+CGDCONT: 1,\"IP\",\"internet\",\"0.0.0.0\",0,0\nOK\n", 0, "internet", ""},
        {kAPN, "+CGDCONT: 1,\"IP\",\"\",\"\",0,0\nOK\n", 0, "", ""},
        {kAPN, "OK\n", 0, "", ""},
        {kValue, "E1752\nOK\n", 0, "E1752", ""},
        {kValue, "+CGMI: Vendor\nOK\n", 0, " Vendor", ""},
        {kValue, "no line feed", 0, "no line feed", ""},
        {kValue, "466920123456789\n^RSSI:21\nOK\n", 0, "21", ""},  // the first ":" wherever it is
        {kValue, "value:", 0, "", ""},
        {kValue, "\nOK\n", 0, "", ""},
        {kValue, "OK\nERROR\n", -1, "kept", kInputString},
        {kValue, "", -1, "kept", kEmpty},
    };
    USBModem_ATIF set;
    for (const ParserCase& row : kCases) {
        Check(set, row);
    }
}

TEST(Parsers, OfVendorsReadTheirOwnAttemptCounts) {
    const char kReply[] = "^CPIN: READY,,10,3,10,3\nOK\n";
    USBModem_ATIF_Huawei huawei;
    USBModem_ATIF_DLink dLink;
    Check(huawei, {&USBModem_ATIF::ParseRetStringPINRemainAttempt, kReply, 0, "3", ""});
    Check(huawei, {&USBModem_ATIF::ParseRetStringPUKRemainAttempt, kReply, 0, "10", ""});
    Check(huawei, {&USBModem_ATIF::ParseRetStringPINRemainAttempt, "", -1, "kept", kInputArgs});
    const char kStandard[] = "+EPINC: 2,3,9,10\nOK\n";
    Check(dLink, {&USBModem_ATIF::ParseRetStringPINRemainAttempt, kStandard, 0, " 2", ""});
    Check(dLink, {&USBModem_ATIF::ParseRetStringPUKRemainAttempt, kStandard, 0, "9", ""});
}

TEST(LineWithDelim, TakesTheNumberedFieldBehindTheFirstColon) {
    const struct {
        const char* reply;
        char delim;
        int field;
        int status;
        const char* result;
        const char* log;
    } kCases[] = {
        {"+X: a,b,c\n", ',', 1, 0, " a", ""},
        {"+X: a,b,c\n", ',', 3, 0, "c\n", ""},
        {"+X: a,b,c\n", ',', 4, 0, "", ""},
        {"+X: a,b,c\n", ',', 1000, 0, "", ""},
        {"+X: a,,c\n", ',', 2, 0, "", ""},
        {"+X: a:b,c\n", ':', 2, 0, "b,c\n", ""},
        {"+X: a\nb\nc", '\n', 2, 0, "b", ""},
        {"a,b,c\n", ',', 2, 0, "", ""},
        {"+X: a,b,c\n", ',', 0, -1, "kept", kInputArgs},
        {"+X: a,b,c\n", ',', -1, -1, "kept", kInputArgs},
        {"", ',', 1, -1, "kept", kInputArgs},
        {"+X: a,ERROR\n", ',', 1, -1, "kept", "error on input string: +X: a,ERROR"},
    };
    USBModem_ATIF set;
    for (const auto& row : kCases) {
        SCOPED_TRACE(row.reply);
        LogCapture log;
        std::string result = "kept";
        EXPECT_EQ(set.GetLineWithDelim(row.reply, row.delim, row.field, result), row.status);
        EXPECT_EQ(result, row.result);
        EXPECT_TRUE(row.log[0] == '\0' ? log.Lines().empty() : log.Has(row.log)) << log.Text();
    }
}

}  // namespace
}  // namespace taviwireless::test
