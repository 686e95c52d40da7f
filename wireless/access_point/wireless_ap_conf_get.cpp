// SPDX-License-Identifier: MIT
// Reading the stored settings of the access point.
#include <tavicore/section.h>
#include <taviwireless/wireless.h>

#include <cstdlib>
#include <cstring>

#include "base/fixed_field.h"
#include "common/log.h"
#include "common/sz_hash.h"
#include "wireless/rules/ap_settings.h"
#include "wireless/rules/paths.h"
#include "wireless/system/files.h"
#include "wireless/system/guarded.h"

namespace taviwireless::wireless {

namespace {

// Fills the fields that it visits.
class Reader {
  public:
    explicit Reader(const SzHash& values) : values_(values) {}

    void Flag(const std::string& key, int32_t& field, int32_t otherwise) const {
        const char* value = values_[key.c_str()];
        field = value != nullptr ? strcmp(value, "yes") == 0 : otherwise;
    }
    void Number(const std::string& key, int32_t& field, int32_t otherwise) const {
        const char* value = values_[key.c_str()];
        field = value != nullptr ? static_cast<int32_t>(strtoll(value, nullptr, 10)) : otherwise;
    }
    template <size_t kSize>
    void Text(const std::string& key, char (&field)[kSize], const std::string& otherwise) const {
        const char* value = values_[key.c_str()];
        CopyField(field, value != nullptr ? value : otherwise);
    }
    template <size_t kSize>
    void WriteOnly(const std::string&, const char (&)[kSize]) const {}

  private:
    const SzHash& values_;
};

int Read(const char* section, WirelessAPSettings* settings) {
    if (section == nullptr || settings == nullptr) {
        TAVI_LOG_ERROR("Bad parameters");
        return -1;
    }
    *settings = {};
    CopyField(settings->name, section);
    SzHash values(1024);
    if (!values) {
        return -1;
    }
    // The main network gets its defaults. What concerns guests stays empty until there is a section.
    VisitMainNetwork(DefaultSetter(), *settings);
    if (IsMissing(kAPSettings)) {
        return 0;
    }
    const int result = VEXACFileGetSection(kAPSettings, section, values.Address());
    if (result <= 0) {
        return result;
    }
    const Reader reader(values);
    VisitMainNetwork(reader, *settings);
    VisitGuestNetwork(reader, *settings);
    if (settings->ap.guestSecurity == WIRELESS_AP_WPA_ENTERPRISE) {
        TAVI_LOG_ERROR("Guest Network does not have EAP encryption");
    }
    return result;
}

}  // namespace

}  // namespace taviwireless::wireless

int TAVIWirelessGetAPConfig(const char* section, WirelessAPSettings* settings) {
    return TAVI_GUARDED(-1, [=] { return taviwireless::wireless::Read(section, settings); });
}
