// SPDX-License-Identifier: MIT
// The connection profile of the SIM: one section file per IMSI.
#include <sys/stat.h>
#include <tavicore/file.h>
#include <tavicore/section.h>
#include <taviwireless/usbmodem.h>
#include <unistd.h>

#include <cerrno>
#include <cstring>

#include "common/log.h"
#include "common/sz_hash.h"
#include "usbmodem/profile_value.h"
#include "usbmodem/rules/paths.h"
#include "usbmodem/rules/profile.h"
#include "usbmodem/rules/status.h"
#include "usbmodem/state_files.h"

namespace taviwireless::usbmodem_lib {

namespace {

constexpr char kSection[] = "USBModem Profile";
constexpr char kLineFormat[] = "%s=%s\n";
constexpr mode_t kDirectoryMode = 0775;

// An empty file counts as missing: a full disk leaves one.
bool IsMissing(const std::string& path) {
    struct stat status {};
    return stat(path.c_str(), &status) == 0 ? status.st_size == 0 : errno == ENOENT;
}

// Removed in the end, however that comes, unless it was given another name.
struct RemovedFile {
    const std::string& path;
    ~RemovedFile() { unlink(path.c_str()); }
};

}  // namespace

bool USBModem::ComputeProfilePath() {
    bool failed = false;
    const std::string imsi = GetIMSI(failed);
    // While busy, an IMSI that was never asked for is empty without an error.
    profilePath_ = failed || imsi.empty() ? "" : ProfilePath(imsi);
    return !profilePath_.empty();
}

int USBModem::ResetProfile() {
    if (!ComputeProfilePath()) {
        return -1;
    }
    if (VEXACFileCheckDir(kStateDirectory) != 1 && mkdir(kStateDirectory, kDirectoryMode) != 0) {
        TAVI_LOG_ERROR("Error on reset profile: makedir %s failed", kStateDirectory);
        return -1;
    }
    const char* path = profilePath_.c_str();
    // Made beside the old one, which stays until this one is whole. Closed to others before the
    // first byte is in it; every later write keeps the mode.
    const std::string newPath = profilePath_ + ".new";
    const RemovedFile removed{newPath};
    if (!MakeEmptyFile(newPath)) {
        TAVI_LOG_ERROR("Error on reset profile: touch profile %s", path);
    }
    SzHash profile(1024);
    if (!profile) {
        TAVI_LOG_ERROR("Error on reset profile: hash alloc");
        return -1;
    }
    if (!FillDefaults(profile) ||
        VEXACFileAddSection(newPath.c_str(), kSection, profile.Get(), kLineFormat) != 1 ||
        chmod(newPath.c_str(), kStateFileMode) != 0 ||  // it may be made only here
        VEXACSysRename(newPath.c_str(), path) != 0) {
        TAVI_LOG_ERROR("Error on reset profile: section %s in profile %s", kSection, path);
        return -1;
    }
    return 0;
}

// Query errors are ignored: an empty value is written as it is, and in the place of what a profile
// cannot hold, such as an operator's name with a line break. False when there is no memory for them.
bool USBModem::FillDefaults(SzHash& values) {
    bool isFilled = true;
    const auto set = [&](const char* key, const std::string& value) {
        isFilled = values.Set(key, IsProfileValue(key, value) ? value : "") && isFilled;
    };
    bool ignored = false;
    set(profile::kNumber, profile::kDefaultNumber);
    set(profile::kUser, profile::kDefaultUser);
    set(profile::kPassword, profile::kDefaultUser);
    set(profile::kIMSI, GetIMSI(ignored));
    set(profile::kDefaultGateway, "false");
    set(profile::kLocation, GetDefaultLocation(ignored));
    const std::string isp = GetDefaultISP(ignored);
    const std::string apn = GetDefaultAPN(ignored);
    set(profile::kAPN, apn);
    set(profile::kISP, isp.empty() || apn.empty() ? isp : isp + " - " + apn);
    return isFilled;
}

int USBModem::SetProfileToDefault() {
    return ResetProfile();
}

int USBModem::InitProfile() {
    if (profilePath_.empty() && !ComputeProfilePath()) {
        return -1;
    }
    if (IsMissing(profilePath_) && ResetProfile() < 0) {
        TAVI_LOG_ERROR("Error on init profile: reset %s", profilePath_.c_str());
        return -1;
    }
    if (chmod(profilePath_.c_str(), kStateFileMode) != 0) {
        TAVI_LOG_ERROR("Failed to chmod for file [%s]", profilePath_.c_str());
        return -1;
    }
    return 0;
}

int USBModem::SetProfileWithKey(const std::string& key, const std::string& value) {
    if (InitProfile() < 0) {
        TAVI_LOG_ERROR("failed on init profile");
        return -1;
    }
    if (!IsProfileValue(key, value) ||
        VEXACFileSetSectionValue(profilePath_.c_str(), kSection, key.c_str(), value.c_str(),
                                 kLineFormat) != 0) {
        TAVI_LOG_ERROR("failed on get key value %s", key.c_str());  // compatible: "get"
        return -1;
    }
    return 0;
}

std::string USBModem::GetProfileWithKey(const std::string& key, bool& err) {
    if (simStatus_ == SimStatus::kBusy || simStatus_ == SimStatus::kError) {
        return "";
    }
    if (simStatus_ < SimStatus::kReady || simStatus_ > SimStatus::kError) {
        TAVI_LOG_ERROR("sim status is busy or error, cannot get key %s", key.c_str());
        err = true;
    }
    char value[profile::kValueSize] = {};
    if (InitProfile() == 0 && VEXACFileGetSectionValue(profilePath_.c_str(), kSection, key.c_str(),
                                                       value, sizeof value) != 0) {
        TAVI_LOG_ERROR("failed on get key value %s", key.c_str());
        err = true;
    }
    return value;
}

std::vector<std::string> USBModem::GetProfileWithKeys(const std::vector<std::string>& keys,
                                                      bool& err) {
    std::vector<std::string> values(keys.size());
    if (simStatus_ == SimStatus::kBusy || simStatus_ == SimStatus::kError) {
        return values;
    }
    const bool isUnknown = simStatus_ < SimStatus::kReady || simStatus_ > SimStatus::kError;
    const bool hasProfile = InitProfile() == 0;
    SzHash pairs(64);
    if (hasProfile) {  // a failure shows in each key
        VEXACFileGetSection(profilePath_.c_str(), kSection, pairs.Address());
    }
    for (size_t i = 0; i < keys.size(); ++i) {
        const char* key = keys[i].c_str();
        const char* value = pairs[key];
        if (isUnknown) {
            TAVI_LOG_ERROR("sim status is busy or error, cannot get key %s", key);
            err = true;
        }
        if (value != nullptr && strlen(value) < profile::kValueSize) {
            values[i] = value;
        } else if (hasProfile) {
            TAVI_LOG_ERROR("failed on get key value %s", key);
            err = true;
        }
    }
    return values;
}

int USBModem::SetProfilePhone(const std::string& number) {
    return SetProfileWithKey(profile::kNumber, number);
}

std::string USBModem::GetProfilePhone(bool& err) {
    return GetProfileWithKey(profile::kNumber, err);
}

int USBModem::SetProfileUsername(const std::string& user) {
    return SetProfileWithKey(profile::kUser, user);
}

std::string USBModem::GetProfileUsername(bool& err) {
    return GetProfileWithKey(profile::kUser, err);
}

int USBModem::SetProfilePassword(const std::string& password) {
    return SetProfileWithKey(profile::kPassword, password);
}

std::string USBModem::GetProfilePassword(bool& err) {
    return GetProfileWithKey(profile::kPassword, err);
}

int USBModem::SetProfileAPN(const std::string& apn) {
    return SetProfileWithKey(profile::kAPN, apn);
}

std::string USBModem::GetProfileAPN(bool& err) {
    return GetProfileWithKey(profile::kAPN, err);
}

int USBModem::SetProfileISP(const std::string& isp) {
    return SetProfileWithKey(profile::kISP, isp);
}

std::string USBModem::GetProfileISP(bool& err) {
    return GetProfileWithKey(profile::kISP, err);
}

int USBModem::SetProfileLocation(const std::string& location) {
    return SetProfileWithKey(profile::kLocation, location);
}

std::string USBModem::GetProfileLocation(bool& err) {
    return GetProfileWithKey(profile::kLocation, err);
}

int USBModem::SetProfileDefaultGW(const std::string& flag) {
    return SetProfileWithKey(profile::kDefaultGateway, flag);
}

std::string USBModem::GetProfileDefaultGW(bool& err) {
    return GetProfileWithKey(profile::kDefaultGateway, err);
}

std::string USBModem::GetProfileIMSI(bool& err) {
    return GetProfileWithKey(profile::kIMSI, err);
}

}  // namespace taviwireless::usbmodem_lib
