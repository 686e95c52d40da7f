// SPDX-License-Identifier: MIT
// The modems as objects on the bus: what clients that we did not write are told, and when.
#include <gio/gio.h>
#include <taviwireless/usbmodem_client.h>

#include <algorithm>
#include <memory>
#include <utility>

#include "daemon/modem_objects.h"
#include "tests/support/bus.h"
#include "tests/support/files.h"
#include "tests/support/wait.h"

namespace taviwireless::test {
namespace {

using daemon::ModemObjects;
using daemon::ModemState;
using testing::HasSubstr;
using testing::IsEmpty;
using testing::IsSubsetOf;
using testing::IsSupersetOf;

constexpr char kName[] = "com.merilond.usbmodem.Objects";
constexpr char kPath[] = "/com/merilond/usbmodem";

std::string ManagedObjects() {
    return CallObject("", "org.freedesktop.DBus.ObjectManager.GetManagedObjects").out;
}

RunResult Look(const std::string& id) {
    return CallObject("/" + id, "com.merilond.usbmodem.Modem.Look");
}

// A client that listens to the signals of the name from now on.
class Monitor {
  public:
    Monitor()
        : connection_(g_dbus_connection_new_for_address_sync(
              getenv("DBUS_SESSION_BUS_ADDRESS"),
              static_cast<GDBusConnectionFlags>(G_DBUS_CONNECTION_FLAGS_AUTHENTICATION_CLIENT |
                                                G_DBUS_CONNECTION_FLAGS_MESSAGE_BUS_CONNECTION),
              nullptr, nullptr, nullptr)) {
        g_dbus_connection_signal_subscribe(connection_, kName, nullptr, nullptr, nullptr, nullptr,
                                           G_DBUS_SIGNAL_FLAGS_NONE, Take, this, nullptr);
        g_variant_unref(Call("", "org.freedesktop.DBus.ObjectManager", "GetManagedObjects", "()"));
    }
    ~Monitor() {
        g_dbus_connection_close_sync(connection_, nullptr, nullptr);
        g_object_unref(connection_);
    }

    // Calls a method below the manager, such as "/usbmodem0"; the arguments are written as gdbus
    // takes them. Returns the reply, or the name of the error.
    GVariant* Call(const std::string& path, const std::string& interface, const char* method,
                   const char* arguments, std::string* error = nullptr) {
        GError* failure = nullptr;
        GVariant* reply = g_dbus_connection_call_sync(
            connection_, kName, (kPath + path).c_str(), interface.c_str(), method,
            g_variant_parse(nullptr, arguments, nullptr, nullptr, nullptr), nullptr,
            G_DBUS_CALL_FLAGS_NONE, -1, nullptr, &failure);
        if (failure != nullptr) {
            char* name = g_dbus_error_get_remote_error(failure);
            *error = name;
            g_free(name);
            g_error_free(failure);
        }
        return reply;
    }

    // The signals up to the one that holds this, a line each: object, name, arguments.
    std::string ReadUntil(const std::string& text) {
        size_t found = 0;
        EXPECT_TRUE(Eventually([&] {
            while (g_main_context_iteration(nullptr, FALSE)) {
            }
            found = lines_.find(text);
            return found != std::string::npos;
        })) << "nothing holds "
            << text << ", but this came:\n"
            << lines_;
        const size_t end = std::min(lines_.find('\n', found), lines_.size() - 1) + 1;
        std::string rest = lines_.substr(end);
        lines_.resize(end);
        return std::exchange(lines_, rest);
    }

  private:
    static void Take(GDBusConnection*, const char*, const char* path, const char*, const char* name,
                     GVariant* arguments, gpointer self) {
        char* text = g_variant_print(arguments, FALSE);
        static_cast<Monitor*>(self)->lines_ += std::string(path) + ' ' + name + ' ' + text + '\n';
        g_free(text);
    }

    GDBusConnection* connection_;
    std::string lines_;
};

// The objects without a service behind them.
struct ShownModem {
    ShownModem() {
        modem.id = "usbmodem0";
        Publish();
        EXPECT_THAT(ManagedObjects(), HasSubstr("usbmodem0"));
    }
    void Publish() { objects.Publish({modem}); }
    void PublishSignal(int percent) {
        modem.known.signal = percent;
        Publish();
    }

    PrivateBus bus;
    ModemState modem;
    ModemObjects objects{
        [](const auto& id, const auto& reply) { reply("Busy", id + " dials"); },
        [](const auto&, const auto& command, const auto& reply) { reply("", command); }};
};

TEST(ModemObjects, WhatDoesNotChangeIsNotSent) {
    ShownModem shown;
    Monitor monitor;
    for (int i = 0; i < 1000; ++i) {
        shown.modem.lastLook = i;
        shown.modem.bytesSent += 1000;
        shown.Publish();
    }
    shown.PublishSignal(2);
    EXPECT_EQ(monitor.ReadUntil("PropertiesChanged"),
              "/com/merilond/usbmodem/usbmodem0 PropertiesChanged "
              "('com.merilond.usbmodem.Modem', {'Signal': <uint32 2>}, [])\n");
    EXPECT_THAT(ManagedObjects(), HasSubstr("'BytesSent': <uint64 1000000>"));
    EXPECT_THAT(ManagedObjects(), HasSubstr("'LastLook': <uint64 999>"));
}

TEST(ModemObjects, AreWhatIntrospectTells) {
    ShownModem shown;
    Monitor monitor;
    GVariant* text =
        monitor.Call("/usbmodem0", "org.freedesktop.DBus.Introspectable", "Introspect", "()");
    const char* xml = nullptr;
    g_variant_get(text, "(&s)", &xml);
    GDBusNodeInfo* node = g_dbus_node_info_new_for_xml(xml, nullptr);
    std::string described;
    for (GDBusPropertyInfo** property =
             g_dbus_node_info_lookup_interface(node, "com.merilond.usbmodem.Modem")->properties;
         *property != nullptr; ++property) {
        described += std::string((*property)->name) + ' ' + (*property)->signature + '\n';
    }
    GVariant* all = monitor.Call("/usbmodem0", "org.freedesktop.DBus.Properties", "GetAll",
                                 "('com.merilond.usbmodem.Modem',)");
    GVariantIter* values = nullptr;
    g_variant_get(all, "(a{sv})", &values);
    std::string shownAre;
    const char* name = nullptr;
    for (GVariant* value = nullptr; g_variant_iter_loop(values, "{&sv}", &name, &value);) {
        shownAre += std::string(name) + ' ' + g_variant_get_type_string(value) + '\n';
    }
    EXPECT_EQ(shownAre, described);
    g_variant_iter_free(values);
    g_variant_unref(all);
    g_dbus_node_info_unref(node);
    g_variant_unref(text);
}

TEST(ModemObjects, RefuseWithTheStandardErrors) {
    const std::string properties = "org.freedesktop.DBus.Properties";
    const std::string modem = "com.merilond.usbmodem.Modem";
    const std::string manager = "org.freedesktop.DBus.ObjectManager";
    const struct {
        const char* path;
        std::string interface;
        const char* method;
        const char* arguments;
        const char* error;
    } kCalls[] = {
        {"/usbmodem0", properties, "Get", "('com.merilond.usbmodem.Modem', 'X')", "InvalidArgs"},
        {"/usbmodem0", properties, "Get", "('', 'Vendor')", "InvalidArgs"},
        {"/usbmodem0", properties, "GetAll", "('org.freedesktop.DBus.Peer',)", "InvalidArgs"},
        {"/usbmodem0", properties, "Set", "('com.merilond.usbmodem.Modem', 'Vendor', <'x'>)",
         "InvalidArgs"},
        {"/usbmodem0", properties, "GetAll", "(1,)", "InvalidArgs"},
        {"/usbmodem0", modem, "Command", "()", "InvalidArgs"},
        {"/usbmodem0", modem, "X", "()", "UnknownMethod"},
        {"/usbmodem0", manager, "GetManagedObjects", "()", "UnknownMethod"},
        {"", modem, "Look", "()", "UnknownMethod"},
        {"/usbmodem7", modem, "Look", "()", "UnknownMethod"},
    };
    ShownModem shown;
    Monitor monitor;
    for (const auto& call : kCalls) {
        SCOPED_TRACE(std::string(call.path) + ' ' + call.method + call.arguments);
        std::string error;
        EXPECT_EQ(monitor.Call(call.path, call.interface, call.method, call.arguments, &error),
                  nullptr);
        EXPECT_EQ(error.substr(error.rfind('.') + 1), call.error);
    }
}

TEST(ModemObjects, TextsAreValidWhateverAModemSays) {
    const struct {
        std::string said;
        const char* shown;
    } kTexts[] = {
        {"a\"b\\", "'Vendor': <'a\"b\\\\'>"},
        {"it's\n\t\x01", "'Vendor': <\"it's\\n\\t\\u0001\">"},
        {"a\xff", "'Vendor': <'a\xef\xbf\xbd'>"},
        {"  huawei", "'Vendor': <'huawei'>"},
        {"   ", "'Vendor': <''>"},
    };
    ShownModem shown;
    for (const auto& text : kTexts) {
        shown.modem.known.vendor = text.said;
        shown.Publish();
        EXPECT_THAT(ManagedObjects(), HasSubstr(text.shown));
    }
}

TEST(ModemObjects, FiftyClientsSeeTheSameChangesInTheSameOrder) {
    ShownModem shown;
    std::vector<std::unique_ptr<Monitor>> monitors;
    for (int i = 0; i < 50; ++i) {
        monitors.push_back(std::make_unique<Monitor>());
    }
    constexpr int kChanges = 20;
    for (int i = 1; i <= kChanges; ++i) {
        shown.modem.id = "usbmodem" + std::to_string(i);  // instead of the one before
        shown.Publish();
    }
    const std::string last =
        "Removed ('" + std::string(kPath) + "/usbmodem" + std::to_string(kChanges - 1) + "'";
    const std::string seen = monitors[0]->ReadUntil(last);
    EXPECT_EQ(std::count(seen.begin(), seen.end(), '\n'), 2 * kChanges);
    for (size_t i = 1; i < monitors.size(); ++i) {
        EXPECT_EQ(monitors[i]->ReadUntil(last), seen);
    }
    EXPECT_TRUE(shown.objects.HasClients());
    monitors.clear();
    EXPECT_TRUE(Eventually([&] { return !shown.objects.HasClients(); }));
}

TEST(ModemObjects, AClientThatNeverReadsCostsNothing) {
    ShownModem shown;
    DBusConnection* deaf = dbus_bus_get_private(DBUS_BUS_SESSION, nullptr);
    dbus_bus_add_match(deaf, "sender='com.merilond.usbmodem.Objects'", nullptr);
    int changes = 0;
    const auto pagesAfter = [&](int batches) {
        for (const int end = changes + batches * 250; changes < end;) {
            shown.PublishSignal(++changes);
            EXPECT_NE(changes % 250 == 0 ? ManagedObjects() : "sent", "");
        }
        const std::string pages = ReadFile("/proc/self/statm");
        return std::stol(pages.substr(pages.find(' ')));
    };
    const long before = pagesAfter(10);
    [[maybe_unused]] const long more = pagesAfter(20) - before;
#ifndef __SANITIZE_ADDRESS__  // which keeps what was freed
    EXPECT_LT(more, 256);     // 1 MB; what was sent meanwhile is 1.5 MB
#endif
    dbus_connection_close(deaf);
    dbus_connection_unref(deaf);
}

std::vector<std::string> LookingEverySecond() {
    return WithShortWaits({BuiltProgram("usbmodemd"), "--foreground", "--refresh", "1"});
}

TEST(Objects, TellWhatHappensToAModem) {
    const std::string addressed = "ip address add 10.64.64.64/32 dev ppp0";
    Shell("ip link add ppp0 type veth peer name far0;" + addressed);
    InstallDialler(
        "until [ -e /tmp/up ]; do sleep 0.05; done; echo '--> Using interface ppp0' >&2;"
        "echo '--> secondary DNS address 10.64.64.3' >&2");
    PrivateBus bus;
    ModemSimulator simulator({"--modem", "12d1,ports=dial/at"});
    simulator.Unplug("0");
    ModemService service;
    Monitor monitor;
    Process example({TAVI_SOURCE_DIR "/examples/modem_events.py"});
    simulator.Plug("0");
    monitor.ReadUntil("InterfacesAdded ('/com/merilond/usbmodem/usbmodem0'");
    monitor.ReadUntil("'Answers': <true>");
    EXPECT_EQ(CallService({"Connect", "usbmodem0"}).err, "");
    monitor.ReadUntil("'NetState': <'connecting'>");
    WriteFile("/tmp/up", "");
    const struct {
        std::string happens;
        const char* told;
    } kSteps[] = {
        {"true", "'NetState': <'connected'>"},
        {"ip address delete 10.64.64.64/32 dev ppp0", "'NetState': <'connecting'>"},
        {addressed, "'Address': <'10.64.64.64'>"},
        {"pkill -KILL -x sleep", "'NetState': <'disconnected'>"},
    };
    for (const auto& step : kSteps) {
        Shell(step.happens);
        monitor.ReadUntil(step.told);
    }
    EXPECT_EQ(CallService({"Connect", "usbmodem0"}).err, "");
    monitor.ReadUntil("'NetState': <'connected'>");
    EXPECT_EQ(CallService({"Disconnect", "usbmodem0"}).err, "");
    monitor.ReadUntil("'NetState': <'disconnected'>");
    simulator.Unplug("0");
    monitor.ReadUntil("InterfacesRemoved ('/com/merilond/usbmodem/usbmodem0'");
    EXPECT_THAT(example.ReadLine().value_or(""), HasSubstr("usbmodem0 came: "));
    std::string line;
    while ((line = example.ReadLine().value_or("usbmodem0 went")) != "usbmodem0 went") {
        EXPECT_THAT(line, HasSubstr("usbmodem0 "));
    }
    EXPECT_FALSE(example.AtEnd());
}

TEST(Objects, AskWhatGetUSBModemAsksAndNothingOfABusyModem) {
    InstallDialler();
    ServedModems served("12d1,ports=dial/at", LookingEverySecond());
    EXPECT_EQ(Look("usbmodem0").err, "");
    served.simulator.Received("0");  // what makes a modem ready, too
    EXPECT_EQ(Look("usbmodem0").err, "");
    const auto inBackground = served.simulator.Received("0");
    EXPECT_EQ(CallService({"GetUSBModem", "usbmodem0"}).err, "");
    EXPECT_THAT(inBackground, IsSupersetOf({"AT+CPIN?", "AT+CSQ", "AT+COPS?"}));
    const auto asked = served.simulator.Received("0");
    EXPECT_THAT(inBackground, IsSubsetOf(asked));
    EXPECT_EQ(CallService({"Connect", "usbmodem0"}).err, "");
    served.simulator.Received("0");
    for (int i = 0; i < 10; ++i) {
        EXPECT_THAT(Look("usbmodem0").err, HasSubstr("com.merilond.usbmodem.Error.Busy: "));
    }
    EXPECT_THAT(served.simulator.Received("0"), IsEmpty());
}

TEST(Objects, AModemThatBabblesDoesNotHideTheOthers) {
    setenv("TAVI_QUIET_WAITS", "whole", 1);  // a short wait takes it for quiet
    ServedModems served({"--modem", "generic,ports=dial/at", "--modem", "12d1,ports=dial/at"},
                        {"usbmodem0", "usbmodem1"}, LookingEverySecond());
    Monitor monitor;
    served.simulator.Fault("0.1", "babble");
    monitor.ReadUntil("'Answers': <false>");
    EXPECT_THAT(Look("usbmodem0").err, HasSubstr("com.merilond.usbmodem.Error.NotReady: "));
    EXPECT_EQ(Look("usbmodem1").err, "");
    served.simulator.Fault("0.1", "off");
    monitor.ReadUntil("'Answers': <true>");
}

}  // namespace
}  // namespace taviwireless::test
