// SPDX-License-Identifier: MIT
#include <taviwireless/dbus_client.h>

#include <cstdlib>
#include <cstring>
#include <memory>

#include "common/log.h"

namespace taviwireless::dbus {

namespace {

// How a GLib service sends an error whose domain has no D-Bus name; the code follows, as an
// unsigned number.
constexpr char kErrorPrefix[] =
    "org.freedesktop.DBus.GLib.UnmappedError.GTypePrivateDependantsArray.Code";

class Error {
  public:
    Error() { dbus_error_init(&error_); }
    ~Error() { dbus_error_free(&error_); }
    Error(const Error&) = delete;
    Error& operator=(const Error&) = delete;

    DBusError* Address() { return &error_; }
    const char* Message() const { return error_.message != nullptr ? error_.message : ""; }

    // The service's code; 1 for every other error. Read as a 64-bit number, since sscanf would make
    // something else of 4294967295 where long has 32 bits.
    int Code() const {
        const size_t length = sizeof kErrorPrefix - 1;
        if (error_.name == nullptr || strncmp(error_.name, kErrorPrefix, length) != 0) {
            return 1;
        }
        char* end = nullptr;
        const long long code = strtoll(error_.name + length, &end, 10);
        return end == error_.name + length ? 1 : static_cast<int>(code);  // 4294967295 is -1
    }

  private:
    DBusError error_;
};

DBusConnection* SharedConnection(DBusBusType type) {
    Error error;
    DBusConnection* connection = dbus_bus_get(type, error.Address());
    constexpr int kWithoutWaiting = 0;
    if (connection == nullptr || dbus_connection_read_write(connection, kWithoutWaiting)) {
        return connection;
    }
    // The bus went away. libdbus hands out the dead connection until its end was dispatched, which
    // a front end without a main loop never does.
    dbus_connection_set_exit_on_disconnect(connection, FALSE);
    while (dbus_connection_dispatch(connection) == DBUS_DISPATCH_DATA_REMAINS) {
    }
    dbus_connection_unref(connection);
    return dbus_bus_get(type, nullptr);
}

void Drop(DBusMessage*& message) {
    if (message != nullptr) {
        dbus_message_unref(message);
        message = nullptr;
    }
}

bool IsText(int type) {
    return type == DBUS_TYPE_STRING || type == DBUS_TYPE_OBJECT_PATH || type == DBUS_TYPE_SIGNATURE;
}

}  // namespace

DBusClient::DBusClient(const char* service, const char* path, const char* interface,
                       DBusBusType type)
    : service_(service), path_(path), interface_(interface), busType_(type) {
    connection_ = SharedConnection(busType_);
    if (connection_ == nullptr) {
        TAVI_LOG_ERROR("Failed to get bus connection");
    }
}

DBusClient::~DBusClient() {
    Drop(message_);
    Drop(reply_);
    if (connection_ != nullptr) {
        dbus_connection_unref(connection_);
    }
}

int DBusClient::NewMessage(const char* method) {
    if (method == nullptr) {
        TAVI_LOG_ERROR("Method name is null");
        return -1;
    }
    if (connection_ == nullptr) {
        return -1;
    }
    Drop(message_);
    // libdbus aborts the process for a name that D-Bus does not allow, so names are checked here.
    if (dbus_validate_bus_name(service_.c_str(), nullptr) &&
        dbus_validate_path(path_.c_str(), nullptr) &&
        dbus_validate_interface(interface_.c_str(), nullptr) &&
        dbus_validate_member(method, nullptr)) {
        message_ = dbus_message_new_method_call(service_.c_str(), path_.c_str(), interface_.c_str(),
                                                method);
    }
    if (message_ == nullptr) {
        TAVI_LOG_ERROR("Failed to create message (%s)", method);
        return -1;
    }
    return 0;
}

int DBusClient::Append(const char* value) {
    if (message_ == nullptr) {
        TAVI_LOG_ERROR("Message is null");
        return -1;
    }
    // libdbus aborts the process when a text is not UTF-8.
    if (value == nullptr || !dbus_validate_utf8(value, nullptr) ||
        !dbus_message_append_args(message_, DBUS_TYPE_STRING, &value, DBUS_TYPE_INVALID)) {
        TAVI_LOG_ERROR("Failed to append args (string:%s)", "***");  // it may be a PIN or password
        return -1;
    }
    return 0;
}

int DBusClient::Append(bool value) {
    if (message_ == nullptr) {
        TAVI_LOG_ERROR("Message is null");
        return -1;
    }
    const dbus_bool_t argument = value;
    if (!dbus_message_append_args(message_, DBUS_TYPE_BOOLEAN, &argument, DBUS_TYPE_INVALID)) {
        TAVI_LOG_ERROR("Failed to append args (boolean:%d)", value);
        return -1;
    }
    return 0;
}

int DBusClient::SendMessage(bool wantReply, int timeout) {
    Drop(reply_);
    if (message_ != nullptr && dbus_message_get_serial(message_) != 0) {
        // This message was sent before; libdbus aborts the process when such a message is changed.
        DBusMessage* copy = dbus_message_copy(message_);
        Drop(message_);
        message_ = copy;
    }
    const bool canSend = connection_ != nullptr && message_ != nullptr;
    if (wantReply) {
        Error error;
        if (canSend) {
            dbus_message_set_no_reply(message_, FALSE);  // as it may have been sent before
            reply_ = dbus_connection_send_with_reply_and_block(connection_, message_, timeout,
                                                               error.Address());
        }
        if (reply_ == nullptr) {
            const int result = static_cast<int>(0u - static_cast<unsigned int>(error.Code()));
            TAVI_LOG_ERROR("Failed to send message: %s (%d)", error.Message(), result);
            return result;
        }
        return 0;
    }
    if (canSend) {
        dbus_message_set_no_reply(message_, TRUE);
    }
    if (!canSend || !dbus_connection_send(connection_, message_, nullptr)) {
        TAVI_LOG_ERROR("Failed to send message");
        return -1;
    }
    dbus_connection_flush(connection_);
    return 0;
}

int DBusClient::GetReply(std::string& out) {
    if (reply_ == nullptr) {
        TAVI_LOG_ERROR("Reply message is null");
        return -1;
    }
    int result = -1;
    DBusMessageIter argument;
    dbus_message_iter_init(reply_, &argument);
    if (dbus_message_iter_get_arg_type(&argument) != DBUS_TYPE_STRING) {
        TAVI_LOG_ERROR("Replied value is not a string");
    } else {
        Error error;
        const char* text = nullptr;
        if (dbus_message_get_args(reply_, error.Address(), DBUS_TYPE_STRING, &text,
                                  DBUS_TYPE_INVALID)) {
            out = text;
            result = 0;
        } else {
            TAVI_LOG_ERROR("Failed to get reply value: %s", error.Message());
        }
    }
    Drop(reply_);
    return result;
}

int DBusClient::GetReply(std::vector<std::string>& out) {
    if (reply_ == nullptr) {
        TAVI_LOG_ERROR("Reply message is null");
        return -1;
    }
    int result = -1;
    DBusMessageIter argument;
    dbus_message_iter_init(reply_, &argument);
    if (dbus_message_iter_get_arg_type(&argument) == DBUS_TYPE_ARRAY) {
        out.clear();
        DBusMessageIter element;
        dbus_message_iter_recurse(&argument, &element);
        // Reading ends at the first element that is no text: it has no characters to read.
        while (IsText(dbus_message_iter_get_arg_type(&element))) {
            const char* text = nullptr;
            dbus_message_iter_get_basic(&element, &text);
            out.emplace_back(text);
            dbus_message_iter_next(&element);
        }
        result = 0;
    } else {
        TAVI_LOG_ERROR("Replied value is not an array ");
    }
    Drop(reply_);
    return result;
}

}  // namespace taviwireless::dbus
