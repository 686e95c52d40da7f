// SPDX-License-Identifier: MIT
#include "dbus/usbmodem_methods.h"

#include <algorithm>
#include <initializer_list>
#include <optional>
#include <string>
#include <vector>

#include "base/sleep_out.h"
#include "base/split.h"
#include "common/log.h"
#include "dbus/usbmodem_documents.h"
#include "usbmodem/profile_value.h"
#include "usbmodem/rules/profile.h"

namespace taviwireless::dbus {

namespace {

namespace profile = usbmodem_lib::profile;
using profile::Setting;
using usbmodem_lib::USBModem;

// The quark that clients know the service's errors by: GLib's own third, which no D-Bus name is
// registered for, so that the error's name holds quark and code.
constexpr GQuark kErrorDomain = 3;
constexpr int kBadParameter = 1;
constexpr int kModemFailed = -1;

constexpr unsigned int kReconnectPause = 3;  // seconds, for the modem to get over the hang-up

// Logs text, at the line of the caller, and makes it the error, which the caller of the method
// sees. Returns FALSE, which is what a method returns then.
gboolean Fail(GError** error, int code, const std::string& text, int line = __builtin_LINE()) {
    WriteLog(LOG_ERR, __FILE_NAME__, line, "%s", text.c_str());
    g_set_error_literal(error, kErrorDomain, code, text.c_str());
    return FALSE;
}

// The modem a method is for: known and ready for use. Null with the error set otherwise, and when
// one of the arguments is missing. line is that of the method.
USBModem* ReadyModem(USBModemObject* object, std::initializer_list<const char*> arguments,
                     GError** error, int line = __builtin_LINE()) {
    bool isComplete = object != nullptr;
    for (const char* argument : arguments) {
        isComplete = isComplete && argument != nullptr;
    }
    if (!isComplete) {
        Fail(error, kBadParameter, "Bad parameter", line);
        return nullptr;
    }
    const std::string devid = *arguments.begin();
    USBModem& modem = object->list.FindUSBModem(devid);
    if (modem.IsNull()) {
        Fail(error, kModemFailed, "USBModem [" + devid + "] not found", line);
        return nullptr;
    }
    if (!modem.IsInited()) {
        Fail(error, kModemFailed, "USBModem [" + devid + "] not inited", line);
        return nullptr;
    }
    return &modem;
}

// The end of a method that changes the SIM: result is the device layer's.
gboolean Finish(int result, const char* failure, const char* devid, GError** error,
                int line = __builtin_LINE()) {
    return result >= 0 ? TRUE
                       : Fail(error, -result, std::string(failure) + " [" + devid + "]", line);
}

// D-Bus carries UTF-8 only; a modem may send anything, and an interface may have any name.
char* ToUTF8(const std::string& text) {
    return g_utf8_make_valid(text.c_str(), static_cast<gssize>(text.size()));
}

// One line per modem that is ready for use.
template <typename Describe>
gboolean ListModems(USBModemObject* object, char** list, GError** error, Describe describe,
                    int line = __builtin_LINE()) {
    if (object == nullptr) {
        return Fail(error, kBadParameter, "Bad parameter", line);
    }
    std::string text;
    for (USBModem& modem : object->list) {
        if (!modem.IsNull() && modem.IsInited()) {
            text += describe(modem) + '\n';
        }
    }
    *list = ToUTF8(text);
    return TRUE;
}

gboolean AnswerDocument(USBModemObject* object, const char* devid, char** document, GError** error,
                        std::string (*describe)(USBModem& modem), int line = __builtin_LINE()) {
    USBModem* modem = ReadyModem(object, {devid}, error, line);
    if (modem == nullptr) {
        return FALSE;
    }
    *document = ToUTF8(describe(*modem));
    return TRUE;
}

// The value as it can be shown: a long one is cut, a character that was cut in two made valid.
std::string Shortened(const std::string& value) {
    if (value.size() < profile::kValueSize) {
        return value;
    }
    char* begin = ToUTF8(value.substr(0, profile::kValueSize));
    const std::string shown = std::string(begin) + "...";
    g_free(begin);
    return shown;
}

gboolean FailToSet(USBModem& modem, const Setting& setting, GError** error,
                   int line = __builtin_LINE()) {
    const auto& [key, value] = setting;
    const std::string shown = key == profile::kPassword ? "***" : Shortened(value);
    return Fail(error, kModemFailed,
                "Failed to set " + modem.GetDevId() + ": (key,value) = (" + key + "," + shown + ")",
                line);
}

// Reads what the lines of a profile set, in their order; of a key that stands in several, the last
// one, so that there is not more to write than there are keys. False with the error set when one
// of them cannot be set.
bool ParseProfile(USBModem& modem, const char* text, std::vector<Setting>& settings,
                  GError** error) {
    for (const std::string& line : Lines(text)) {
        const std::optional<Setting> setting = profile::ParseSetting(line);
        if (!setting) {
            continue;
        }
        if (!usbmodem_lib::IsProfileValue(setting->key, setting->value)) {
            FailToSet(modem, *setting, error);
            return false;
        }
        const auto isSameKey = [&](const Setting& other) { return other.key == setting->key; };
        settings.erase(std::remove_if(settings.begin(), settings.end(), isSameKey), settings.end());
        settings.push_back(*setting);
    }
    return true;
}

}  // namespace

gboolean usbmodem_connect(USBModemObject* object, char* devid, GError** error) {
    USBModem* modem = ReadyModem(object, {devid}, error);
    if (modem == nullptr) {
        return FALSE;
    }
    return modem->NetConnect() == 1
               ? TRUE
               : Fail(error, kModemFailed, std::string("Failed to connect [") + devid + "]");
}

gboolean usbmodem_disconnect(USBModemObject* object, char* devid, GError** error) {
    USBModem* modem = ReadyModem(object, {devid}, error);
    if (modem == nullptr) {
        return FALSE;
    }
    return modem->NetDisconnect() >= 0
               ? TRUE
               : Fail(error, kModemFailed, std::string("Failed to disconnect [") + devid + "]");
}

gboolean usbmodem_get_usbmodem_list(USBModemObject* object, char** list, GError** error) {
    return ListModems(object, list, error, [](USBModem& modem) { return modem.GetDevId(); });
}

gboolean usbmodem_get_usbmodem_if_list(USBModemObject* object, char** list, GError** error) {
    return ListModems(object, list, error, [](USBModem& modem) {
        bool ignored = false;
        return modem.GetNetIFName(ignored);
    });
}

gboolean usbmodem_get_usbmodem(USBModemObject* object, char* devid, char** document,
                               GError** error) {
    return AnswerDocument(object, devid, document, error, ModemDocument);
}

gboolean usbmodem_get_profile(USBModemObject* object, char* devid, char** document,
                              GError** error) {
    return AnswerDocument(object, devid, document, error, ProfileDocument);
}

gboolean usbmodem_set_profile(USBModemObject* object, char* devid, char* profile, GError** error) {
    USBModem* modem = ReadyModem(object, {devid, profile}, error);
    if (modem == nullptr) {
        return FALSE;
    }
    const std::string id = std::string("[") + devid + "]";
    bool isUnknown = false;
    const bool wasConnected = !modem->IsNetDisconnected(isUnknown);
    if (isUnknown) {
        return Fail(error, kModemFailed, "Error on checking net status " + id);
    }
    // Everything is checked before the connection is ended for it.
    std::vector<Setting> settings;
    if (!ParseProfile(*modem, profile, settings, error)) {
        return FALSE;
    }
    if (wasConnected && modem->NetDisconnect() < 0) {
        return Fail(error, kModemFailed, "Failed to disconnect " + id);
    }
    for (const Setting& setting : settings) {
        if (modem->SetProfileWithKey(setting.key, setting.value) < 0) {
            return FailToSet(*modem, setting, error);
        }
    }
    if (wasConnected) {
        // A signal that is to end the service does not cut the pause: the change is completed
        // first.
        const bool wasInterrupted = SleepOut(kReconnectPause);
        const int result = modem->NetConnect();
        if (result < 0) {
            return Fail(error, -result, "Failed to Connect " + id);
        }
        if (wasInterrupted) {
            syslog(LOG_INFO, "%s was connected again with its changed profile", devid);
        }
    }
    return TRUE;
}

gboolean usbmodem_unlock_sim(USBModemObject* object, char* devid, char* pin, GError** error) {
    USBModem* modem = ReadyModem(object, {devid, pin}, error);
    return modem == nullptr ? FALSE
                            : Finish(modem->PINUnlock(pin), "Failed to unlock PIN", devid, error);
}

gboolean usbmodem_unlock_pin(USBModemObject* object, char* devid, char* puk, char* pin,
                             GError** error) {
    USBModem* modem = ReadyModem(object, {devid, puk, pin}, error);
    return modem == nullptr ? FALSE
                            : Finish(modem->PUKSet(puk, pin), "Failed to unlock PIN", devid, error);
}

gboolean usbmodem_set_pin(USBModemObject* object, char* devid, char* oldpin, char* newpin,
                          gboolean protection, GError** error) {
    USBModem* modem = ReadyModem(object, {devid, oldpin, newpin}, error);
    return modem == nullptr ? FALSE
                            : Finish(modem->PINSet(oldpin, newpin, protection != 0),
                                     "Failed to set PIN", devid, error);
}

}  // namespace taviwireless::dbus
