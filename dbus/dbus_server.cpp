// SPDX-License-Identifier: MIT
#include <dlfcn.h>

#include <memory>

// The appliance's GLib wants types and threads initialised; later ones do both by themselves.
#define GLIB_DISABLE_DEPRECATION_WARNINGS
#include <dbus/dbus-glib-lowlevel.h>
#include <taviwireless/dbus_server.h>

#include "common/log.h"

namespace taviwireless::dbus {

namespace {

// Loaded with the first server: it brings GIO and five libraries more, whose loading would be a
// third of the start of a program that only calls the service. Null when it is missing.
void* DBusGLib() {
    static void* const library = dlopen("libdbus-glib-1.so.2", RTLD_NOW);
    return library;
}

// A function of it.
#define DBUS_GLIB(function) reinterpret_cast<decltype(&(function))>(dlsym(DBusGLib(), #function))

}  // namespace

DBusServer::DBusServer(const char* busName, const char* path, DBusBusType type)
    : busType_(type), busName_(busName), path_(path) {
    g_type_init();
    if (DBusGLib() == nullptr) {
        TAVI_LOG_ERROR("Failed to load dbus-glib: %s", dlerror());
        return;
    }
    connection_ = DBUS_GLIB(dbus_g_bus_get)(busType_, nullptr);
    if (connection_ != nullptr) {
        proxy_ = DBUS_GLIB(dbus_g_proxy_new_for_name)(connection_, DBUS_SERVICE_DBUS,
                                                      DBUS_PATH_DBUS, DBUS_INTERFACE_DBUS);
    }
}

DBusServer::~DBusServer() {
    if (proxy_ != nullptr) {
        g_object_unref(proxy_);
    }
}

bool DBusServer::initialize(GType type, const DBusGObjectInfo* info, GObject* object) {
    if (proxy_ == nullptr) {
        TAVI_LOG_ERROR("Failed to acquire %s: %s", busName_.c_str(), "there is no message bus");
        return false;
    }
    DBUS_GLIB(dbus_g_object_type_install_info)(type, info);
    constexpr guint kNoFlags = 0;  // neither replacing nor replaceable
    guint result = 0;              // not looked at: being second in the queue is no failure
    GError* error = nullptr;
    if (!DBUS_GLIB(dbus_g_proxy_call)(proxy_, "RequestName", &error, G_TYPE_STRING,
                                      busName_.c_str(), G_TYPE_UINT, kNoFlags, G_TYPE_INVALID,
                                      G_TYPE_UINT, &result, G_TYPE_INVALID)) {
        const std::unique_ptr<GError, decltype(&g_error_free)> owned(error, g_error_free);
        TAVI_LOG_ERROR("Failed to acquire %s: %s", busName_.c_str(), error->message);
        return false;
    }
    DBUS_GLIB(dbus_g_connection_register_g_object)(connection_, path_.c_str(), object);
    return true;
}

void DBusServer::StartLoop() {
    if (loop_ != nullptr) {
        return;
    }
    loop_ = g_main_loop_new(nullptr, FALSE);
    if (!g_threads_got_initialized) {
        g_thread_init(nullptr);
    }
    if (DBusGLib() != nullptr) {
        DBUS_GLIB(dbus_g_thread_init)();
    }
    g_main_loop_run(loop_);
    // After QuitLoop the field is empty, and the loop object stays.
    if (loop_ != nullptr) {
        g_main_loop_unref(loop_);
        loop_ = nullptr;
    }
}

void DBusServer::QuitLoop() {
    // The loop object is not released, since StartLoop is still running it; it is small, and one
    // per process. This reference tells leak checkers so.
    [[maybe_unused, gnu::used]] static GMainLoop* ended = nullptr;
    if (loop_ != nullptr) {
        ended = loop_;
        g_main_loop_quit(loop_);
        loop_ = nullptr;
    }
}

const char* DBusServer::GetInterface() const {
    return proxy_ != nullptr ? DBUS_GLIB(dbus_g_proxy_get_interface)(proxy_) : nullptr;
}

const char* DBusServer::GetPath() const {
    return proxy_ != nullptr ? DBUS_GLIB(dbus_g_proxy_get_path)(proxy_) : nullptr;
}

const char* DBusServer::GetBusName() const {
    return proxy_ != nullptr ? DBUS_GLIB(dbus_g_proxy_get_bus_name)(proxy_) : nullptr;
}

const char* DBusServer::GetConnectionName() const {
    return connection_ != nullptr
               ? dbus_bus_get_unique_name(DBUS_GLIB(dbus_g_connection_get_connection)(connection_))
               : nullptr;
}

}  // namespace taviwireless::dbus
