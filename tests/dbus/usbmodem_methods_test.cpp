// The methods of the modem service, called as the bus calls them, with a simulated modem.
#include "dbus/usbmodem_methods.h"

#include <gmock/gmock.h>
#include <sys/stat.h>

#include <memory>
#include <set>

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

constexpr char kDialler[] = "/usr/tavi/bin/wvdial";

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

    char* Text(const std::string& text) {
        texts.push_back(std::make_unique<std::string>(text));
        return texts.back()->data();
    }
    // Calls a method that answers a text; arguments are the texts it takes.
    template <typename Method, typename... Texts>
    Outcome Ask(Method method, const Texts&... arguments) {
        char* text = nullptr;
        GError* error = nullptr;
        const bool isDone = method(object, Text(arguments)..., &text, &error);
        const Outcome outcome = MakeOutcome(isDone, text != nullptr ? text : "", error);
        g_free(text);
        return outcome;
    }
    template <typename Method, typename... Texts>
    Outcome Do(Method method, const Texts&... arguments) {
        GError* error = nullptr;
        const bool isDone = method(object, Text(arguments)..., &error);
        return MakeOutcome(isDone, "", error);
    }
    Outcome SetPIN(const std::string& pin, const std::string& newPin, bool protection) {
        GError* error = nullptr;
        const bool isDone = usbmodem_set_pin(object, Text("usbmodem0"), Text(pin), Text(newPin),
                                             protection, &error);
        return MakeOutcome(isDone, "", error);
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
    std::vector<std::unique_ptr<std::string>> texts;
};

void InstallDialler(const std::string& body) {
    WriteFile("/etc/ppp/peers/wvdial", "noauth\n");
    WriteFile(kDialler, "#!/bin/sh\n" + body + "\n");
    chmod(kDialler, 0755);
}

TEST(Methods, AnswerTheDocumentsByteForByte) {
    WriteFile("/usr/tavi/etc/usbmodem/wcdma_list.json",
              R"([{"id": "DE", "isp": [{"name": "Nordnetz"}]}])");
    Service service({"--modem", "12d1,id=1,operator=Nordnetz,apn=web,signal=31"});
    ASSERT_EQ(service.object->list.Update(), 0);
    const std::string profile =
        "\"location\": \"DE\",\n"
        "\"isp\": \"Nordnetz - web\",\n"
        "\"apn\": \"web\",\n"
        "\"number\": \"*99#\",\n"
        "\"user\": \"Unknown\",\n"
        "\"pass\": \"a\"b\\\",\n"
        "\"roaming\": false,\n"
        "\"default_gw\": false\n";
    const auto indented = [&profile](const std::string& tabs) {
        std::string text;
        std::istringstream lines(profile);
        for (std::string line; std::getline(lines, line);) {
            text += tabs + line + '\n';
        }
        return text;
    };
    ASSERT_TRUE(service.Do(usbmodem_set_profile, "usbmodem1", "pass=a\"b\\\ndefault_gw=1").isDone);
    EXPECT_EQ(service.Ask(usbmodem_get_profile, "usbmodem1").text, "{\n" + indented("\t") + "}\n");
    EXPECT_EQ(service.Ask(usbmodem_get_usbmodem, "usbmodem1").text,
              "{\n"
              "\t\"id\": \"usbmodem1\",\n"
              "\t\"product\": \"E1752\",\n"
              "\t\"vendor\": \"huawei\",\n"
              "\t\"signal\": 100,\n"
              "\t\"ip\": \"\",\n"
              "\t\"carrier\": \"Nordnetz\",\n"
              "\t\"net_status\": \"disconnected\",\n"
              "\t\"sim_status\": \"ready\",\n"
              "\t\"pin_protected\": false,\n"
              "\t\"pin_remains\": 3,\n"
              "\t\"puk_remains\": 10,\n"
              "\t\"profile\": \n"
              "\t{\n" +
                  indented("\t\t") + "\t}\n}\n");
    // Bytes of a modem that are no UTF-8 cannot pass the bus.
    service.simulator.Reply("1", "AT+COPS?", "\r\n+COPS: 0,0,\"N\xF6rd\",2\r\n\r\nOK\r\n");
    ASSERT_EQ(service.Do(usbmodem_set_profile, "usbmodem1", "user=\xFF").isDone, true);
    const std::string document = service.Ask(usbmodem_get_profile, "usbmodem1").text;
    EXPECT_TRUE(g_utf8_validate(document.c_str(), -1, nullptr)) << document;
}

// Other callers wait meanwhile, so the rest of the document is what was known of a silent modem.
TEST(Methods, AskAModemNothingMoreOnceItIsSilent) {
    Service service({"--modem", "12d1"});
    ASSERT_EQ(service.object->list.Update(), 0);
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

TEST(Methods, ReplaceWhatIsNoUTF8InTheNamesOfInterfaces) {
    InstallDialler(
        "printf -- '--> Using interface ppp\\377\\n secondary DNS address' >&2;"
        "exec sleep 1000");
    RunProgram({"sh", "-c",
                "name=$(printf 'ppp\\377'); ip link add \"$name\" type veth peer name far;"
                "ip address add 10.64.64.64/32 dev \"$name\""});
    Service service({"--modem", "12d1"});
    ASSERT_EQ(service.object->list.Update(), 0);
    ASSERT_TRUE(service.Do(usbmodem_connect, "usbmodem0").isDone);
    std::string list = "\n";
    for (int i = 0; i < 1000 && list == "\n"; ++i) {
        usleep(20000);  // for the dialler to say it
        service.Ask(usbmodem_get_usbmodem, "usbmodem0");
        list = service.Ask(usbmodem_get_usbmodem_if_list).text;
    }
    EXPECT_EQ(list, "ppp\xEF\xBF\xBD\n");
}

TEST(Methods, ListTheModemsThatAreReady) {
    Service service(
        {"--modem", "12d1,id=1", "--modem", "generic,id=2,fault=silent", "--modem", "2001,id=3"});
    EXPECT_EQ(service.Ask(usbmodem_get_usbmodem_list).text, "");
    service.object->list.SearchInfoPath();
    service.object->list.FindUSBModem(1).InitInfo();
    service.object->list.FindUSBModem(3).InitInfo();
    EXPECT_EQ(service.Ask(usbmodem_get_usbmodem_list).text, "usbmodem1\nusbmodem3\n");
    EXPECT_EQ(service.Ask(usbmodem_get_usbmodem_if_list).text, "\n\n");
    const Outcome notReady = service.Do(usbmodem_connect, "usbmodem2");
    EXPECT_EQ(notReady.text, "USBModem [usbmodem2] not inited");
    EXPECT_EQ(notReady.code, -1);
    const Outcome unknown = service.Ask(usbmodem_get_profile, "usbmodem%s");
    EXPECT_EQ(unknown.text, "USBModem [usbmodem%s] not found");
    EXPECT_EQ(unknown.code, -1);
}

TEST(Methods, RefuseMissingArguments) {
    Service service({"--modem", "12d1"});
    char text[] = "usbmodem0";
    char* out = nullptr;
    const std::function<gboolean(GError**)> kCalls[] = {
        [&](GError** error) { return usbmodem_connect(nullptr, text, error); },
        [&](GError** error) { return usbmodem_disconnect(service.object, nullptr, error); },
        [&](GError** error) { return usbmodem_get_usbmodem_list(nullptr, &out, error); },
        [&](GError** error) { return usbmodem_get_usbmodem_if_list(nullptr, &out, error); },
        [&](GError** error) { return usbmodem_get_usbmodem(service.object, nullptr, &out, error); },
        [&](GError** error) { return usbmodem_get_profile(service.object, nullptr, &out, error); },
        [&](GError** error) { return usbmodem_set_profile(service.object, text, nullptr, error); },
        [&](GError** error) { return usbmodem_unlock_sim(service.object, text, nullptr, error); },
        [&](GError** error) {
            return usbmodem_unlock_pin(service.object, text, text, nullptr, error);
        },
        [&](GError** error) {
            return usbmodem_set_pin(service.object, text, text, nullptr, TRUE, error);
        },
    };
    std::set<std::string> lines;  // each its own in the source
    for (const auto& call : kCalls) {
        service.log.Clear();
        GError* error = nullptr;
        const bool isDone = call(&error);
        const Outcome outcome = service.MakeOutcome(isDone, "", error);
        EXPECT_EQ(outcome.text, "Bad parameter");
        EXPECT_EQ(outcome.code, 1);
        EXPECT_EQ(out, nullptr);
        lines.insert(service.log.Text());
    }
    EXPECT_EQ(lines.size(), std::size(kCalls)) << testing::PrintToString(lines);
}

TEST(Methods, ReportWhatTheModemSaysToPINAndPUK) {
    Service service({"--modem", "12d1,pin=1234,attempts=1,puk=12345678"});
    ASSERT_EQ(service.object->list.Update(), 0);
    const Outcome wrong = service.Do(usbmodem_unlock_sim, "usbmodem0", "9999");
    EXPECT_EQ(wrong.text, "Failed to unlock PIN [usbmodem0]");
    EXPECT_EQ(wrong.code, 2);
    const Outcome wrongPUK = service.Do(usbmodem_unlock_pin, "usbmodem0", "87654321", "4321");
    EXPECT_EQ(wrongPUK.text, "Failed to unlock PIN [usbmodem0]");
    EXPECT_EQ(wrongPUK.code, 2);
    EXPECT_TRUE(service.Do(usbmodem_unlock_pin, "usbmodem0", "12345678", "4321").isDone);
    EXPECT_TRUE(service.SetPIN("4321", "1111", true).isDone);
    EXPECT_TRUE(service.SetPIN("1111", "", false).isDone);
    service.simulator.Fault("0", "silent");
    const Outcome silent = service.SetPIN("1111", "", true);
    EXPECT_EQ(silent.text, "Failed to set PIN [usbmodem0]");
    EXPECT_EQ(silent.code, 1);
    for (const char* secret : {"9999", "87654321", "12345678", "4321", "1111"}) {
        EXPECT_FALSE(service.log.Has(secret)) << service.log.Text();
    }
}

TEST(SetProfile, TakesTheFirstKeyOfEachLineWhereverItStands) {
    Service service({"--modem", "12d1"});
    ASSERT_EQ(service.object->list.Update(), 0);
    const struct {
        const char* lines;
        const char* key;
        const char* value;
    } kProfiles[] = {
        {"apn=internet\nuser=\nfoo=bar", "apn", "internet"},
        {"apn=internet\nuser=\nfoo=bar", "user", ""},
        {"myapn=x", "apn", "x"},
        {"isp=a=b", "isp", "a=b"},
        {"user=apn=y", "apn", "y"},
        {"pass=user=z", "user", "z"},
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
    InstallDialler("echo '--> Using interface lo secondary DNS address' >&2; exec sleep 1000");
    Service service({"--modem", "12d1"});
    ASSERT_EQ(service.object->list.Update(), 0);
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
    std::string tooLong = "user=x";
    for (int i = 0; i < 600; ++i) {
        tooLong += "\u00FC";  // two bytes, one of which is cut off
    }
    for (const std::string& refused :
         {tooLong, std::string("apn=x\";D0900666;"), std::string("apn=x\r")}) {
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
