// SPDX-License-Identifier: MIT
#include "cli/modem/service_objects.h"

#include <cstring>

#include "cli/terminal.h"
#include "usbmodem/rules/objects.h"

namespace taviwireless::cli {

namespace {

namespace objects = usbmodem_lib::objects;

struct Unreference {
    void operator()(GVariant* value) const { g_variant_unref(value); }
};
using Variant = std::unique_ptr<GVariant, Unreference>;

std::string TextOf(GVariant* properties, const char* name) {
    const char* text = "";
    g_variant_lookup(properties, name, "&s", &text);
    return text;
}

std::vector<std::string> TextsOf(GVariant* properties, const char* name) {
    const Variant value(g_variant_lookup_value(properties, name, G_VARIANT_TYPE_STRING_ARRAY));
    std::vector<std::string> texts;
    for (gsize i = 0; value && i < g_variant_n_children(value.get()); ++i) {
        const char* text = nullptr;
        g_variant_get_child(value.get(), i, "&s", &text);
        texts.emplace_back(text);
    }
    return texts;
}

bool IsSet(GVariant* properties, const char* name) {
    gboolean value = FALSE;
    g_variant_lookup(properties, name, "b", &value);
    return value;
}

KnownModem ReadProperties(const std::string& id, GVariant* properties) {
    KnownModem modem;
    modem.answers = IsSet(properties, "Answers");
    g_variant_lookup(properties, "LastLook", "t", &modem.lastLook);
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
    guint signal = 0;
    g_variant_lookup(properties, "Signal", "u", &signal);
    state.signal = static_cast<int>(signal);
    g_variant_lookup(properties, "PinAttempts", "i", &state.pinRemains);
    g_variant_lookup(properties, "PukAttempts", "i", &state.pukRemains);
    return modem;
}

}  // namespace

ServiceObjects::~ServiceObjects() {
    for (const guint watch : watches_) {
        g_dbus_connection_signal_unsubscribe(connection_.get(), watch);
    }
}

bool ServiceObjects::Connect() {
    if (!connection_) {
        connection_.reset(g_bus_get_sync(G_BUS_TYPE_SESSION, nullptr, nullptr));
        if (connection_) {
            g_dbus_connection_set_exit_on_close(connection_.get(), FALSE);
        }
    }
    return connection_ != nullptr;
}

std::optional<std::map<std::string, KnownModem>> ServiceObjects::Read() {
    if (!Connect()) {
        return std::nullopt;
    }
    const Variant reply(g_dbus_connection_call_sync(
        connection_.get(), objects::kService, objects::kManager,
        "org.freedesktop.DBus.ObjectManager", "GetManagedObjects", nullptr,
        G_VARIANT_TYPE("(a{oa{sa{sv}}})"), G_DBUS_CALL_FLAGS_NO_AUTO_START, -1, nullptr, nullptr));
    if (!reply) {
        return std::nullopt;
    }
    std::map<std::string, KnownModem> modems;
    const Variant all(g_variant_get_child_value(reply.get(), 0));
    GVariantIter next;
    g_variant_iter_init(&next, all.get());
    const char* path = nullptr;
    GVariant* interfaces = nullptr;
    while (g_variant_iter_loop(&next, "{&o@a{sa{sv}}}", &path, &interfaces)) {
        const Variant properties(
            g_variant_lookup_value(interfaces, objects::kModem, G_VARIANT_TYPE("a{sv}")));
        if (properties) {
            const std::string id = strrchr(path, '/') + 1;
            modems[id] = ReadProperties(id, properties.get());
        }
    }
    return modems;
}

std::string ServiceObjects::Command(const std::string& id, const std::string& command) {
    GError* error = nullptr;
    const Variant reply(
        Connect() ? g_dbus_connection_call_sync(
                        connection_.get(), objects::kService,
                        (std::string(objects::kManager) + '/' + id).c_str(), objects::kModem,
                        "Command", g_variant_new("(s)", command.c_str()), G_VARIANT_TYPE("(s)"),
                        G_DBUS_CALL_FLAGS_NO_AUTO_START, G_MAXINT, nullptr, &error)
                  : nullptr);
    if (reply) {
        const char* text = nullptr;
        g_variant_get(reply.get(), "(&s)", &text);
        return text;
    }
    const std::unique_ptr<GError, void (*)(GError*)> failure(error, g_error_free);
    char* remote = failure ? g_dbus_error_get_remote_error(failure.get()) : nullptr;
    const std::string name = remote != nullptr ? remote : "";
    g_free(remote);
    if (name.rfind("com.merilond.usbmodem.Error.", 0) != 0) {
        throw CommandError(kUsage,
                           "this modem service sends no AT commands; end it, and add --direct");
    }
    g_dbus_error_strip_remote_error(failure.get());
    const bool isBusy = name.rfind("Busy") != std::string::npos;
    throw CommandError(isBusy ? kBusy : kFailure, Printable(failure->message));
}

void ServiceObjects::WaitForChange() {
    if (watches_.empty()) {
        const auto watch = [this](const char* sender, const char* interface, const char* argument) {
            watches_.push_back(g_dbus_connection_signal_subscribe(
                connection_.get(), sender, interface, nullptr, nullptr, argument,
                G_DBUS_SIGNAL_FLAGS_NONE,
                [](GDBusConnection*, const char*, const char*, const char*, const char*, GVariant*,
                   gpointer self) { static_cast<ServiceObjects*>(self)->hasChanged_ = true; },
                this, nullptr));
        };
        watch(objects::kService, nullptr, nullptr);
        watch("org.freedesktop.DBus", "org.freedesktop.DBus", objects::kService);
        return;
    }
    while (!hasChanged_ && !g_dbus_connection_is_closed(connection_.get())) {
        g_main_context_iteration(nullptr, TRUE);
    }
    hasChanged_ = false;
}

}  // namespace taviwireless::cli
