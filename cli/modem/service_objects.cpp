// SPDX-License-Identifier: MIT
#include "cli/modem/service_objects.h"

#include "cli/modem/session_bus.h"
#include "cli/terminal.h"
#include "usbmodem/rules/objects.h"

namespace taviwireless::cli {

namespace {

namespace objects = usbmodem_lib::objects;

using Properties = std::map<std::string, DBusMessageIter>;

// The value of a property, if it is of this type.
template <typename Value>
Value ValueOf(const Properties& properties, const char* name, int type, Value value) {
    const auto place = properties.find(name);
    if (place != properties.end()) {
        DBusMessageIter found = place->second;
        if (dbus_message_iter_get_arg_type(&found) == type) {
            dbus_message_iter_get_basic(&found, &value);
        }
    }
    return value;
}

std::string TextOf(const Properties& properties, const char* name) {
    return ValueOf(properties, name, DBUS_TYPE_STRING, "");
}

bool IsSet(const Properties& properties, const char* name) {
    return ValueOf<dbus_bool_t>(properties, name, DBUS_TYPE_BOOLEAN, FALSE) != FALSE;
}

std::vector<std::string> TextsOf(const Properties& properties, const char* name) {
    std::vector<std::string> texts;
    const auto place = properties.find(name);
    if (place != properties.end()) {
        ForEachText(place->second, [&](const char* text) { texts.emplace_back(text); });
    }
    return texts;
}

KnownModem ReadProperties(const std::string& id, const Properties& properties) {
    KnownModem modem;
    modem.answers = IsSet(properties, "Answers");
    modem.lastLook = ValueOf<dbus_uint64_t>(properties, "LastLook", DBUS_TYPE_UINT64, 0);
    modem.logFile = TextOf(properties, "LogFile");
    ModemState& state = modem.state;
    state.id = id;
    state.imsi = TextOf(properties, "Imsi");
    state.interface = TextOf(properties, "Interface");
    state.ports = TextsOf(properties, "Ports");
    state.vendor = TextOf(properties, "Vendor");
    state.product = TextOf(properties, "Product");
    state.ip = TextOf(properties, "Address");
    state.carrier = TextOf(properties, "Operator");
    state.netStatus = TextOf(properties, "NetState");
    state.simStatus = TextOf(properties, "SimState");
    state.pinProtected = IsSet(properties, "PinLock");
    state.signal =
        static_cast<int>(ValueOf<dbus_uint32_t>(properties, "Signal", DBUS_TYPE_UINT32, 0));
    state.pinRemains = ValueOf(properties, "PinAttempts", DBUS_TYPE_INT32, state.pinRemains);
    state.pukRemains = ValueOf(properties, "PukAttempts", DBUS_TYPE_INT32, state.pukRemains);
    return modem;
}

}  // namespace

bool ServiceObjects::Connect() {
    BusFailure failure;
    if (!bus_ && FindSessionBus()) {
        bus_ = ConnectToBus(failure);
    }
    return bus_ != nullptr;
}

std::optional<std::map<std::string, KnownModem>> ServiceObjects::Read() {
    BusFailure failure;
    const Message call = NewCall(objects::kService, objects::kManager,
                                 "org.freedesktop.DBus.ObjectManager", "GetManagedObjects");
    dbus_message_set_auto_start(call.get(), FALSE);
    const Message reply = Connect() ? Ask(bus_.get(), call, "a{oa{sa{sv}}}", failure) : nullptr;
    if (!reply) {
        return std::nullopt;
    }
    std::map<std::string, KnownModem> modems;
    ForEachEntry(Content(reply), [&](const std::string& path, DBusMessageIter interfaces) {
        ForEachEntry(interfaces, [&](const std::string& interface, DBusMessageIter values) {
            if (interface == objects::kModem) {
                Properties properties;
                ForEachEntry(values, [&](const std::string& name, DBusMessageIter variant) {
                    dbus_message_iter_recurse(&variant, &properties[name]);
                });
                const std::string id = path.substr(path.rfind('/') + 1);
                modems[id] = ReadProperties(id, properties);
            }
        });
    });
    return modems;
}

Message ServiceObjects::Call(const std::string& id, const char* method,
                             const std::vector<std::string>& arguments, const char* signature,
                             BusFailure& failure) {
    const Message call = NewCall(objects::kService, std::string(objects::kManager) + '/' + id,
                                 objects::kModem, method, arguments);
    dbus_message_set_auto_start(call.get(), FALSE);
    return Connect() ? Ask(bus_.get(), call, signature, failure, DBUS_TIMEOUT_INFINITE) : nullptr;
}

bool ServiceObjects::Look(const std::string& id) {
    BusFailure failure;
    return Call(id, "Look", {}, "", failure) != nullptr;
}

std::string ServiceObjects::Command(const std::string& id, const std::string& command) {
    BusFailure failure;
    if (const Message reply = Call(id, "Command", {command}, "s", failure)) {
        const char* text = nullptr;
        dbus_message_get_args(reply.get(), nullptr, DBUS_TYPE_STRING, &text, DBUS_TYPE_INVALID);
        return text;
    }
    const std::string name = failure.error.name != nullptr ? failure.error.name : "";
    if (name.rfind("com.merilond.usbmodem.Error.", 0) != 0) {
        throw CommandError(kUsage,
                           "this modem service sends no AT commands; end it, and add --direct");
    }
    const bool isBusy = name.rfind("Busy") != std::string::npos;
    throw CommandError(isBusy ? kBusy : kFailure, failure.Text());
}

// All signals that come are of what was asked for.
void ServiceObjects::WaitForChange() {
    if (!isWatching_) {
        isWatching_ = true;
        for (const char* wanted :
             {"type='signal',sender='com.merilond.usbmodem.Objects'",
              "type='signal',sender='org.freedesktop.DBus',interface='org.freedesktop.DBus',"
              "arg0='com.merilond.usbmodem.Objects'"}) {
            dbus_bus_add_match(bus_.get(), wanted, nullptr);
        }
        dbus_connection_flush(bus_.get());
        return;
    }
    constexpr int kNoTimeout = -1;
    bool hasChanged = false;
    do {
        while (const Message signal{dbus_connection_pop_message(bus_.get())}) {
            hasChanged = true;
        }
    } while (!hasChanged && dbus_connection_read_write(bus_.get(), kNoTimeout));
}

}  // namespace taviwireless::cli
