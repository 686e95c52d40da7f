// Storing the settings of the access point.
#include <tavicore/section.h>
#include <taviwireless/wireless.h>

#include "common/log.h"
#include "common/sz_hash.h"
#include "wireless/rules/ap_settings.h"
#include "wireless/rules/paths.h"
#include "wireless/system/grep_pattern.h"
#include "wireless/system/guarded.h"
#include "wireless/system/section_store.h"
#include "wireless/system/shell.h"

namespace taviwireless::wireless {

namespace {

constexpr size_t kCommandSize = 1024;

// Puts the fields that it visits into a hash. Settings of which one is missing are not to be
// stored: without its kind of security an encrypted network would be an open one.
class Writer {
  public:
    explicit Writer(SzHash& values) : values_(values) {}

    void Flag(const char* key, int32_t value, int32_t) { Set(key, value ? "yes" : "no"); }
    void Number(const std::string& key, int32_t value, int32_t) { Set(key, std::to_string(value)); }
    void Text(const std::string& key, const char* value, const std::string&) { Set(key, value); }
    void WriteOnly(const char* key, const char* value) { Set(key, value); }

    bool IsComplete() const { return isComplete_; }

  private:
    void Set(const std::string& key, const std::string& value) {
        isComplete_ = values_.Set(key.c_str(), value) && isComplete_;
    }

    SzHash& values_;
    bool isComplete_ = true;
};

// The text for use between double quotes of the shell.
std::string ForShell(const std::string& text) {
    std::string quoted;
    for (const char c : text) {
        if (c == '$' || c == '`' || c == '"' || c == '\\') {
            quoted += '\\';
        }
        quoted += c;
    }
    return quoted;
}

// Whether the SDK can read the section. grep does not print a line that is no valid text, such as a
// product's name that was cut off within a character.
bool IsReadable(const char* section) {
    SzHash values(1024);
    return values && VEXACFileGetSection(kAPSettings, section, values.Address()) > 0;
}

// Whether "[section]" stands anywhere in the file, in any case; a value that holds it counts as
// well, and then there is no section to replace.
Found FindSection(const char* section) {
    const Found store = FindStore(kAPSettings, __FILE_NAME__, __LINE__);
    if (store != Found::kExisting) {
        return store;
    }
    const Pipe lines(Command(kCommandSize, {"grep -i \"\\[", ForShell(GrepPattern(section)).c_str(),
                                            "\\]\" ", kAPSettings}));
    if (!lines) {
        TAVI_LOG_ERROR("Failed to execute command");
        return Found::kFailed;
    }
    const bool isListed = fgetc(lines.get()) != EOF;
    return isListed || IsReadable(section) ? Found::kExisting : Found::kNew;
}

int SwitchOff(const char* section) {
    if (VEXACFileSetSectionValue(kAPSettings, section, "enable", "no", kSectionLine) < 0) {
        TAVI_LOG_ERROR("Failed to set key[%s] of sec[%s] in file[%s].", "enable", section,
                       kAPSettings);
        return 0;
    }
    return 1;
}

bool IsKindStorable(int32_t kind) {
    if (kind < WIRELESS_AP_OPEN || kind > WIRELESS_AP_WPA_ENTERPRISE) {
        TAVI_LOG_ERROR("Wrong encryption");
        return false;
    }
    return true;
}

bool IsSecurityStorable(const WirelessAPConf& ap) {
    if (!IsKindStorable(ap.security)) {
        return false;
    }
    if (ap.guestSecurity == WIRELESS_AP_WPA_ENTERPRISE) {
        TAVI_LOG_ERROR("Guest Network does not have EAP encryption");
        return false;
    }
    return IsKindStorable(ap.guestSecurity);
}

int Store(const WirelessAPSettings* settings) {
    if (settings == nullptr) {
        TAVI_LOG_ERROR("Bad parameters");
        return 0;
    }
    SzHash values(1024);
    if (!values) {
        TAVI_LOG_ERROR("Failed to alloc memory");
        return 0;
    }
    const Found found = FindSection(settings->name);
    if (found == Found::kFailed) {
        return 0;
    }
    if (settings->enabled == 0) {
        return SwitchOff(settings->name);
    }
    if (!IsSecurityStorable(settings->ap)) {
        return 0;
    }
    Writer writer(values);
    VisitMainNetwork(writer, *settings);
    VisitGuestNetwork(writer, *settings);
    if (!writer.IsComplete()) {
        TAVI_LOG_ERROR("Failed to alloc memory");
        return 0;
    }
    return SaveSection(kAPSettings, found, settings->name, values, __FILE_NAME__, __LINE__);
}

}  // namespace

}  // namespace taviwireless::wireless

int TAVIWirelessSetAPConfig(const WirelessAPSettings* settings) {
    return TAVI_GUARDED(0, [settings] { return taviwireless::wireless::Store(settings); });
}
