// Links and info files, as modems come and go.
#include <gmock/gmock.h>

#include <chrono>
#include <filesystem>
#include <thread>

#include "tests/sim/client.h"
#include "tests/support/files.h"
#include "tests/support/modem_simulator.h"
#include "tests/support/wait.h"

namespace taviwireless::test {
namespace {

namespace fs = std::filesystem;

using testing::UnorderedElementsAre;

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

TEST(Plug, WritesAnInfoFilePerModemAndCountsPortsOverAll) {
    ModemSimulator simulator({"--modem", "2001,id=7", "--modem", "12d1", "--first-port", "3"});
    EXPECT_EQ(ReadFile("/tmp/usbmodem.info7"),
              "USB_ID_VENDOR=2001\nCONNECTNODE=5\nDEVICENODE=3,4,5\n");
    EXPECT_EQ(ReadFile("/tmp/usbmodem.info0"),
              "USB_ID_VENDOR=12d1\nCONNECTNODE=6\nDEVICENODE=6,7,8\n");
    EXPECT_THAT(Names("/dev", "ttyUSB"), UnorderedElementsAre("ttyUSB3", "ttyUSB4", "ttyUSB5",
                                                              "ttyUSB6", "ttyUSB7", "ttyUSB8"));
    EXPECT_THAT(Names("/tmp", "info"), UnorderedElementsAre("usbmodem.info0", "usbmodem.info7"));
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
    for (const int signal : {SIGTERM, SIGINT, SIGHUP, 0}) {
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

TEST(Plug, AGivenTtyAnswersWithoutLinkAndInfoFileAndIsReopenedAfterAHangUp) {
    ModemSimulator far({"--fault", "0:silent"});  // what is behind the tty's other end
    fs::create_directory("/tmp/near");
    ModemSimulator near("/tmp/near", {"--tty", "/dev/ttyUSB1"});
    EXPECT_TRUE(fs::is_empty("/tmp/near"));
    for (int round = 0; round < 2; ++round) {
        std::vector<std::string> received;
        Eventually([&] {
            far.Send("0.1", "AT+CSQ\r");
            return !(received = near.Received("0")).empty();
        });
        EXPECT_THAT(received, testing::Contains("AT+CSQ"));
        EXPECT_THAT(far.Received("0.1"), testing::Contains("AT+CSQ"));  // the echo
        far.Unplug("0");
        near.Command("received 0");
        far.Plug("0");
    }
}

TEST(Plug, AModemLosesPowerWhenItsGivenTtysHangUp) {
    ModemSimulator far({"--fault", "0:silent"});
    fs::create_directory("/tmp/near");
    ModemSimulator near("/tmp/near", {"--modem", "generic,pin=1234", "--tty", "/dev/ttyUSB1"});
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
