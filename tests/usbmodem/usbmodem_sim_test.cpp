// SIM status, PIN and PUK, against a card that keeps its state and against single odd replies.
#include "tests/usbmodem/opened_modem.h"

namespace taviwireless::test {
namespace {

using testing::ElementsAre;
using testing::IsEmpty;

constexpr char kQuery[] = "AT+CPIN?";
constexpr char kQueryLock[] = "AT+CLCK=\"SC\",2";

TEST(SIMStatus, IsNamedByTheReplyOfTheModem) {
    const struct {
        const char* reply;
        int result;
        const char* name;
        bool err;
    } kReplies[] = {
        {"+CPIN: READY", 1, "ready", false},         {"+CPIN: SIM PIN", 0, "pin_protect", false},
        {"+CPIN: SIM PUK", 0, "puk_protect", false}, {"+CME ERROR: SIM BUSY", 2, "no_sim", false},
        {"ERROR: SIM failure", 2, "no_sim", false},  {"OK", -1, "no_sim", true},
    };
    OpenedModem modem("generic");
    for (const auto& reply : kReplies) {
        SCOPED_TRACE(reply.reply);
        modem.Answer(kQuery, {reply.reply});
        modem.log.Clear();
        bool err = false;
        EXPECT_EQ(modem.record.GetPINStatus(err), reply.name);
        EXPECT_EQ(err, reply.err);
        EXPECT_EQ(modem.log.Lines().size(), reply.err ? 2u : 0u) << modem.log.Text();
        EXPECT_EQ(modem.log.Has("usbmodem_sim.cpp") &&
                      modem.log.Has("error on getting PIN status") &&
                      modem.log.Has("error value on PINStatus, 5"),
                  reply.err);

        bool notReady = false;
        EXPECT_EQ(modem.record.IsPINReady(notReady), reply.result == 1);
        EXPECT_EQ(notReady, reply.result != 1 && reply.result != 0);
        EXPECT_EQ(modem.log.Has("error SIM stats, PIN is not ready"), notReady);
    }
    EXPECT_EQ(modem.Received().size(), std::size(kReplies));
}

TEST(PINProtection, IsReadFromTheReply) {
    const struct {
        std::vector<std::string> reply;
        int result;
    } kReplies[] = {
        {{"+CLCK: 1", "OK"}, 1},
        {{"+CLCK: 0", "OK"}, 0},
        {{"+CLCK: 0", "+CLCK: 1", "OK"}, 1},
        {{"+CME ERROR: SIM PIN required"}, 1},
        {{"+CME ERROR: SIM PUK required"}, -1},
        {{"OK"}, -1},
    };
    OpenedModem modem;
    for (const auto& reply : kReplies) {
        SCOPED_TRACE(reply.reply[0]);
        modem.Answer(kQueryLock, reply.reply);
        EXPECT_EQ(modem.record.GetPINEnable(), reply.result);
    }
    EXPECT_EQ(modem.log.Text(), "");
    EXPECT_EQ(modem.record.PINGetEnableProtection(), -1);
}

TEST(PINProtection, IsSwitchedOnAndOff) {
    OpenedModem modem("12d1,pin=1234,lock=off");
    ASSERT_EQ(modem.record.UpdateSIMStatus(), 1);
    EXPECT_EQ(modem.record.ChangePINEnable("1234", false), 0);
    EXPECT_THAT(modem.Received(), ElementsAre(kQuery, kQueryLock));  // there is nothing to change
    EXPECT_EQ(modem.record.ChangePINEnable("1234", true), 0);
    EXPECT_THAT(modem.Received(), ElementsAre(kQueryLock, "AT+CLCK=\"SC\",1,\"1234\""));
    EXPECT_EQ(modem.record.ChangePINEnable("1234", true), 0);
    EXPECT_THAT(modem.Received(), ElementsAre(kQueryLock));
    EXPECT_EQ(modem.record.ChangePINEnable("1234", false), 0);
    EXPECT_EQ(modem.record.GetPINEnable(), 0);
}

TEST(PINProtection, TellsWhyItWasNotSwitched) {
    OpenedModem modem("12d1,pin=1234,lock=off");
    ASSERT_EQ(modem.record.UpdateSIMStatus(), 1);
    EXPECT_EQ(modem.record.ChangePINEnable("9999", true), -2);
    EXPECT_TRUE(
        modem.log.Has("error on enable PIN protection, ret: +CME ERROR: incorrect password"));
    modem.Answer(kQueryLock, {"OK"});
    EXPECT_EQ(modem.record.ChangePINEnable("1234", true), -1);
    EXPECT_TRUE(modem.log.Has("error on getting current PIN enable setting"));
    modem.Answer(kQueryLock, {"+CLCK: 0", "OK"});
    modem.Silence("AT+CLCK=\"SC\",1*");
    EXPECT_EQ(modem.record.ChangePINEnable("1234", true), -1);
    EXPECT_TRUE(modem.log.Has("error on modem cmd: enable pin protection"));
    EXPECT_FALSE(modem.log.Has("1234")) << modem.log.Text();
}

TEST(PINChange, ChangesThePINOfTheCard) {
    OpenedModem modem("12d1,pin=1234");
    EXPECT_EQ(modem.record.PINUnlock("1234"), 0);
    EXPECT_EQ(modem.record.ChangePIN("1234", "4321"), 0);
    EXPECT_EQ(modem.record.ChangePIN("1234", "5555"), -2);
    EXPECT_TRUE(modem.log.Has("error on changing PIN, ret: +CME ERROR: incorrect password"));
    EXPECT_THAT(modem.Received(),
                ElementsAre(kQuery, "AT+CPIN=1234", kQuery, "AT+CPWD=\"SC\",\"1234\",\"4321\"",
                            "AT+CPWD=\"SC\",\"1234\",\"5555\""));
    modem.log.Clear();
    EXPECT_EQ(modem.record.ChangePIN("", "4321"), -1);
    EXPECT_EQ(modem.record.ChangePIN("4321", ""), -1);
    EXPECT_EQ(modem.log.Count("error on change pin: input args should not be null"), 2);
    EXPECT_THAT(modem.Received(), IsEmpty());
}

TEST(PINSet, SwitchesTheProtectionAndThenChangesThePIN) {
    OpenedModem modem("12d1,pin=1234,lock=off");
    ASSERT_EQ(modem.record.UpdateSIMStatus(), 1);
    EXPECT_TRUE(modem.record.IsNewPlugIn());
    EXPECT_EQ(modem.record.PINSet("1234", "4321", true), 0);
    EXPECT_FALSE(modem.record.IsNewPlugIn());
    EXPECT_THAT(modem.Received(), ElementsAre(kQuery, kQueryLock, "AT+CLCK=\"SC\",1,\"1234\"",
                                              "AT+CPWD=\"SC\",\"1234\",\"4321\"", kQuery));
    EXPECT_EQ(modem.record.PINSet("4321", "", false), 0);
    EXPECT_THAT(modem.Received(), ElementsAre(kQueryLock, "AT+CLCK=\"SC\",0,\"4321\"", kQuery));
    EXPECT_EQ(modem.log.Text(), "");
}

TEST(PINSet, StopsAtItsFirstFailureAndStillAsksForTheStatus) {
    OpenedModem modem("12d1,pin=1234,lock=off");
    EXPECT_EQ(modem.record.PINSet("1234", "4321", true), -1);  // the status is not known yet
    EXPECT_TRUE(modem.log.Has("failed on PIN enable"));
    EXPECT_THAT(modem.Received(), ElementsAre(kQuery));
    EXPECT_EQ(modem.record.PINSet("9999", "4321", true), -2);
    EXPECT_THAT(modem.Received(), ElementsAre(kQueryLock, "AT+CLCK=\"SC\",1,\"9999\"", kQuery));
    EXPECT_FALSE(modem.log.Has("failed on change PIN"));
    EXPECT_EQ(modem.record.PINSet("9999", "4321", false), -2);
    EXPECT_THAT(modem.Received(),
                ElementsAre(kQueryLock, "AT+CPWD=\"SC\",\"9999\",\"4321\"", kQuery));
    EXPECT_TRUE(modem.log.Has("failed on change PIN"));
}

TEST(PINUnlock, EntersThePINAsTheVendorWantsIt) {
    const struct {
        const char* modem;
        const char* command;
    } kModems[] = {{"generic,pin=1234", "AT+CPIN=1234"}, {"2001,pin=1234", "AT+CPIN=\"1234\""}};
    for (const auto& kind : kModems) {
        SCOPED_TRACE(kind.modem);
        OpenedModem modem(kind.modem);
        EXPECT_EQ(modem.record.PINUnlock("1234"), 0);
        EXPECT_THAT(modem.Received(), ElementsAre(kQuery, kind.command, kQuery));
        bool err = false;
        EXPECT_TRUE(modem.record.IsPINReady(err));
        EXPECT_FALSE(err);
        EXPECT_FALSE(modem.record.IsNewPlugIn());
        EXPECT_EQ(modem.log.Text(), "");
    }
}

TEST(PINUnlock, SendsNoPINToAReadyCard) {
    OpenedModem modem;
    EXPECT_EQ(modem.record.PINUnlock("1234"), 0);
    EXPECT_THAT(modem.Received(), ElementsAre(kQuery, kQuery));
    EXPECT_FALSE(modem.record.IsNewPlugIn());
}

TEST(PINUnlock, RefusesAWrongPINUntilThePUKIsAskedFor) {
    OpenedModem modem("12d1,pin=1234,attempts=1,puk=12345678");
    EXPECT_EQ(modem.record.PINUnlock("9999"), -2);
    EXPECT_TRUE(modem.log.Has(
        "Cannot find OK in respond of PIN unlock, ret: +CME ERROR: incorrect password"));
    bool err = false;
    EXPECT_FALSE(modem.record.IsPINReady(err));
    EXPECT_FALSE(err);
    EXPECT_EQ(modem.record.PUKSet("12345678", "4321"), 0);  // so it was waiting for the PUK
    EXPECT_TRUE(modem.record.IsPINReady(err));
}

TEST(PUK, SetsANewPIN) {
    const struct {
        const char* modem;
        const char* command;
    } kModems[] = {{"12d1", "AT+CPIN=12345678,4321"}, {"2001", "AT+CPIN=\"12345678\",\"4321\""}};
    for (const auto& kind : kModems) {
        SCOPED_TRACE(kind.modem);
        OpenedModem modem(kind.modem + std::string(",pin=1234,attempts=0,puk=12345678"));
        ASSERT_EQ(modem.record.UpdateSIMStatus(), 0);
        EXPECT_EQ(modem.record.PUKSet("12345678", "4321"), 0);
        EXPECT_THAT(modem.Received(), ElementsAre(kQuery, kind.command, kQuery));
        EXPECT_EQ(modem.record.ChangePIN("4321", "1111"), 0);
    }
}

TEST(Attempts, AreReadFromTheLayoutOfTheVendor) {
    for (const char* kind : {"generic", "12d1", "2001"}) {
        SCOPED_TRACE(kind);
        OpenedModem modem(kind + std::string(",pin=1234,attempts=2"));
        ASSERT_EQ(modem.record.UpdateSIMStatus(), 0);
        EXPECT_EQ(modem.record.PINGetAttemptRemain(), 2);
        EXPECT_EQ(modem.record.PUKGetAttemptRemain(), 10);
        EXPECT_EQ(modem.log.Text(), "");
    }
}

TEST(Attempts, AreTheLastKnownOnesWithoutAUsableCard) {
    OpenedModem modem("12d1,pin=1234,attempts=2");
    ASSERT_EQ(modem.record.UpdateSIMStatus(), 0);
    ASSERT_EQ(modem.record.PINGetAttemptRemain(), 2);
    for (const char* reply : {"+CME ERROR: SIM BUSY", "ERROR", "OK"}) {
        SCOPED_TRACE(reply);
        modem.Answer(kQuery, {reply});
        modem.record.UpdateSIMStatus();
        modem.Received();
        EXPECT_EQ(modem.record.PINGetAttemptRemain(), 2);
        EXPECT_EQ(modem.record.PUKGetAttemptRemain(), 0);
        EXPECT_THAT(modem.Received(), IsEmpty());
    }
}

}  // namespace
}  // namespace taviwireless::test
