// SPDX-License-Identifier: MIT
// Other programs on the bus send what they like, and the service goes on for everybody else.
#include "tests/support/bus.h"

#include <dbus/dbus.h>
#include <gmock/gmock.h>
#include <unistd.h>

#include "tests/support/files.h"
#include "tests/support/wait.h"

namespace taviwireless::test {
namespace {

namespace fs = std::filesystem;

constexpr char kService[] = "com.merilond.usbmodem";
constexpr char kObjects[] = "com.merilond.usbmodem.Objects";
constexpr char kManager[] = "/com/merilond/usbmodem";
constexpr char kModem[] = "/com/merilond/usbmodem/usbmodem0";
constexpr char kId[] = "usbmodem0";

struct ServedBus : testing::Test {
    ServedBus() : served("12d1,ports=dial/at") {}

    long Descriptors() const {
        return std::distance(fs::directory_iterator(Proc("fd")), fs::directory_iterator());
    }
    long Memory() const {  // resident, in KB
        return std::stol(Shell("sed -n 's/^VmRSS://p' " + Proc("status")));
    }
    std::string Proc(const std::string& file) const {
        return "/proc/" + std::to_string(served.service.Daemon().Pid()) + '/' + file;
    }

    mutable ServedModems served;
};

using Message = std::unique_ptr<DBusMessage, decltype(&dbus_message_unref)>;

Message Call(const char* method, const char* interface = kService, const char* path = "/",
             const char* service = kService) {
    return {dbus_message_new_method_call(service, path, interface, method), dbus_message_unref};
}

// Appends a value of each of these types; of texts this one.
void Append(DBusMessageIter& to, const std::string& types, const char* text) {
    DBusMessageIter inner;
    const std::int64_t number = -1;  // of any size
    for (const char type : types) {
        if (type == 's' || type == 'o') {
            const char* value = type == 's' ? text : "/";
            dbus_message_iter_append_basic(&to, type, &value);
        } else if (type == 'a') {
            dbus_message_iter_open_container(&to, DBUS_TYPE_ARRAY, "s", &inner);
            Append(inner, "ss", text);
            dbus_message_iter_close_container(&to, &inner);
        } else if (type == 'v') {
            dbus_message_iter_open_container(&to, DBUS_TYPE_VARIANT, "s", &inner);
            Append(inner, "s", text);
            dbus_message_iter_close_container(&to, &inner);
        } else if (type == 'r') {
            dbus_message_iter_open_container(&to, DBUS_TYPE_STRUCT, nullptr, &inner);
            Append(inner, "si", text);
            dbus_message_iter_close_container(&to, &inner);
        } else {
            const std::int64_t value = type == 'b' ? 1 : type == 'h' ? STDOUT_FILENO : number;
            dbus_message_iter_append_basic(&to, type, &value);
        }
    }
}

Message With(Message message, const std::string& types, const char* text = kId) {
    DBusMessageIter arguments;
    dbus_message_iter_init_append(message.get(), &arguments);
    Append(arguments, types, text);
    return message;
}

// Somebody on the bus who never reads what he gets.
class DeafCaller {
  public:
    DeafCaller() : bus_(dbus_bus_get_private(DBUS_BUS_SESSION, nullptr)) {
        dbus_connection_set_exit_on_disconnect(bus_, FALSE);
    }
    ~DeafCaller() {
        dbus_connection_close(bus_);
        dbus_connection_unref(bus_);
    }
    DeafCaller(const DeafCaller&) = delete;
    DeafCaller& operator=(const DeafCaller&) = delete;

    void Send(const Message& message) {
        ASSERT_NE(message, nullptr);
        dbus_connection_send(bus_, message.get(), nullptr);
        dbus_connection_flush(bus_);
    }

  private:
    DBusConnection* bus_;
};

TEST_F(ServedBus, AMessageOfAWrongShapeIsRefusedOrLeftAlone) {
    const long before = Descriptors();
    DeafCaller caller;
    for (const char* method :
         {"Connect", "Disconnect", "GetUSBModemList", "GetUSBModem", "UnlockSIM", "UnlockPIN",
          "SetPIN", "GetProfile", "SetProfile", "GetUSBModemIfList", "Fly", "Get", "Introspect"}) {
        for (const char* types : {"", "i", "b", "v", "a", "r", "h", "o", "x", "d", "si", "sa", "sv",
                                  "sss", "sssi", "sssv", "bsss", "ssssssss", "hhhhhhhh"}) {
            if (types == std::string("sss") && method == std::string("SetPIN")) {
                continue;
            }
            // None of these is a modem, and nothing of this is a format.
            caller.Send(With(Call(method), types, "usbmodem%n%s%9999999s\x7f\xC2\x85"));
        }
        for (const char* interface : {"org.example.Other", "org.freedesktop.DBus.Properties"}) {
            caller.Send(With(Call(method, interface), "s"));
            caller.Send(With(Call(method, nullptr, "/other"), "s"));
        }
    }
    for (const char* path : {"/", kManager, kModem, "/com/merilond/usbmodem/usbmodem9"}) {
        for (const char* method : {"GetManagedObjects", "Look", "Command", "Get", "Set", "GetAll",
                                   "Introspect", "Fly"}) {
            for (const char* types : {"", "s", "ss", "ssv", "sv", "i", "a", "h"}) {
                caller.Send(With(Call(method, nullptr, path, kObjects), types));
            }
        }
    }
    for (const int type :
         {DBUS_MESSAGE_TYPE_METHOD_RETURN, DBUS_MESSAGE_TYPE_ERROR, DBUS_MESSAGE_TYPE_SIGNAL, 77}) {
        for (const char* interface :
             {DBUS_INTERFACE_DBUS, DBUS_INTERFACE_LOCAL, kService, kObjects}) {
            Message message(dbus_message_new(type), dbus_message_unref);
            dbus_message_set_destination(message.get(),
                                         interface == kObjects ? kObjects : kService);
            dbus_message_set_path(message.get(), "/");
            dbus_message_set_interface(message.get(), interface);
            dbus_message_set_member(message.get(), "Disconnected");
            dbus_message_set_error_name(message.get(), "org.example.Error");
            dbus_message_set_reply_serial(message.get(), 3);
            DeafCaller().Send(With(std::move(message), "sss"));
        }
    }
    EXPECT_TRUE(served.service.Lists({kId}));
    EXPECT_TRUE(Eventually([&] { return Descriptors() <= before; }));
    EXPECT_THAT(CallService({"GetUSBModem", kId}).out, testing::HasSubstr("E1752"));
}

// The device id, or what stands behind the right one.
TEST_F(ServedBus, AnArgumentOf64MegabytesIsForgotten) {
    served.simulator.Set("0", "pin", "1234");  // so that a PIN is sent to the modem
    served.simulator.Set("0", "lock", "on");
    served.simulator.Command("unplug 0");
    served.simulator.Command("plug 0");
    EXPECT_TRUE(served.service.Lists({kId}));
    const std::string text(64 << 20, '1');
    const std::pair<const char*, const char*> kLong[] = {
        {"GetUSBModem", ""}, {"UnlockSIM", "s"}, {"SetProfile", "s"}, {"SetPIN", "ssb"}};
    const long before = Memory();
    DeafCaller caller;
    for (const auto& [method, types] : kLong) {
        SCOPED_TRACE(method);
        caller.Send(*types == '\0' ? With(Call(method), "s", text.c_str())
                                   : With(With(Call(method), "s"), types, text.c_str()));
        EXPECT_TRUE(served.service.Lists({kId}));
    }
    EXPECT_LT(Memory() - before, 2 << 10);
    EXPECT_THAT(CallService({"UnlockSIM", kId, "1234"}).err, "");
}

// While a connection comes up nothing is sent to the modem, so calls cost no waiting.
TEST_F(ServedBus, ThousandsOfCallsAtOnceOfCallersWhoNeverReadAreServedAndForgotten) {
    InstallDialler();
    EXPECT_EQ(CallService({"Connect", kId}).status, 0);
    const long descriptors = Descriptors();
    const long memory = Memory();
    for (int round = 0; round < 2; ++round) {
        std::vector<DeafCaller> callers(10);
        for (int i = 0; i < 1000; ++i) {
            callers[i % 10].Send(With(Call(i % 2 == 0 ? "GetUSBModem" : "GetProfile"), "s"));
            callers[i % 10].Send(i % 2 == 0
                                     ? Call("Look", nullptr, kModem, kObjects)
                                     : Call("GetManagedObjects", nullptr, kManager, kObjects));
        }
        EXPECT_TRUE(served.service.Lists({kId}));  // behind all those calls
    }
    EXPECT_TRUE(Eventually([&] { return Descriptors() <= descriptors; }));
    EXPECT_LT(Memory() - memory, 4 << 10);
}

}  // namespace
}  // namespace taviwireless::test
