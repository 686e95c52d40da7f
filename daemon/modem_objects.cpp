// SPDX-License-Identifier: MIT
#include "daemon/modem_objects.h"

#include <dbus/dbus-glib-lowlevel.h>
#include <syslog.h>

#include <algorithm>
#include <cstring>
#include <new>
#include <stdexcept>
#include <utility>

#include "daemon/introspection.h"
#include "usbmodem/rules/objects.h"

namespace taviwireless::daemon {

namespace {

namespace objects = usbmodem_lib::objects;

constexpr char kErrorPrefix[] = "com.merilond.usbmodem.Error.";
// Enough to know that somebody listens. The bus allows a connection only so many rules.
constexpr size_t kMostClients = 100;
constexpr char kObjectManager[] = "org.freedesktop.DBus.ObjectManager";

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

std::shared_ptr<DBusMessage> Owned(DBusMessage* message) {
    if (message == nullptr) {
        throw std::bad_alloc();
    }
    return {message, dbus_message_unref};
}

void CloseConnection(DBusConnection* connection) {
    dbus_connection_flush(connection);  // what was sent last
    dbus_connection_close(connection);
    dbus_connection_unref(connection);
}

// Throws std::runtime_error when the bus does not let us have the name, such as by rules that are
// older than it.
void TakeName(DBusConnection* connection) {
    constexpr unsigned int kQueue = 0;
    DBusError error;
    dbus_error_init(&error);
    const int result = dbus_bus_request_name(connection, objects::kService, kQueue, &error);
    if (result < 0) {
        const std::string reason = error.message;
        dbus_error_free(&error);
        throw std::runtime_error(reason);
    }
    if (result != DBUS_REQUEST_NAME_REPLY_PRIMARY_OWNER) {
        syslog(LOG_WARNING, "%s is ours once another process has left it", objects::kService);
    }
}

std::string RuleFor(const std::string& client) {
    return "type='signal',sender='org.freedesktop.DBus',interface='org.freedesktop.DBus',"
           "member='NameOwnerChanged',arg0='" +
           client + '\'';
}

std::string PathOf(const std::string& id) {
    return std::string(objects::kManager) + '/' + id;
}

// The device id at the end of the path that is called; empty for the manager.
std::string IdOf(const std::shared_ptr<DBusMessage>& call) {
    const std::string path = dbus_message_get_path(call.get());
    return path == objects::kManager ? "" : path.substr(std::strlen(objects::kManager) + 1);
}

std::shared_ptr<DBusMessage> Signal(const std::string& path, const char* interface,
                                    const char* name) {
    return Owned(dbus_message_new_signal(path.c_str(), interface, name));
}

void WriteInterfaces(MessageWriter& writer, const Properties& properties) {
    writer.Container(DBUS_TYPE_ARRAY, "{sa{sv}}", [&](MessageWriter& interfaces) {
        interfaces.Container(DBUS_TYPE_DICT_ENTRY, nullptr, [&](MessageWriter& entry) {
            entry.Text(objects::kModem);
            entry.All(properties);
        });
    });
}

}  // namespace

struct ModemObjects::Method {
    enum On { kAll, kManager, kModem };

    const char* interface;
    const char* name;
    const char* arguments;  // their signature
    On object;
    void (ModemObjects::*serve)(const Message& call);
};

// Null when the object has no such method. libdbus itself serves org.freedesktop.DBus.Peer.
const ModemObjects::Method* ModemObjects::FindMethod(const Message& call) {
    static constexpr Method kMethods[] = {
        {DBUS_INTERFACE_INTROSPECTABLE, "Introspect", "", Method::kAll, &ModemObjects::Introspect},
        {DBUS_INTERFACE_PROPERTIES, "Get", "ss", Method::kAll, &ModemObjects::Get},
        {DBUS_INTERFACE_PROPERTIES, "GetAll", "s", Method::kAll, &ModemObjects::GetAll},
        {DBUS_INTERFACE_PROPERTIES, "Set", "ssv", Method::kAll, &ModemObjects::Set},
        {kObjectManager, "GetManagedObjects", "", Method::kManager,
         &ModemObjects::GetManagedObjects},
        {objects::kModem, "Look", "", Method::kModem, &ModemObjects::Look},
        {objects::kModem, "Command", "s", Method::kModem, &ModemObjects::Command},
    };
    const Method::On object = IdOf(call).empty() ? Method::kManager : Method::kModem;
    for (const Method& method : kMethods) {
        if ((method.object == Method::kAll || method.object == object) &&
            dbus_message_is_method_call(call.get(), method.interface, method.name) != FALSE) {
            return &method;
        }
    }
    return nullptr;
}

ModemObjects::ModemObjects(OnLook onLook, OnCommand onCommand)
    : onLook_(std::move(onLook)),
      onCommand_(std::move(onCommand)),
      context_(g_main_context_new(), g_main_context_unref),
      loop_(g_main_loop_new(context_.get(), FALSE), g_main_loop_unref),
      connection_(dbus_bus_get_private(DBUS_BUS_SESSION, nullptr), CloseConnection) {
    if (!connection_) {
        throw std::runtime_error("the session bus takes no second connection");
    }
    dbus_connection_set_exit_on_disconnect(connection_.get(), FALSE);
    constexpr DBusObjectPathVTable kObjects = {nullptr, Handle, nullptr, nullptr, nullptr, nullptr};
    if (dbus_connection_add_filter(connection_.get(), NoteCaller, this, nullptr) == FALSE ||
        dbus_connection_register_fallback(connection_.get(), objects::kManager, &kObjects, this) ==
            FALSE) {
        throw std::bad_alloc();
    }
    TakeName(connection_.get());
    dbus_connection_setup_with_g_main(connection_.get(), context_.get());
    thread_ = std::thread([this] { g_main_loop_run(loop_.get()); });
}

ModemObjects::~ModemObjects() {
    Post(context_.get(), [this] { g_main_loop_quit(loop_.get()); });
    thread_.join();
}

void ModemObjects::Publish(const std::vector<ModemState>& modems) {
    const std::lock_guard<std::mutex> lock(mutex_);
    std::set<std::string> gone;
    for (const auto& [id, properties] : modems_) {
        gone.insert(id);
    }
    for (const ModemState& state : modems) {
        gone.erase(state.id);
        Properties properties = PropertiesOf(state);
        const auto known = modems_.find(state.id);
        if (known == modems_.end()) {
            TellAdded(state.id, properties);
        } else {
            TellChanges(state.id, known->second, properties);
        }
        modems_[state.id] = std::move(properties);
    }
    for (const std::string& id : gone) {
        TellRemoved(id);
        modems_.erase(id);
    }
}

void ModemObjects::TellAdded(const std::string& id, const Properties& properties) const {
    const Message signal = Signal(objects::kManager, kObjectManager, "InterfacesAdded");
    MessageWriter writer(signal.get());
    writer.Text(PathOf(id), DBUS_TYPE_OBJECT_PATH);
    WriteInterfaces(writer, properties);
    Send(signal);
}

void ModemObjects::TellRemoved(const std::string& id) const {
    const Message signal = Signal(objects::kManager, kObjectManager, "InterfacesRemoved");
    MessageWriter writer(signal.get());
    writer.Text(PathOf(id), DBUS_TYPE_OBJECT_PATH);
    writer.Container(DBUS_TYPE_ARRAY, "s",
                     [](MessageWriter& interfaces) { interfaces.Text(objects::kModem); });
    Send(signal);
}

void ModemObjects::TellChanges(const std::string& id, const Properties& before,
                               const Properties& now) const {
    Properties changed;
    for (size_t i = 0; i < now.size(); ++i) {
        if (now[i].isTold && now[i].value != before[i].value) {
            changed.push_back(now[i]);
        }
    }
    if (changed.empty()) {
        return;
    }
    const Message signal = Signal(PathOf(id), DBUS_INTERFACE_PROPERTIES, "PropertiesChanged");
    MessageWriter writer(signal.get());
    writer.Text(objects::kModem);
    writer.All(changed);
    writer.Container(DBUS_TYPE_ARRAY, "s", [](MessageWriter& /*invalidated*/) {});
    Send(signal);
}

// Runs on the thread, as all that follows.
DBusHandlerResult ModemObjects::Handle(DBusConnection* /*connection*/, DBusMessage* call,
                                       void* self) {
    if (dbus_message_get_type(call) != DBUS_MESSAGE_TYPE_METHOD_CALL) {
        return DBUS_HANDLER_RESULT_NOT_YET_HANDLED;
    }
    try {
        static_cast<ModemObjects*>(self)->Serve(Owned(dbus_message_ref(call)));
        return DBUS_HANDLER_RESULT_HANDLED;
    } catch (const std::bad_alloc&) {
        return DBUS_HANDLER_RESULT_NEED_MEMORY;  // libdbus comes again
    }
}

void ModemObjects::Serve(const Message& call) {
    const std::lock_guard<std::mutex> lock(mutex_);
    const std::string id = IdOf(call);
    if (!id.empty() && modems_.count(id) == 0) {
        Refuse(call, DBUS_ERROR_UNKNOWN_METHOD, "there is no object " + PathOf(id));
        return;
    }
    const Method* method = FindMethod(call);
    if (method == nullptr) {
        Refuse(call, DBUS_ERROR_UNKNOWN_METHOD, "the object has no such method");
    } else if (dbus_message_has_signature(call.get(), method->arguments) == FALSE) {
        Refuse(call, DBUS_ERROR_INVALID_ARGS,
               std::string("the arguments are not \"") + method->arguments + '"');
    } else {
        (this->*method->serve)(call);
    }
}

void ModemObjects::Introspect(const Message& call) {
    const bool isManager = IdOf(call).empty();
    std::string text = DBUS_INTROSPECT_1_0_XML_DOCTYPE_DECL_NODE;
    text += std::string("<node>\n") + kStandardInterfaces;
    text += isManager ? kManagerInterface : kModemInterface;
    for (const auto& [id, properties] : modems_) {
        text += isManager ? "  <node name=\"" + id + "\"/>\n" : "";
    }
    const Message reply = Owned(dbus_message_new_method_return(call.get()));
    MessageWriter(reply.get()).Text(text + "</node>\n");
    Answer(call, reply);
}

// Null when the object that is called does not have the interface.
const Properties* ModemObjects::PropertiesFor(const Message& call,
                                              const std::string& interface) const {
    static const Properties kNone;
    const std::string id = IdOf(call);
    if (id.empty()) {
        return interface == kObjectManager ? &kNone : nullptr;
    }
    return interface == objects::kModem ? &modems_.at(id) : nullptr;
}

void ModemObjects::GetAll(const Message& call) {
    const char* interface = nullptr;
    dbus_message_get_args(call.get(), nullptr, DBUS_TYPE_STRING, &interface, DBUS_TYPE_INVALID);
    const Properties* properties = PropertiesFor(call, interface);
    if (properties == nullptr) {
        Refuse(call, DBUS_ERROR_INVALID_ARGS, "the object has no such interface");
        return;
    }
    const Message reply = Owned(dbus_message_new_method_return(call.get()));
    MessageWriter(reply.get()).All(*properties);
    Answer(call, reply);
}

// The property that a call of Get or Set names. Null when there is none, and the call was refused.
const Property* ModemObjects::FindProperty(const Message& call) const {
    const char* interface = nullptr;
    const char* name = nullptr;
    dbus_message_get_args(call.get(), nullptr, DBUS_TYPE_STRING, &interface, DBUS_TYPE_STRING,
                          &name, DBUS_TYPE_INVALID);
    const Properties* properties = PropertiesFor(call, interface);
    if (properties != nullptr) {
        for (const Property& property : *properties) {
            if (std::strcmp(property.name, name) == 0) {
                return &property;
            }
        }
    }
    Refuse(call, DBUS_ERROR_INVALID_ARGS, "the object has no such property");
    return nullptr;
}

void ModemObjects::Get(const Message& call) {
    if (const Property* property = FindProperty(call)) {
        const Message reply = Owned(dbus_message_new_method_return(call.get()));
        MessageWriter(reply.get()).Variant(property->value);
        Answer(call, reply);
    }
}

void ModemObjects::Set(const Message& call) {
    if (const Property* property = FindProperty(call)) {
        Refuse(call, DBUS_ERROR_INVALID_ARGS, std::string(property->name) + " is not writable");
    }
}

void ModemObjects::GetManagedObjects(const Message& call) {
    const Message reply = Owned(dbus_message_new_method_return(call.get()));
    MessageWriter(reply.get())
        .Container(DBUS_TYPE_ARRAY, "{oa{sa{sv}}}", [this](MessageWriter& entries) {
            for (const auto& modem : modems_) {
                entries.Container(DBUS_TYPE_DICT_ENTRY, nullptr, [&modem](MessageWriter& entry) {
                    entry.Text(PathOf(modem.first), DBUS_TYPE_OBJECT_PATH);
                    WriteInterfaces(entry, modem.second);
                });
            }
        });
    Answer(call, reply);
}

void ModemObjects::Look(const Message& call) {
    Post(nullptr, [this, call] { onLook_(IdOf(call), ReplyTo(call)); });
}

void ModemObjects::Command(const Message& call) {
    Post(nullptr, [this, call] {
        const char* command = nullptr;
        dbus_message_get_args(call.get(), nullptr, DBUS_TYPE_STRING, &command, DBUS_TYPE_INVALID);
        onCommand_(IdOf(call), command, ReplyTo(call));
    });
}

// Called in the main loop, where the answers to Look and Command come from.
ModemObjects::Reply ModemObjects::ReplyTo(const Message& call) const {
    return [this, call](const std::string& error, const std::string& text) {
        if (!error.empty()) {
            Refuse(call, kErrorPrefix + error, text);
            return;
        }
        const Message reply = Owned(dbus_message_new_method_return(call.get()));
        if (dbus_message_has_member(call.get(), "Command") != FALSE) {
            MessageWriter(reply.get()).Text(ShownText(text));
        }
        Answer(call, reply);
    };
}

void ModemObjects::Refuse(const Message& call, const std::string& error,
                          const std::string& sentence) const {
    Answer(call, Owned(dbus_message_new_error(call.get(), error.c_str(), sentence.c_str())));
}

void ModemObjects::Answer(const Message& call, const Message& reply) const {
    if (dbus_message_get_no_reply(call.get()) == FALSE) {
        Send(reply);
    }
}

void ModemObjects::Send(const Message& message) const {
    dbus_connection_send(connection_.get(), message.get(), nullptr);
}

// Sees every message of the connection.
DBusHandlerResult ModemObjects::NoteCaller(DBusConnection* /*connection*/, DBusMessage* message,
                                           void* data) {
    auto* self = static_cast<ModemObjects*>(data);
    const char* sender = dbus_message_get_sender(message);
    const char* name = nullptr;
    if (dbus_message_is_signal(message, DBUS_INTERFACE_DBUS, "NameOwnerChanged") != FALSE &&
        dbus_message_has_sender(message, DBUS_SERVICE_DBUS) != FALSE &&
        dbus_message_get_args(message, nullptr, DBUS_TYPE_STRING, &name, DBUS_TYPE_INVALID) !=
            FALSE) {
        self->DropClient(name);
    } else if (dbus_message_get_type(message) == DBUS_MESSAGE_TYPE_METHOD_CALL &&
               sender != nullptr) {
        self->AddClient(sender);
    }
    return DBUS_HANDLER_RESULT_NOT_YET_HANDLED;
}

void ModemObjects::AddClient(const std::string& name) {
    if (clients_.size() == kMostClients || !clients_.insert(name).second) {
        return;
    }
    hasClients_ = true;
    dbus_bus_add_match(connection_.get(), RuleFor(name).c_str(), nullptr);
    if (dbus_bus_name_has_owner(connection_.get(), name.c_str(), nullptr) == FALSE) {
        DropClient(name);  // it left before the rule was there
    }
}

void ModemObjects::DropClient(const std::string& name) {
    if (clients_.erase(name) != 0) {
        dbus_bus_remove_match(connection_.get(), RuleFor(name).c_str(), nullptr);
    }
    hasClients_ = !clients_.empty();
}

}  // namespace taviwireless::daemon
