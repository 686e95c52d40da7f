// SPDX-License-Identifier: MIT
// The simulated modem: its line, its SIM card, its personality, and how it comes and goes.
#include <fcntl.h>
#include <gmock/gmock.h>
#include <poll.h>

#include <chrono>
#include <filesystem>
#include <thread>

#include "base/unique_fd.h"
#include "tests/support/files.h"
#include "tests/support/modem_simulator.h"
#include "tests/support/wait.h"

namespace taviwireless::test {
namespace {

namespace fs = std::filesystem;

using testing::EndsWith;
using testing::UnorderedElementsAre;

// A program that talks to a modem's port, as bare as can be: no settings of its own.
class Client {
  public:
    static constexpr int kQuiet = 100;      // ms; nothing more comes after that
    static constexpr int kPatience = 5000;  // ms; far above what any reply needs

    explicit Client(int port)
        : line_(open(("/dev/ttyUSB" + std::to_string(port)).c_str(), O_RDWR | O_NOCTTY)) {
        EXPECT_GE(line_.Get(), 0);
    }

    void Write(const std::string& text) {
        EXPECT_EQ(write(line_.Get(), text.data(), text.size()), static_cast<ssize_t>(text.size()));
    }

    // What comes until nothing comes for so long, or the line is hung up.
    std::string ReadUntilQuiet() {
        std::string text;
        while (ReadMore(kQuiet, &text)) {
        }
        return text;
    }

    // Sends the command and returns everything up to the end of its result.
    std::string Ask(const std::string& command) {
        Write(command + "\r");
        std::string text;
        while (!EndsReply(text) && ReadMore(kPatience, &text)) {
        }
        return text;
    }

    // False when nothing comes for so long, or the line is hung up.
    bool ReadMore(int patience, std::string* text) {
        pollfd readable{line_.Get(), POLLIN, 0};
        char buffer[4096];
        if (poll(&readable, 1, patience) <= 0) {
            return false;
        }
        const ssize_t count = read(line_.Get(), buffer, sizeof buffer);
        hungUp_ = count <= 0;
        text->append(buffer, hungUp_ ? 0 : count);
        return !hungUp_;
    }
    bool IsHungUp() const { return hungUp_; }

  private:
    static bool EndsReply(const std::string& text) {
        const size_t last = text.rfind("\r\n", text.size() - 3);
        if (text.size() < 4 || last == std::string::npos ||
            text.substr(text.size() - 2) != "\r\n") {
            return false;
        }
        const std::string line = text.substr(last + 2, text.size() - last - 4);
        return line == "OK" || line == "CONNECT" || line.find("ERROR") != std::string::npos;
    }

    UniqueFd line_;
    bool hungUp_ = false;
};

// Everything up to these words.
std::string ReadUntil(Client& client, const std::string& last) {
    std::string text;
    while (text.find(last) == std::string::npos && client.ReadMore(Client::kPatience, &text)) {
    }
    return text;
}

TEST(Call, CommandHasTheLineUntilItEndsAndThenTheModemHangsUp) {
    ModemSimulator simulator(
        {"--on-dial", "echo welcome; read -r line; echo \"heard $line\"; exit 3"});
    Client client(0);
    for (int round = 0; round < 2; ++round) {
        client.Write("ATD*99#\r");
        EXPECT_THAT(ReadUntil(client, "welcome\n"), EndsWith("\r\nCONNECT\r\nwelcome\n"));
        simulator.Received("0");
        client.Write("AT+CSQ\n");  // is the command's now
        EXPECT_EQ(ReadUntil(client, "NO CARRIER\r\n"), "heard AT+CSQ\n\r\nNO CARRIER\r\n");
        EXPECT_THAT(simulator.Received("0"), testing::IsEmpty());
        EXPECT_THAT(client.Ask("AT"), EndsWith("OK\r\n"));
    }
}

constexpr char kWrong[] = "+CME ERROR: incorrect password";
constexpr char kBadArgument[] = "+CME ERROR: incorrect parameters";
constexpr char kNeedsPuk[] = "+CME ERROR: SIM PUK required";

TEST(SimCard, AThirdWrongPinAsksForThePukWhichSetsANewPin) {
    const struct {
        const char* command;
        const char* line;  // of the reply
    } kSteps[] = {
        {"AT+CPIN=1111", kWrong},
        {"AT^CPIN?", "^CPIN: SIM PIN,2,10,2,10,3"},
        {"AT+CPIN=12", kBadArgument},  // never reaches the card
        {"AT+CPIN=1111", kWrong},
        {"AT+CPIN=1111", kWrong},
        {"AT+CPIN?", "+CPIN: SIM PUK"},
        {"AT+CPIN=1234", kNeedsPuk},
        {"AT+CPIN=11111111,5678", kWrong},
        {"AT^CPIN?", "^CPIN: SIM PUK,9,9,0,10,3"},
        {"AT+CPIN=\"87654321\",\"5678\"", "OK"},
        {"AT^CPIN?", "^CPIN: READY,,10,3,10,3"},
        {"AT+CLCK=\"SC\",0,\"5678\"", "OK"},
    };
    ModemSimulator simulator({"--modem", "12d1,pin=1234,puk=87654321"});
    Client client(2);
    client.Ask("ATE0");
    for (const auto& step : kSteps) {
        SCOPED_TRACE(step.command);
        EXPECT_THAT(client.Ask(step.command),
                    testing::HasSubstr("\r\n" + std::string(step.line) + "\r\n"));
    }
}

TEST(PersonalityFile, OfAPersonsOwnAddsToAnotherOne) {
    WriteFile("/tmp/mine.json", R"({"extends": "12d1", "vendor_id": "19d2", "ports": ["at"],
        "variables": {"band": "900"},
        "commands": {"AT+CSQ": null,
                     "AT+BAND?": {"reply": ["+BAND: {band}", "{imsi}"]},
                     "AT+BAND=*": {"set": {"band": 2, "operator": "none"}}}})");
    ModemSimulator simulator({"--modem", "/tmp/mine.json,ports=2"});
    EXPECT_EQ(ReadFile("/tmp/usbmodem.info0"),
              "USB_ID_VENDOR=19d2\nCONNECTNODE=\nDEVICENODE=0,1\n");
    Client client(1);
    client.Ask("ATE0");
    EXPECT_EQ(client.Ask("AT+CSQ"), "\r\nERROR\r\n");
    EXPECT_EQ(client.Ask("AT+BAND=1,\"18 00\""), "\r\nOK\r\n");
    EXPECT_EQ(client.Ask("AT+BAND?"), "\r\n+BAND: 18 00\r\n001010123456789\r\n\r\nOK\r\n");
    EXPECT_EQ(client.Ask("AT^CURC?"), "\r\n^CURC: 1\r\n\r\nOK\r\n");
}

std::vector<std::string> Names(const std::string& folder, const std::string& part) {
    std::vector<std::string> names;
    for (const auto& entry : fs::directory_iterator(folder)) {
        const std::string name = entry.path().filename();
        if (name.find(part) != std::string::npos) {
            names.push_back(name);
        }
    }
    return names;
}

TEST(Plug, UnpluggingHangsClientsUpAndPluggingStartsAfresh) {
    ModemSimulator simulator({"--modem", "generic", "--modem", "generic"});
    Client client(1);
    client.Ask("ATE0");
    simulator.Unplug("0");
    EXPECT_EQ(client.ReadUntilQuiet(), "");
    EXPECT_TRUE(client.IsHungUp());
    EXPECT_THAT(Names("/dev", "ttyUSB"), UnorderedElementsAre("ttyUSB2", "ttyUSB3"));
    EXPECT_THAT(Names("/tmp", "info"), UnorderedElementsAre("usbmodem.info1"));
    EXPECT_EQ(Client(3).Ask("AT"), "AT\r\r\nOK\r\n");
    simulator.Unplug("0");  // a second time changes nothing

    simulator.Plug("0");
    EXPECT_EQ(Client(1).Ask("AT"), "AT\r\r\nOK\r\n");
    EXPECT_TRUE(Exists("/tmp/usbmodem.info0"));
}

TEST(Plug, NothingStaysBehindAfterASignalOrTheEndOfItsInput) {
    for (const int signal : {SIGTERM, SIGHUP, 0}) {
        SCOPED_TRACE(signal);
        Process simulator(
            {BuiltProgram("modemsim"), "--link-dir", "/dev", "--info-dir", "/tmp", "--control"});
        while (simulator.ReadLine() != "ready") {
            ASSERT_FALSE(simulator.AtEnd());
        }
        EXPECT_TRUE(Exists("/tmp/usbmodem.info0"));
        if (signal == 0) {
            simulator.CloseInput();
        } else {
            simulator.Signal(signal);
        }
        EXPECT_EQ(simulator.Wait(), 0);
        EXPECT_THAT(Names("/dev", "ttyUSB"), UnorderedElementsAre());
        EXPECT_THAT(Names("/tmp", "info"), UnorderedElementsAre());
    }
}

TEST(Plug, AGivenTtyAnswersWithoutLinkAndInfoFileAndItsModemLosesPowerWhenItHangsUp) {
    ModemSimulator far({"--fault", "0:silent"});  // what is behind the tty's other end
    fs::create_directory("/tmp/near");
    ModemSimulator near({"--modem", "generic,pin=1234", "--tty", "/dev/ttyUSB1"}, "/tmp/near");
    EXPECT_TRUE(fs::is_empty("/tmp/near"));
    const auto answers = [&far](const char* command) {
        std::vector<std::string> lines;
        Eventually([&] {  // the echo, and what it says
            far.Send("0.1", command);
            std::this_thread::sleep_for(std::chrono::milliseconds(20));
            return (lines = far.Received("0.1")).size() >= 2;
        });
        return lines;
    };
    answers("AT+CPIN=1234\r");
    EXPECT_THAT(answers("AT+CPIN?\r"), testing::Contains("+CPIN: READY"));
    far.Unplug("0");
    near.Command("received 0");
    far.Plug("0");
    EXPECT_THAT(answers("AT+CPIN?\r"), testing::Contains("+CPIN: SIM PIN"));
}

}  // namespace
}  // namespace taviwireless::test
