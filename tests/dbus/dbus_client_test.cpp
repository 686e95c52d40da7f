// SPDX-License-Identifier: MIT
// The calling side: the client class against the bus itself and against the service, and the
// front-end functions.
#include <gmock/gmock.h>
#include <taviwireless/usbmodem_client.h>
#include <taviwireless/usbmodem_server.h>
#include <taviwireless/usbmodem_ui.h>

#include "tests/support/bus.h"
#include "tests/support/log_capture.h"

namespace taviwireless::test {
namespace {

using dbus::DBusClient;
using dbus::USBModemClient;
using testing::ElementsAre;

constexpr char kBus[] = "org.freedesktop.DBus";
constexpr char kBusPath[] = "/org/freedesktop/DBus";

// A client of the bus's own methods.
struct BusClient : DBusClient {
    BusClient() : DBusClient(kBus, kBusPath, kBus, DBUS_BUS_SESSION) {}
};

TEST(Client, ReadsTextsAndListsOnce) {
    PrivateBus bus;
    LogCapture log;
    BusClient client;
    std::string text;
    std::vector<std::string> list = {"old"};
    ASSERT_EQ(client.NewMessage("ListNames"), 0);
    ASSERT_EQ(client.SendMessage(true, -1), 0);
    EXPECT_EQ(client.GetReply(list), 0);
    EXPECT_THAT(list, testing::Contains(kBus));
    EXPECT_THAT(list, testing::Not(testing::Contains("old")));
    ASSERT_EQ(client.SendMessage(true, -1), 0);
    EXPECT_EQ(client.GetReply(text), -1);  // no text
    ASSERT_EQ(client.NewMessage("GetNameOwner"), 0);
    ASSERT_EQ(client.Append(kBus), 0);
    ASSERT_EQ(client.SendMessage(true, -1), 0);
    EXPECT_EQ(client.GetReply(list), -1);  // no list
    EXPECT_EQ(client.GetReply(text), -1);  // it was taken
    ASSERT_EQ(client.SendMessage(true, -1), 0);
    EXPECT_EQ(client.GetReply(text), 0);
    EXPECT_EQ(text, kBus);
    // What was sent to be left unanswered can be sent again, to be answered.
    ASSERT_EQ(client.NewMessage("AddMatch"), 0);
    ASSERT_EQ(client.Append("type='signal'"), 0);
    EXPECT_EQ(client.SendMessage(false, -1), 0);
    EXPECT_EQ(client.SendMessage(true, 5000), 0);
    EXPECT_TRUE(log.Has("Reply message is null"));
    EXPECT_TRUE(log.Has("Replied value is not a string"));
    EXPECT_TRUE(log.Has("Replied value is not an array "));
}

TEST(Client, RefusesWhatLibdbusWouldAbortFor) {
    PrivateBus bus;
    LogCapture log;
    BusClient client;
    EXPECT_EQ(client.Append("x"), -1);
    EXPECT_EQ(client.Append(true), -1);
    EXPECT_EQ(log.Count("Message is null"), 2);
    EXPECT_EQ(client.SendMessage(false, -1), -1);
    EXPECT_EQ(client.NewMessage(nullptr), -1);
    EXPECT_EQ(client.NewMessage("no name"), -1);
    EXPECT_TRUE(log.Has("Failed to create message (no name)"));
    EXPECT_EQ(DBusClient("no name", "/", kBus, DBUS_BUS_SESSION).NewMessage("Hello"), -1);
    ASSERT_EQ(client.NewMessage("NameHasOwner"), 0);
    EXPECT_EQ(client.Append("12\xFF"
                            "34"),
              -1);
    EXPECT_TRUE(log.Has("Failed to append args (string:***)"));
    EXPECT_EQ(client.Append(nullptr), -1);
}

TEST(Client, WithoutABusFailsAndRecoversWithIt) {
    LogCapture log;
    {
        PrivateBus bus;
        EXPECT_EQ(BusClient().NewMessage("ListNames"), 0);
        bus.Restart();
        BusClient client;  // the connection that libdbus shares died with the bus
        ASSERT_EQ(client.NewMessage("ListNames"), 0);
        EXPECT_EQ(client.SendMessage(true, -1), 0) << log.Text();
    }
    setenv("DBUS_SESSION_BUS_ADDRESS", "unix:path=/tmp/nobody", 1);
    LogCapture atTheEnd;
    BusClient client;
    EXPECT_TRUE(atTheEnd.Has("Failed to get bus connection"));
    EXPECT_EQ(client.NewMessage("ListNames"), -1);
    EXPECT_EQ(usbmodem_ui::Connect("usbmodem0"), 0);

    dbus::USBModemServer server;
    EXPECT_FALSE(server.Initialize());
    EXPECT_TRUE(atTheEnd.Has("Failed to acquire com.merilond.usbmodem: "));
}

// The service's errors 1, 2 and -1, as they cross a real bus, and what front ends make of them.
TEST(ServiceErrors, ReachTheCallerNegated) {
    ServedModems served("12d1,pin=1234,ports=dial/at");
    LogCapture log;
    USBModemClient client;
    EXPECT_EQ(usbmodem_ui::UnlockSIM("usbmodem0", "9999"), -2);
    EXPECT_TRUE(log.Has("Failed to unlock SIM of device: usbmodem0"));
    EXPECT_EQ(client.UnlockPIN("usbmodem7", "1", "2"), 0);  // +1, which counts as success
    EXPECT_EQ(usbmodem_ui::UnlockSIM("usbmodem7", "9999"), 1);
    EXPECT_EQ(client.UnlockSIM("usbmodem0", "\xFF"), -1);
    ASSERT_EQ(client.NewMessage("UnlockSIM"), 0);
    ASSERT_EQ(client.Append("usbmodem7"), 0);
    ASSERT_EQ(client.Append("1234"), 0);
    EXPECT_EQ(client.SendMessage(true, -1), 1);
    EXPECT_EQ(usbmodem_ui::UnlockPIN("usbmodem0", "1", "2"), -1);  // it waits for no PUK
    EXPECT_TRUE(log.Has("Failed to unlock PIN of device: usbmodem0"));
    EXPECT_EQ(usbmodem_ui::UnlockSIM("usbmodem0", "1234"), 1);
    EXPECT_EQ(usbmodem_ui::SetPIN("usbmodem0", "9999", "1", true), -2);
    EXPECT_TRUE(log.Has("Failed to set SIM's PIN of device: usbmodem0"));

    // Every other failure is -1: a method that is none, a service that is none or does not answer.
    ASSERT_EQ(client.NewMessage("Fly"), 0);
    EXPECT_EQ(client.SendMessage(true, -1), -1);
    EXPECT_EQ(client.SendMessage(false, -1), 0);  // nobody waits for it
    ASSERT_EQ(client.NewMessage("GetUSBModemList"), 0);
    served.service.Daemon().Signal(SIGSTOP);
    EXPECT_EQ(client.SendMessage(true, 50), -1);
    served.service.Daemon().Signal(SIGCONT);
    DBusClient nobody("org.example.Nobody", "/", "org.example.Nobody", DBUS_BUS_SESSION);
    ASSERT_EQ(nobody.NewMessage("Do"), 0);
    EXPECT_EQ(nobody.SendMessage(true, -1), -1);
}

TEST(FrontEnd, TellsThatTheServiceIsNotThere) {
    PrivateBus bus;
    LogCapture log;
    std::vector<std::string> list;
    EXPECT_EQ(usbmodem_ui::GetUSBModemList(list), 0);
    EXPECT_EQ(usbmodem_ui::GetUSBModemIfList(list), 0);
    EXPECT_EQ(usbmodem_ui::GetUSBModem("usbmodem0"), "");
    EXPECT_EQ(usbmodem_ui::GetProfile("usbmodem0"), "");
    EXPECT_EQ(usbmodem_ui::SetProfile("usbmodem0", "apn=x"), 0);
    EXPECT_EQ(usbmodem_ui::SetPIN("usbmodem0", "1", "2", true), 0);
    EXPECT_EQ(usbmodem_ui::UnlockPIN("usbmodem0", "1", "2"), 0);
    EXPECT_EQ(usbmodem_ui::UnlockSIM("usbmodem0", "1"), 0);
    EXPECT_EQ(usbmodem_ui::Connect("usbmodem0"), 0);
    EXPECT_EQ(usbmodem_ui::Disconnect("usbmodem0"), 0);
    EXPECT_EQ(log.Text(), "");
}

TEST(FrontEnd, TellsDoneFromFailed) {
    ServedModems served("generic,ports=dial/at");
    LogCapture log;
    std::vector<std::string> list = {"a"};
    EXPECT_EQ(usbmodem_ui::GetUSBModemList(list), 1);
    EXPECT_EQ(usbmodem_ui::GetUSBModemIfList(list), 1);
    EXPECT_THAT(list, ElementsAre("a", "usbmodem0", ""));
    EXPECT_EQ(usbmodem_ui::GetUSBModem("usbmodem9"), "");
    EXPECT_TRUE(log.Has("Failed to get usbmodem9 information"));
    EXPECT_EQ(usbmodem_ui::GetProfile("usbmodem9"), "");
    EXPECT_TRUE(log.Has("Failed to get usbmodem9 profile"));
    EXPECT_EQ(usbmodem_ui::SetProfile("usbmodem0", "apn=x\n"), 1);
    EXPECT_THAT(usbmodem_ui::GetProfile("usbmodem0"), testing::HasSubstr("\"apn\": \"x\""));
    EXPECT_EQ(usbmodem_ui::SetProfile("usbmodem0", "\xFF"), -1);
    EXPECT_TRUE(log.Has("Failed to set profile of device: usbmodem0"));
    EXPECT_EQ(usbmodem_ui::Connect("usbmodem9"), 1);  // that it was sent is all that is known
    EXPECT_EQ(usbmodem_ui::Disconnect("usbmodem0"), 1);
}

}  // namespace
}  // namespace taviwireless::test
