// SPDX-License-Identifier: MIT
#include "cli/modem/bus.h"

#include <new>
#include <utility>

#include "cli/terminal.h"

namespace taviwireless::cli {

std::string BusFailure::Text() const {
    return Printable(error.message != nullptr ? error.message : "");
}

Bus ConnectToBus(BusFailure& failure) {
    Bus bus(dbus_bus_get_private(DBUS_BUS_SESSION, &failure.error));
    if (bus) {
        dbus_connection_set_exit_on_disconnect(bus.get(), FALSE);
    }
    return bus;
}

Message NewCall(const std::string& service, const std::string& path, const std::string& interface,
                const char* method, const std::vector<std::string>& arguments) {
    Message call(
        dbus_message_new_method_call(service.c_str(), path.c_str(), interface.c_str(), method));
    bool isComplete = call != nullptr;
    for (const std::string& argument : arguments) {
        const char* text = argument.c_str();
        isComplete = isComplete && dbus_message_append_args(call.get(), DBUS_TYPE_STRING, &text,
                                                            DBUS_TYPE_INVALID);
    }
    if (!isComplete) {
        throw std::bad_alloc();
    }
    return call;
}

Message Ask(DBusConnection* bus, const Message& call, const char* signature, BusFailure& failure,
            int timeout) {
    Message reply(
        dbus_connection_send_with_reply_and_block(bus, call.get(), timeout, &failure.error));
    return reply && dbus_message_has_signature(reply.get(), signature) ? std::move(reply) : nullptr;
}

DBusMessageIter Content(const Message& reply) {
    DBusMessageIter content;
    dbus_message_iter_init(reply.get(), &content);
    return content;
}

void ForEachEntry(DBusMessageIter dictionary, const SeeEntry& see) {
    DBusMessageIter entry;
    dbus_message_iter_recurse(&dictionary, &entry);
    for (; dbus_message_iter_get_arg_type(&entry) != DBUS_TYPE_INVALID;
         dbus_message_iter_next(&entry)) {
        DBusMessageIter part;
        const char* key = nullptr;
        dbus_message_iter_recurse(&entry, &part);
        dbus_message_iter_get_basic(&part, &key);
        dbus_message_iter_next(&part);
        see(key, part);
    }
}

void ForEachText(DBusMessageIter list, const SeeText& see) {
    if (dbus_message_iter_get_arg_type(&list) != DBUS_TYPE_ARRAY ||
        dbus_message_iter_get_element_type(&list) != DBUS_TYPE_STRING) {
        return;
    }
    DBusMessageIter element;
    dbus_message_iter_recurse(&list, &element);
    for (; dbus_message_iter_get_arg_type(&element) != DBUS_TYPE_INVALID;
         dbus_message_iter_next(&element)) {
        const char* text = nullptr;
        dbus_message_iter_get_basic(&element, &text);
        see(text);
    }
}

}  // namespace taviwireless::cli
