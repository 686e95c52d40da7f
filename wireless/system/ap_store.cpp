// SPDX-License-Identifier: MIT
#include "wireless/system/ap_store.h"

#include <tavicore/section.h>

#include "common/log.h"
#include "common/sz_hash.h"
#include "wireless/rules/ap_settings.h"
#include "wireless/rules/paths.h"
#include "wireless/system/grep_pattern.h"
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

}  // namespace

Found FindAPSection(const char* section, const char* file, int line) {
    const Found store = FindStore(kAPSettings, file, line);
    if (store != Found::kExisting) {
        return store;
    }
    const Pipe lines(Command(kCommandSize, {"grep -i \"\\[", ForShell(GrepPattern(section)).c_str(),
                                            "\\]\" ", kAPSettings}));
    if (!lines) {
        WriteLog(LOG_ERR, file, line, "Failed to execute command");
        return Found::kFailed;
    }
    const bool isListed = fgetc(lines.get()) != EOF;
    return isListed || IsReadable(section) ? Found::kExisting : Found::kNew;
}

bool SaveAPSettings(const WirelessAPSettings& settings, Found found, const char* file, int line) {
    SzHash values(1024);
    Writer writer(values);
    if (values) {
        VisitMainNetwork(writer, settings);
        VisitGuestNetwork(writer, settings);
    }
    if (!values || !writer.IsComplete()) {
        WriteLog(LOG_ERR, file, line, "Failed to alloc memory");
        return false;
    }
    return found != Found::kFailed &&
           SaveSection(kAPSettings, found, settings.name, values, file, line);
}

}  // namespace taviwireless::wireless
