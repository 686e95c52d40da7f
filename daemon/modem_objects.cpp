// SPDX-License-Identifier: MIT
#include "daemon/modem_objects.h"

#include <sys/stat.h>
#include <syslog.h>

#include <algorithm>
#include <fstream>
#include <set>
#include <stdexcept>
#include <utility>

#include "modem_objects_glue.h"
#include "usbmodem/rules/objects.h"
#include "usbmodem/rules/paths.h"

namespace taviwireless::daemon {

namespace {

namespace objects = usbmodem_lib::objects;
using usbmodem_lib::KnownModem;

constexpr char kErrorPrefix[] = "com.merilond.usbmodem.Error.";
// Enough to know that somebody listens. The bus allows a connection only so many rules.
constexpr size_t kMostClients = 100;

// Has the context's thread do this when it comes to it.
void Post(GMainContext* context, std::function<void()> work) {
    GSource* source = g_idle_source_new();
    g_source_set_priority(source, G_PRIORITY_DEFAULT);
    g_source_set_callback(
        source,
        [](gpointer data) -> gboolean {
            (*static_cast<std::function<void()>*>(data))();
            return G_SOURCE_REMOVE;
        },
        new std::function<void()>(std::move(work)),
        [](gpointer data) { delete static_cast<std::function<void()>*>(data); });
    g_source_attach(source, context);
    g_source_unref(source);
}

// Without the blanks that modems put in front, and as D-Bus carries it.
std::string Text(const std::string& text) {
    const size_t begin = std::min(text.find_first_not_of(' '), text.size());
    char* valid = g_utf8_make_valid(text.c_str() + begin, static_cast<gssize>(text.size() - begin));
    std::string result = valid;
    g_free(valid);
    return result;
}

std::uint64_t CountOf(const std::string& interface, const char* counter) {
    std::uint64_t count = 0;
    std::ifstream("/sys/class/net/" + interface + "/statistics/" + counter) >> count;
    return count;
}

void Fill(GDBusInterfaceSkeleton* skeleton, const ModemState& state) {
    TaviModem* modem = TAVI_MODEM(skeleton);
    const KnownModem& known = state.known;
    tavi_modem_set_answers(modem, state.answers);
    tavi_modem_set_vendor(modem, Text(known.vendor).c_str());
    tavi_modem_set_product(modem, Text(known.product).c_str());
    tavi_modem_set_operator(modem, Text(known.carrier).c_str());
    tavi_modem_set_signal(modem, static_cast<guint>(known.signal));
    tavi_modem_set_sim_state(modem, known.simStatus.c_str());
    tavi_modem_set_pin_lock(modem, known.isPINProtected);
    tavi_modem_set_pin_attempts(modem, known.pinRemains);
    tavi_modem_set_puk_attempts(modem, known.pukRemains);
    tavi_modem_set_imsi(modem, Text(known.imsi).c_str());
    tavi_modem_set_roaming(modem, known.isRoaming);
    tavi_modem_set_net_state(modem, known.netStatus.c_str());
    tavi_modem_set_interface(modem, Text(known.interface).c_str());
    tavi_modem_set_address(modem, Text(known.address).c_str());
    tavi_modem_set_dialled_at(modem, static_cast<guint64>(state.dialledAt));
    tavi_modem_set_bytes_sent(modem, state.bytesSent);
    tavi_modem_set_bytes_received(modem, state.bytesReceived);
    std::vector<const char*> ports;
    for (const std::string* port : {&known.connectNode, &known.queryNode}) {
        if (!port->empty()) {
            ports.push_back(port->c_str());
        }
    }
    ports.push_back(nullptr);
    tavi_modem_set_ports(modem, ports.data());
    const std::string log = known.imsi.empty() ? "" : usbmodem_lib::DialLogPath(known.imsi);
    tavi_modem_set_log_file(modem, Text(log).c_str());
    tavi_modem_set_last_look(modem, static_cast<guint64>(state.lastLook));
}

// Throws std::runtime_error when the bus does not let us have the name, such as by rules that are
// older than it.
void TakeName(GDBusConnection* connection) {
    constexpr guint kQueue = 0;
    constexpr guint kIsOwner = 1;
    GError* error = nullptr;
    const std::unique_ptr<GVariant, void (*)(GVariant*)> reply(
        g_dbus_connection_call_sync(
            connection, "org.freedesktop.DBus", "/org/freedesktop/DBus", "org.freedesktop.DBus",
            "RequestName", g_variant_new("(su)", objects::kService, kQueue), G_VARIANT_TYPE("(u)"),
            G_DBUS_CALL_FLAGS_NONE, -1, nullptr, &error),
        g_variant_unref);
    if (!reply) {
        const std::string reason = error->message;
        g_error_free(error);
        throw std::runtime_error(reason);
    }
    guint result = 0;
    g_variant_get(reply.get(), "(u)", &result);
    if (result != kIsOwner) {
        syslog(LOG_WARNING, "%s is ours once another process has left it", objects::kService);
    }
}

std::string PathOf(const std::string& id) {
    return std::string(objects::kManager) + '/' + id;
}

std::string IdIn(GDBusMethodInvocation* call) {
    const std::string path = g_dbus_method_invocation_get_object_path(call);
    return path.substr(path.rfind('/') + 1);
}

void Return(GDBusMethodInvocation* call, const std::string& error, const std::string& sentence,
            GVariant* value) {
    if (error.empty()) {
        g_dbus_method_invocation_return_value(call, value);
    } else {
        g_dbus_method_invocation_return_dbus_error(call, (kErrorPrefix + error).c_str(),
                                                   sentence.c_str());
    }
}

}  // namespace

ModemState StateOf(const usbmodem_lib::USBModem& modem, time_t lastLook) {
    ModemState state;
    state.id = modem.GetDevId();
    state.answers = modem.IsInited();
    state.known = modem.Known();
    state.lastLook = lastLook;
    if (!state.known.interface.empty()) {
        struct stat pidFile {};
        const std::string path = usbmodem_lib::kPidFilePrefix + std::to_string(modem.GetIfid());
        stat(path.c_str(), &pidFile);
        state.dialledAt = pidFile.st_mtime;
        state.bytesSent = CountOf(state.known.interface, "tx_bytes");
        state.bytesReceived = CountOf(state.known.interface, "rx_bytes");
    }
    return state;
}

ModemObjects::ModemObjects(OnLook onLook, OnCommand onCommand)
    : onLook_(std::move(onLook)),
      onCommand_(std::move(onCommand)),
      context_(g_main_context_new(), g_main_context_unref),
      loop_(g_main_loop_new(context_.get(), FALSE), g_main_loop_unref) {
    connection_.reset(g_bus_get_sync(G_BUS_TYPE_SESSION, nullptr, nullptr));
    if (!connection_) {
        throw std::runtime_error("the session bus takes no second connection");
    }
    g_dbus_connection_set_exit_on_close(connection_.get(), FALSE);
    // What is made under this context is served by the thread that runs it.
    g_main_context_push_thread_default(context_.get());
    manager_.reset(g_dbus_object_manager_server_new(objects::kManager));
    g_dbus_object_manager_server_set_connection(manager_.get(), connection_.get());
    g_main_context_pop_thread_default(context_.get());
    TakeName(connection_.get());
    filter_ = g_dbus_connection_add_filter(connection_.get(), NoteCaller, this, nullptr);
    thread_ = std::thread([this] { Run(); });
}

ModemObjects::~ModemObjects() {
    g_dbus_connection_close_sync(connection_.get(), nullptr, nullptr);  // so no call is noted now
    g_dbus_connection_remove_filter(connection_.get(), filter_);
    Post(context_.get(), [this] { g_main_loop_quit(loop_.get()); });
    thread_.join();
}

void ModemObjects::Run() {
    g_main_context_push_thread_default(context_.get());
    g_main_loop_run(loop_.get());
    for (const auto& [name, watch] : clients_) {
        g_bus_unwatch_name(watch);
    }
    g_main_context_pop_thread_default(context_.get());
}

void ModemObjects::Publish(std::vector<ModemState> modems) {
    Post(context_.get(), [this, modems = std::move(modems)] { Show(modems); });
}

void ModemObjects::Show(const std::vector<ModemState>& modems) {
    std::set<std::string> gone;
    for (const auto& [id, modem] : modems_) {
        gone.insert(id);
    }
    for (const ModemState& state : modems) {
        gone.erase(state.id);
        const auto known = modems_.find(state.id);
        if (known != modems_.end()) {
            Fill(known->second.get(), state);
            continue;
        }
        Owned<GDBusInterfaceSkeleton> modem(G_DBUS_INTERFACE_SKELETON(tavi_modem_skeleton_new()),
                                            g_object_unref);
        Fill(modem.get(), state);  // before it is seen
        Export(state.id, modem.get());
        modems_.emplace(state.id, std::move(modem));
    }
    for (const std::string& id : gone) {
        g_dbus_object_manager_server_unexport(manager_.get(), PathOf(id).c_str());
        modems_.erase(id);
    }
}

void ModemObjects::Export(const std::string& id, GDBusInterfaceSkeleton* modem) {
    g_signal_connect(modem, "handle-look", G_CALLBACK(HandleLook), this);
    g_signal_connect(modem, "handle-command", G_CALLBACK(HandleCommand), this);
    const Owned<GDBusObjectSkeleton> object(g_dbus_object_skeleton_new(PathOf(id).c_str()),
                                            g_object_unref);
    g_dbus_object_skeleton_add_interface(object.get(), modem);
    g_dbus_object_manager_server_export(manager_.get(), object.get());
}

gboolean ModemObjects::HandleLook(GDBusInterfaceSkeleton* /*modem*/, GDBusMethodInvocation* call,
                                  gpointer data) {
    auto* self = static_cast<ModemObjects*>(data);
    const Reply reply = [call](const std::string& error, const std::string& sentence) {
        Return(call, error, sentence, nullptr);
    };
    Post(nullptr, [self, id = IdIn(call), reply] { self->onLook_(id, reply); });
    return TRUE;
}

gboolean ModemObjects::HandleCommand(GDBusInterfaceSkeleton* /*modem*/, GDBusMethodInvocation* call,
                                     const char* command, gpointer data) {
    auto* self = static_cast<ModemObjects*>(data);
    const Reply reply = [call](const std::string& error, const std::string& text) {
        Return(call, error, text,
               error.empty() ? g_variant_new("(s)", Text(text).c_str()) : nullptr);
    };
    Post(nullptr, [self, id = IdIn(call), text = std::string(command), reply] {
        self->onCommand_(id, text, reply);
    });
    return TRUE;
}

// Runs on the thread of the connection.
GDBusMessage* ModemObjects::NoteCaller(GDBusConnection* /*connection*/, GDBusMessage* message,
                                       gboolean isIncoming, gpointer data) {
    const char* caller = g_dbus_message_get_sender(message);
    if (isIncoming && caller != nullptr &&
        g_dbus_message_get_message_type(message) == G_DBUS_MESSAGE_TYPE_METHOD_CALL) {
        auto* self = static_cast<ModemObjects*>(data);
        Post(self->context_.get(), [self, name = std::string(caller)] { self->AddClient(name); });
    }
    return message;
}

void ModemObjects::AddClient(const std::string& name) {
    if (clients_.count(name) != 0 || clients_.size() == kMostClients) {
        return;
    }
    clients_[name] = g_bus_watch_name_on_connection(
        connection_.get(), name.c_str(), G_BUS_NAME_WATCHER_FLAGS_NONE, nullptr,
        [](GDBusConnection*, const char* gone, gpointer self) {
            static_cast<ModemObjects*>(self)->DropClient(gone);
        },
        this, nullptr);
    hasClients_ = true;
}

void ModemObjects::DropClient(const std::string& name) {
    const auto client = clients_.find(name);
    g_bus_unwatch_name(client->second);
    clients_.erase(client);
    hasClients_ = !clients_.empty();
}

}  // namespace taviwireless::daemon
