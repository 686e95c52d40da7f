// SIM status, PIN and PUK, against a card that keeps its state and against single odd replies.
#include <functional>

#include "tests/usbmodem/opened_modem.h"

namespace taviwireless::test {
namespace {

using testing::ElementsAre;
using testing::IsEmpty;
using usbmodem_lib::USBModem;

constexpr char kQuery[] = "AT+CPIN?";
constexpr char kQueryLock[] = "AT+CLCK=\"SC\",2";

TEST(SIMStatus, IsNamedByTheReplyOfTheModem) {
    const struct {
        const char* reply;
        const char* name;
        bool isReady;
        bool isUsable;
    } kReplies[] = {
        {"+CPIN: READY", "ready", true, true},
        {"+CPIN: SIM PIN", "pin_protect", false, true},
        {"+CPIN: SIM PUK", "puk_protect", false, true},
        {"ERROR +CPIN: READY", "ready", true, true},
        {"+CPIN: SIM PUK +CPIN: SIM PIN", "pin_protect", false, true},
        {"+CME ERROR: SIM BUSY", "no_sim", false, false},
        {"ERROR: SIM failure", "no_sim", false, false},
        {"OK", "no_sim", false, false},
    };
    OpenedModem modem("generic");
    for (const auto& reply : kReplies) {
        SCOPED_TRACE(reply.reply);
        modem.Answer(kQuery, {reply.reply});
        modem.log.Clear();
        const bool isUnknown = std::string(reply.reply) == "OK";
        bool err = false;
        EXPECT_EQ(modem.record.GetPINStatus(err), reply.name);
        EXPECT_EQ(err, isUnknown);
        EXPECT_EQ(modem.log.Has("error on getting PIN status"), isUnknown);
        EXPECT_EQ(modem.log.Has("error value on PINStatus, 5"), isUnknown);
        err = false;
        EXPECT_EQ(modem.record.IsPINReady(err), reply.isReady);
        EXPECT_EQ(err, !reply.isUsable);
        EXPECT_EQ(modem.log.Has("error SIM stats, PIN is not ready"), err);
    }
}

TEST(PINProtection, IsReadFromTheReply) {
    const struct {
        std::vector<std::string> reply;
        int result;
    } kReplies[] = {
        {{"+CLCK: 1", "OK"}, 1},
        {{"+CLCK: 0", "OK"}, 0},
        {{"+CME ERROR: SIM PIN required"}, 1},
        {{"+CME ERROR: SIM PUK required"}, -1},
        {{"OK"}, -1},
    };
    OpenedModem modem;
    for (const auto& reply : kReplies) {
        SCOPED_TRACE(reply.reply[0]);
        modem.Answer(kQueryLock, reply.reply);
        EXPECT_EQ(modem.record.PINGetEnableProtection(), reply.result);
    }
}

TEST(PINProtection, IsSwitchedWhereThatChangesIt) {
    OpenedModem modem("12d1,pin=1234,lock=off");
    ASSERT_EQ(modem.record.UpdateSIMStatus(), 1);
    EXPECT_EQ(modem.record.ChangePINEnable("1234", false), 0);
    EXPECT_THAT(modem.Received(), ElementsAre(kQuery, kQueryLock));  // there is nothing to change
    EXPECT_EQ(modem.record.ChangePINEnable("9999", true), -2);
    EXPECT_TRUE(
        modem.log.Has("error on enable PIN protection, ret: +CME ERROR: incorrect password"));
    EXPECT_EQ(modem.record.ChangePINEnable("1234", true), 0);
    EXPECT_EQ(modem.record.ChangePINEnable("1234", false), 0);
    EXPECT_EQ(modem.record.GetPINEnable(), 0);
    modem.Silence("AT+CLCK=\"SC\",1*");
    EXPECT_EQ(modem.record.ChangePINEnable("1234", true), -1);
    EXPECT_TRUE(modem.log.Has("error on modem cmd: enable pin protection"));
    modem.Answer(kQueryLock, {"OK"});
    EXPECT_EQ(modem.record.ChangePINEnable("1234", true), -1);
    EXPECT_TRUE(modem.log.Has("error on getting current PIN enable setting"));
}

TEST(PINChange, ChangesThePINOfAReadyCard) {
    OpenedModem modem("12d1,pin=1234");
    EXPECT_EQ(modem.record.ChangePIN("1234", "4321"), -1);
    EXPECT_TRUE(modem.log.Has("Cannot change PIN when SIM is not ready"));
    EXPECT_EQ(modem.record.PINUnlock("1234"), 0);
    EXPECT_THAT(modem.Received(), ElementsAre(kQuery, "AT+CPIN=1234", kQuery));
    EXPECT_EQ(modem.record.PINUnlock("9999"), 0);
    EXPECT_THAT(modem.Received(), ElementsAre(kQuery, kQuery));  // a ready card gets no PIN
    EXPECT_EQ(modem.record.ChangePIN("", "4321"), -1);
    EXPECT_EQ(modem.record.ChangePIN("1234", ""), -1);
    EXPECT_EQ(modem.log.Count("error on change pin: input args should not be null"), 2);
    EXPECT_EQ(modem.record.ChangePIN("1234", "4321"), 0);
    EXPECT_EQ(modem.record.ChangePIN("1234", "5555"), -2);
    EXPECT_TRUE(modem.log.Has("error on changing PIN, ret: +CME ERROR: incorrect password"));
    EXPECT_THAT(modem.Received(), ElementsAre("AT+CPWD=\"SC\",\"1234\",\"4321\"",
                                              "AT+CPWD=\"SC\",\"1234\",\"5555\""));
}

TEST(PINSet, SwitchesTheProtectionAndThenChangesThePINUnlessThatFailed) {
    OpenedModem modem("12d1,pin=1234,lock=off");
    EXPECT_TRUE(modem.record.IsNewPlugIn());
    EXPECT_EQ(modem.record.PINSet("1234", "4321", true), -1);  // the status is not known yet
    EXPECT_FALSE(modem.record.IsNewPlugIn());
    EXPECT_TRUE(modem.log.Has("failed on PIN enable"));
    EXPECT_THAT(modem.Received(), ElementsAre(kQuery));
    EXPECT_EQ(modem.record.PINSet("9999", "4321", true), -2);
    EXPECT_THAT(modem.Received(), ElementsAre(kQueryLock, "AT+CLCK=\"SC\",1,\"9999\"", kQuery));
    EXPECT_FALSE(modem.log.Has("failed on change PIN"));
    EXPECT_EQ(modem.record.PINSet("9999", "4321", false), -2);
    EXPECT_TRUE(modem.log.Has("failed on change PIN"));
    modem.Received();
    EXPECT_EQ(modem.record.PINSet("1234", "4321", true), 0);
    EXPECT_THAT(modem.Received(), ElementsAre(kQueryLock, "AT+CLCK=\"SC\",1,\"1234\"",
                                              "AT+CPWD=\"SC\",\"1234\",\"4321\"", kQuery));
}

TEST(PINUnlock, RefusesAWrongPINUntilThePUKSetsANewOne) {
    const struct {
        const char* modem;
        const char* pinCommand;
        const char* pukCommand;
    } kModems[] = {{"generic", "AT+CPIN=9999", "AT+CPIN=12345678,4321"},
                   {"2001", "AT+CPIN=\"9999\"", "AT+CPIN=\"12345678\",\"4321\""}};
    for (const auto& kind : kModems) {
        SCOPED_TRACE(kind.modem);
        OpenedModem modem(std::string(kind.modem) + ",pin=1234,attempts=1,puk=12345678");
        EXPECT_EQ(modem.record.PINUnlock("9999"), -2);
        EXPECT_THAT(modem.Received(), ElementsAre(kQuery, kind.pinCommand, kQuery));
        EXPECT_TRUE(modem.log.Has(
            "Cannot find OK in respond of PIN unlock, ret: +CME ERROR: incorrect password"));
        EXPECT_FALSE(modem.record.IsNewPlugIn());
        bool err = false;
        EXPECT_FALSE(modem.record.IsPINReady(err));
        EXPECT_EQ(modem.record.PUKSet("12345678", "4321"), 0);  // so it was waiting for the PUK
        EXPECT_THAT(modem.Received(), ElementsAre(kind.pukCommand, kQuery));
        EXPECT_TRUE(modem.record.IsPINReady(err));
        EXPECT_FALSE(err);
    }
}

TEST(Codes, ThatWouldEndTheirPlaceInACommandAreRefused) {
    OpenedModem modem("generic");
    USBModem& record = modem.record;
    // Whether it is refused, with nothing sent but questions for the status.
    const auto isRefused = [&](const std::function<int()>& operation) {
        modem.Received();
        modem.log.Clear();
        const bool isFailure = operation() == -1;
        const std::vector<std::string> sent = modem.Received();
        return isFailure && modem.log.Count("refused: a code with") == 1 &&
               !modem.log.Has("0900") && sent == std::vector<std::string>(sent.size(), kQuery);
    };
    ASSERT_EQ(record.UpdateSIMStatus(), 1);
    for (const char* code : {"1\n", "1234;D0900;", "1\",\"0900", "1,0900", "0900\x1B", "\x7F"}) {
        EXPECT_TRUE(isRefused([&] { return record.ChangePIN(code, "4321"); })) << code;
    }
    const char* const code = "1234\rATD0900;";
    EXPECT_TRUE(isRefused([&] { return record.ChangePIN("1234", code); }));
    EXPECT_TRUE(isRefused([&] { return record.ChangePINEnable(code, true); }));
    EXPECT_TRUE(isRefused([&] { return record.PINSet(code, "", true); }));
    EXPECT_TRUE(isRefused([&] { return record.PINSet("1234", code, true); }));
    EXPECT_TRUE(isRefused([&] { return record.PINUnlock(code); }));
    modem.Answer(kQuery, {"+CPIN: SIM PUK"});
    ASSERT_EQ(record.UpdateSIMStatus(), 0);
    EXPECT_TRUE(isRefused([&] { return record.PUKSet(code, "4321"); }));
    EXPECT_TRUE(isRefused([&] { return record.PUKSet("12345678", code); }));
}

TEST(Attempts, AreReadFromTheLayoutOfTheVendorAndKeptWithoutAUsableCard) {
    const struct {
        const char* modem;
        const char* unusable;
    } kModems[] = {{"generic", "+CME ERROR: SIM BUSY"}, {"12d1", "ERROR"}, {"2001", "OK"}};
    for (const auto& kind : kModems) {
        SCOPED_TRACE(kind.modem);
        OpenedModem modem(std::string(kind.modem) + ",pin=1234,attempts=2");
        ASSERT_EQ(modem.record.UpdateSIMStatus(), 0);
        EXPECT_EQ(modem.record.PINGetAttemptRemain(), 2);
        EXPECT_EQ(modem.record.PUKGetAttemptRemain(), 10);
        modem.Answer(kQuery, {kind.unusable});
        modem.record.UpdateSIMStatus();
        modem.Received();
        EXPECT_EQ(modem.record.PINGetAttemptRemain(), 2);
        EXPECT_EQ(modem.record.PUKGetAttemptRemain(), 10);
        EXPECT_THAT(modem.Received(), IsEmpty());
    }
}

}  // namespace
}  // namespace taviwireless::test
