// SPDX-License-Identifier: MIT
#include "daemon/property.h"

#include <glib.h>

#include <algorithm>
#include <new>

namespace taviwireless::daemon {

namespace {

constexpr const char* kSignatures[] = {"b", "i", "u", "t", "s", "as"};  // as Value has the types
static_assert(std::size(kSignatures) == std::variant_size_v<Value>);

}  // namespace

std::string ShownText(const std::string& text) {
    const size_t begin = std::min(text.find_first_not_of(' '), text.size());
    char* valid = g_utf8_make_valid(text.c_str() + begin, static_cast<gssize>(text.size() - begin));
    std::string result = valid;
    g_free(valid);
    return result;
}

void MessageWriter::Check(dbus_bool_t isDone) {
    if (isDone == FALSE) {
        throw std::bad_alloc();
    }
}

void MessageWriter::Basic(int type, const void* value) {
    Check(dbus_message_iter_append_basic(&place_, type, value));
}

void MessageWriter::Text(const std::string& text, int type) {
    const char* characters = text.c_str();
    Basic(type, &characters);
}

void MessageWriter::Variant(const Value& value) {
    const char* signature = kSignatures[value.index()];
    Container(DBUS_TYPE_VARIANT, signature, [&](MessageWriter& writer) {
        if (const auto* text = std::get_if<std::string>(&value)) {
            writer.Text(*text);
        } else if (const auto* list = std::get_if<std::vector<std::string>>(&value)) {
            writer.Container(DBUS_TYPE_ARRAY, "s", [&](MessageWriter& elements) {
                for (const std::string& element : *list) {
                    elements.Text(element);
                }
            });
        } else if (const auto* flag = std::get_if<bool>(&value)) {
            const dbus_bool_t number = *flag;
            writer.Basic(DBUS_TYPE_BOOLEAN, &number);
        } else {
            // The other types are written as they lie in memory, and a variant has its value there.
            std::visit([&](const auto& number) { writer.Basic(*signature, &number); }, value);
        }
    });
}

void MessageWriter::All(const Properties& properties) {
    Container(DBUS_TYPE_ARRAY, "{sv}", [&](MessageWriter& entries) {
        for (const Property& property : properties) {
            entries.Container(DBUS_TYPE_DICT_ENTRY, nullptr, [&](MessageWriter& entry) {
                entry.Text(property.name);
                entry.Variant(property.value);
            });
        }
    });
}

}  // namespace taviwireless::daemon
