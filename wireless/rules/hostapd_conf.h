// SPDX-License-Identifier: MIT
#ifndef TAVIWIRELESS_WIRELESS_RULES_HOSTAPD_CONF_H
#define TAVIWIRELESS_WIRELESS_RULES_HOSTAPD_CONF_H

#include <taviwireless/wireless.h>

#include <string>

namespace taviwireless::wireless {

// Lines "key=value" as hostapd reads them. A value cannot hold a line break.
class HostapdConf {
  public:
    void Add(const char* key, const std::string& value);
    void Add(const char* key, int32_t value);
    void AddSecret(const char* key, const std::string& value);

    const std::string& Text() const { return text_; }
    // The text with stars in place of the secrets.
    const std::string& Shown() const { return shown_; }
    // Whether a value holds a line break; what follows it would be a setting of its own.
    bool HoldsLineBreak() const { return holdsLineBreak_; }

  private:
    void AddLine(const char* key, const std::string& value, const std::string& shown);

    std::string text_;
    std::string shown_;
    bool holdsLineBreak_ = false;
};

// The main network on the interface.
HostapdConf RenderHostConf(const std::string& interface, const WirelessAPConf& conf);
// The block of the guest network, which is read behind the main one.
HostapdConf RenderGuestConf(const WirelessAPConf& conf);

}  // namespace taviwireless::wireless

#endif
