// SPDX-License-Identifier: MIT
#ifndef TAVIWIRELESS_DAEMON_PROPERTY_H
#define TAVIWIRELESS_DAEMON_PROPERTY_H

#include <dbus/dbus.h>

#include <cstdint>
#include <string>
#include <variant>
#include <vector>

namespace taviwireless::daemon {

// The types of D-Bus that properties have: b, i, u, t, s and as.
using Value = std::variant<bool, std::int32_t, std::uint32_t, std::uint64_t, std::string,
                           std::vector<std::string>>;

struct Property {
    const char* name;
    Value value;
    bool isTold = true;  // by PropertiesChanged
};

using Properties = std::vector<Property>;

// Without the blanks that modems put in front, and as D-Bus carries it.
std::string ShownText(const std::string& text);

// Writes what one reads of a message: arguments of it, or the elements of a container. Everything
// throws std::bad_alloc.
class MessageWriter {
  public:
    explicit MessageWriter(DBusMessage* message) {
        dbus_message_iter_init_append(message, &place_);
    }

    void Text(const std::string& text, int type = DBUS_TYPE_STRING);
    void Variant(const Value& value);        // v
    void All(const Properties& properties);  // a{sv}

    // Has write(writer) write the elements of a container. The signature is that of the elements;
    // of a struct or a dict entry nullptr.
    template <typename Write>
    void Container(int type, const char* signature, Write write) {
        MessageWriter elements;
        Check(dbus_message_iter_open_container(&place_, type, signature, &elements.place_));
        write(elements);
        Check(dbus_message_iter_close_container(&place_, &elements.place_));
    }

  private:
    MessageWriter() = default;
    static void Check(dbus_bool_t isDone);
    void Basic(int type, const void* value);

    DBusMessageIter place_{};
};

}  // namespace taviwireless::daemon

#endif
