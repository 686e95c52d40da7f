// SPDX-License-Identifier: MIT
// The methods of the modem service, called as the bus calls them, with a simulated modem.
#include "dbus/usbmodem_methods.h"

#include <gmock/gmock.h>

#include "common/log.h"
#include "tests/support/files.h"
#include "tests/support/log_capture.h"
#include "tests/support/modem_simulator.h"
#include "tests/support/sleep_capture.h"
#include "tests/support/wait.h"

namespace taviwireless::test {
namespace {

using namespace taviwireless::dbus;
using testing::HasSubstr;

// What a method answered.
struct Outcome {
    bool isDone;
    std::string text;  // the document or list; the message of the error when it failed
    int code = 0;
};

// A service with the modems of a simulator.
struct Service {
    explicit Service(const std::vector<std::string>& modems)
        : simulator(modems),
          object(static_cast<USBModemObject*>(g_object_new(usbmodem_object_get_type(), nullptr))) {}
    ~Service() { g_object_unref(object); }

    // Calls a method that answers a text; arguments are the texts it takes.
    template <typename Method, typename... Texts>
    Outcome Ask(Method method, const Texts&... arguments) {
        char* text = nullptr;
        GError* error = nullptr;
        const bool isDone =
            method(object, const_cast<char*>(std::string(arguments).c_str())..., &text, &error);
        const Outcome outcome = MakeOutcome(isDone, text != nullptr ? text : "", error);
        g_free(text);
        return outcome;
    }
    template <typename Method, typename... Texts>
    Outcome Do(Method method, const Texts&... arguments) {
        GError* error = nullptr;
        const bool isDone =
            method(object, const_cast<char*>(std::string(arguments).c_str())..., &error);
        return MakeOutcome(isDone, "", error);
    }
    Outcome SetPIN(const std::string& pin, const std::string& newPin, gboolean protection) {
        const auto method = [&](USBModemObject* to, char* id, char* first, char* second,
                                GError** error) {
            return usbmodem_set_pin(to, id, first, second, protection, error);
        };
        return Do(method, "usbmodem0", pin, newPin);
    }
    // A failure is one line in the log with the words of the error, which is of the fixed domain.
    Outcome MakeOutcome(bool isDone, const std::string& text, GError* error) {
        if (isDone) {
            EXPECT_EQ(error, nullptr);
            return {true, text};
        }
        EXPECT_EQ(error->domain, 3u);
        std::string logged = std::string(" ") + error->message;
        MakePrintable(logged.data());
        EXPECT_TRUE(log.Has(logged)) << log.Text();
        const Outcome outcome{false, error->message, error->code};
        g_error_free(error);
        return outcome;
    }

    ModemSimulator simulator;
    LogCapture log;
    USBModemObject* object;
};

// One with a modem that is ready.
struct ReadyService : Service {
    explicit ReadyService(const std::string& settings = "")
        : Service({"--modem", "12d1,ports=dial/at" + settings}) {
        EXPECT_EQ(object->list.Update(), 0);
    }
};

TEST(Methods, AnswerTheDocumentsByteForByte) {
    WriteFile("/usr/tavi/etc/usbmodem/wcdma_list.json",
              R"([{"id": "DE", "isp": [{"name": "Nordnetz"}]}])");
    ReadyService service(",id=1,operator=Nordnetz,apn=web,signal=31");
    ASSERT_TRUE(service.Do(usbmodem_set_profile, "usbmodem1", "pass=a\"b\\\ndefault_gw=1").isDone);
    const std::string document = service.Ask(usbmodem_get_usbmodem, "usbmodem1").text;
    EXPECT_EQ(document, R"({
	"id": "usbmodem1",
	"product": "E1752",
	"vendor": "huawei",
	"signal": 100,
	"ip": "",
	"carrier": "Nordnetz",
	"net_status": "disconnected",
	"sim_status": "ready",
	"pin_protected": false,
	"pin_remains": 3,
	"puk_remains": 10,
	"profile": 
	{
		"location": "DE",
		"isp": "Nordnetz - web",
		"apn": "web",
		"number": "*99#",
		"user": "Unknown",
		"pass": "a"b\",
		"roaming": false,
		"default_gw": false
	}
}
)");
    EXPECT_EQ(service.Ask(usbmodem_get_profile, "usbmodem1").text, R"({
	"location": "DE",
	"isp": "Nordnetz - web",
	"apn": "web",
	"number": "*99#",
	"user": "Unknown",
	"pass": "a"b\",
	"roaming": false,
	"default_gw": false
}
)");
    // Bytes of a modem that are no UTF-8 cannot pass the bus.
    service.simulator.Reply("1", "AT+COPS?", "\r\n+COPS: 0,0,\"N\xF6rd\",2\r\n\r\nOK\r\n");
    ASSERT_EQ(service.Do(usbmodem_set_profile, "usbmodem1", "user=\xFF").isDone, true);
    const std::string odd = service.Ask(usbmodem_get_profile, "usbmodem1").text;
    EXPECT_TRUE(g_utf8_validate(odd.c_str(), -1, nullptr)) << odd;
}

// Other callers wait meanwhile, so the rest of the document is what was known of a silent modem.
TEST(Methods, AskAModemNothingMoreOnceItIsSilent) {
    ReadyService service;
    ASSERT_TRUE(service.Ask(usbmodem_get_usbmodem, "usbmodem0").isDone);
    service.simulator.Fault("0", "silent");
    service.simulator.Received("0");
    const std::string document = service.Ask(usbmodem_get_usbmodem, "usbmodem0").text;
    EXPECT_THAT(service.simulator.Received("0"), testing::ElementsAre("AT+CGMM", "AT+CPIN?"));
    for (const char* const known : {"\"product\": \"E1752\"", "\"vendor\": \"huawei\"",
                                    "\"signal\": 0", "\"sim_status\": \"no_sim\""}) {
        EXPECT_THAT(document, HasSubstr(known));
    }
    EXPECT_FALSE(service.object->list.FindUSBModem(0).IsError());
    // A modem that leaves a single command unanswered is asked the rest.
    service.simulator.Fault("0", "off");
    service.simulator.Fault("0", "noecho");
    service.simulator.Reply("0", "AT+CGMM", "");
    const std::string next = service.Ask(usbmodem_get_usbmodem, "usbmodem0").text;
    EXPECT_THAT(next, HasSubstr("\"product\": \"E1752\""));
    EXPECT_THAT(next, HasSubstr("\"signal\": 54"));
}

TEST(Methods, ListTheModemsThatAreReady) {
    Service service({"--modem", "12d1,id=1,ports=dial/at", "--modem", "generic,id=2"});
    EXPECT_EQ(service.Ask(usbmodem_get_usbmodem_list).text, "");
    service.object->list.SearchInfoPath();
    service.object->list.FindUSBModem(1).InitInfo();
    EXPECT_EQ(service.Ask(usbmodem_get_usbmodem_list).text, "usbmodem1\n");
    EXPECT_EQ(service.Ask(usbmodem_get_usbmodem_if_list).text, "\n");
    const Outcome notReady = service.Do(usbmodem_connect, "usbmodem2");
    EXPECT_EQ(notReady.text, "USBModem [usbmodem2] not inited");
    EXPECT_EQ(notReady.code, -1);
    const Outcome unknown = service.Ask(usbmodem_get_profile, "usbmodem%s");
    EXPECT_EQ(unknown.text, "USBModem [usbmodem%s] not found");
    EXPECT_EQ(unknown.code, -1);
}

TEST(SetProfile, TakesTheFirstKeyOfEachLineWhereverItStands) {
    ReadyService service;
    const struct {
        const char* lines;
        const char* key;
        const char* value;
    } kProfiles[] = {
        {"apn=internet\nuser=\nfoo=bar", "apn", "internet"},
        {"myapn=x", "apn", "x"},
        {"isp=a=b", "isp", "a=b"},
        {"user=apn=y", "apn", "y"},
        {"number=*99#\r\n", "number", "*99#\r"},
        {"default_gw=true\n\n", "default_gw", "true"},
        {"", "apn", "y"},
    };
    for (const auto& profile : kProfiles) {
        SCOPED_TRACE(profile.lines);
        const Outcome outcome = service.Do(usbmodem_set_profile, "usbmodem0", profile.lines);
        const bool canBeKept = std::string(profile.value).find('\r') == std::string::npos;
        EXPECT_EQ(outcome.isDone, canBeKept);
        bool err = false;
        usbmodem_lib::USBModem& modem = service.object->list.FindUSBModem(0);
        EXPECT_EQ(modem.GetProfileWithKey(profile.key, err) == profile.value, canBeKept);
    }
    const Outcome refused = service.Do(usbmodem_set_profile, "usbmodem0", "user=a\npass=s3cret\r");
    EXPECT_EQ(refused.text, "Failed to set usbmodem0: (key,value) = (pass,***)");
    EXPECT_EQ(refused.code, -1);
    EXPECT_FALSE(service.log.Has("s3cret"));
}

TEST(SetProfile, ReconnectsAModemThatWasConnected) {
    InstallDialler(kSaysConnected);
    ReadyService service;
    usbmodem_lib::USBModem& modem = service.object->list.FindUSBModem(0);
    const auto becomesConnected = [&] {
        return Eventually([&] {
            return service.Ask(usbmodem_get_usbmodem, "usbmodem0").text.find("\"connected\"") !=
                   std::string::npos;
        });
    };
    ASSERT_TRUE(service.Do(usbmodem_connect, "usbmodem0").isDone);
    const Outcome again = service.Do(usbmodem_connect, "usbmodem0");
    EXPECT_EQ(again.text, "Failed to connect [usbmodem0]");
    EXPECT_EQ(again.code, -1);
    ASSERT_TRUE(becomesConnected());
    EXPECT_EQ(service.Ask(usbmodem_get_usbmodem_if_list).text, "lo\n");
    EXPECT_THAT(service.Ask(usbmodem_get_usbmodem, "usbmodem0").text,
                HasSubstr("\t\"ip\": \"127.0.0.1\",\n"));
    SleepCapture sleeps;
    const std::string tooLong = "user=" + std::string(1023, 'x') + "\u00FC";  // cut within it
    for (const std::string& refused : {tooLong, std::string("apn=x\";D0900666;")}) {
        const Outcome outcome =
            service.Do(usbmodem_set_profile, "usbmodem0", "isp=new\n" + refused + "\napn=x");
        EXPECT_FALSE(outcome.isDone);
        EXPECT_LT(outcome.text.size(), 4096u);
        EXPECT_TRUE(g_utf8_validate(outcome.text.c_str(), -1, nullptr));
        EXPECT_TRUE(service.log.Has("refused a value for "));
        EXPECT_EQ(service.Ask(usbmodem_get_usbmodem_if_list).text, "lo\n");  // still connected
    }
    bool err = false;
    EXPECT_NE(modem.GetProfileISP(err), "new");
    EXPECT_TRUE(sleeps.Calls().empty());
    sleeps.InterruptNext(2);  // by the signal that is to end the service
    ASSERT_TRUE(service.Do(usbmodem_set_profile, "usbmodem0", "apn=other").isDone);
    EXPECT_THAT(sleeps.Calls(), testing::ElementsAre(3, 2));
    EXPECT_TRUE(service.log.Has("usbmodem0 was connected again with its changed profile"));
    ASSERT_TRUE(becomesConnected());
    EXPECT_TRUE(service.Do(usbmodem_disconnect, "usbmodem0").isDone);
    EXPECT_EQ(service.Do(usbmodem_disconnect, "usbmodem0").text,
              "Failed to disconnect [usbmodem0]");
    EXPECT_EQ(modem.GetProfileAPN(err), "other");
}

}  // namespace
}  // namespace taviwireless::test
