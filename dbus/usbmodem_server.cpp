// SPDX-License-Identifier: MIT
#include <taviwireless/usbmodem_server.h>

#include <new>

#include "dbus/usbmodem_methods.h"
#include "dbus/usbmodem_service.h"

// The object description and its marshallers, made from usbmodem.xml at build time.
namespace taviwireless::dbus {
#include "usbmodem_glue.h"
}

namespace taviwireless::dbus {

namespace {

gpointer parentClass = nullptr;

void Finalize(GObject* object) {
    reinterpret_cast<USBModemObject*>(object)->list.~USBModemList();
    G_OBJECT_CLASS(parentClass)->finalize(object);
}

void InitClass(gpointer objectClass, gpointer /*data*/) {
    parentClass = g_type_class_peek_parent(objectClass);
    G_OBJECT_CLASS(objectClass)->finalize = Finalize;
}

// GObject hands out zeroed memory, which is no list: a list has virtual functions.
void InitInstance(GTypeInstance* instance, gpointer /*class*/) {
    new (&reinterpret_cast<USBModemObject*>(instance)->list) usbmodem_lib::USBModemList;
}

}  // namespace

GType usbmodem_object_get_type() {
    static gsize type = 0;
    if (g_once_init_enter(&type)) {
        const GType registered = g_type_register_static_simple(
            G_TYPE_OBJECT, "USBModemObject", sizeof(GObjectClass), InitClass,
            sizeof(USBModemObject), InitInstance, static_cast<GTypeFlags>(0));
        g_once_init_leave(&type, registered);
    }
    return type;
}

USBModemServer::USBModemServer()
    : DBusServer(kUSBModemService, kUSBModemPath, DBUS_BUS_SESSION),
      object_(static_cast<USBModemObject*>(g_object_new(usbmodem_object_get_type(), nullptr))) {}

USBModemServer::~USBModemServer() {
    if (object_ != nullptr) {
        g_object_unref(object_);
    }
}

bool USBModemServer::Initialize() {
    return initialize(usbmodem_object_get_type(), &dbus_glib_usbmodem_object_info,
                      &object_->parent);
}

usbmodem_lib::USBModemList* USBModemServer::GetList() {
    return &object_->list;
}

}  // namespace taviwireless::dbus
