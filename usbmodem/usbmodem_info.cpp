// SPDX-License-Identifier: MIT
// What the modem knows about itself and its network.
#include <json/json.h>
#include <taviwireless/usbmodem.h>
#include <taviwireless/usbmodem_atif.h>

#include <fstream>

#include "common/log.h"
#include "usbmodem/loggable.h"
#include "usbmodem/rules/status.h"
#include "usbmodem/text.h"

namespace taviwireless::usbmodem_lib {

namespace {

constexpr char kAPNDatabase[] = "/usr/tavi/etc/usbmodem/wcdma_list.json";

constexpr int kMinRSSI = 0;
constexpr int kMaxRSSI = 31;
constexpr int kUnknownRSSI = 99;

constexpr int kBusy = 2;

bool IsOnScale(int rssi) {
    return rssi >= kMinRSSI && rssi <= kMaxRSSI;
}

// Whether one of the operators of a location has this name.
bool HasOperator(const Json::Value& location, const std::string& name) {
    if (!location["isp"].isArray()) {
        return false;
    }
    for (const Json::Value& isp : location["isp"]) {
        if (isp.isObject() && isp.isMember("name") &&
            isp["name"].isConvertibleTo(Json::stringValue) && isp["name"].asString() == name) {
            return true;
        }
    }
    return false;
}

// Whether it is 6 to 15 digits, which may have blanks before them.
bool IsIMSI(const std::string& text) {
    const size_t begin = text.find_first_not_of(' ');
    const size_t length = begin == std::string::npos ? 0 : text.size() - begin;
    return length >= 6 && length <= 15 &&
           text.find_first_not_of("0123456789", begin) == std::string::npos;
}

// Returns the id of the first location that lists the operator; empty when none does.
std::string FindLocation(const Json::Value& locations, const std::string& name) {
    if (!locations.isArray()) {
        return "";
    }
    for (const Json::Value& location : locations) {
        if (location.isObject() && location.isMember("id") && location.isMember("isp") &&
            location["id"].isConvertibleTo(Json::stringValue) && HasOperator(location, name)) {
            return location["id"].asString();
        }
    }
    return "";
}

}  // namespace

bool USBModem::Refresh(Command command, Parser parser, std::string& cache,
                       void (*logParseFailure)(const char* reply)) {
    const std::string cmd = (CommandSet().*command)();
    std::string reply;
    if (ModemCmd(cmd, reply) != 0) {
        TAVI_LOG_ERROR("error on sending commmand %s", cmd.c_str());
        return false;
    }
    if ((CommandSet().*parser)(reply, cache) != 0) {
        logParseFailure(LoggableReply(reply).c_str());
        return false;
    }
    return true;
}

std::string USBModem::GetDefaultAPN(bool& err) {
    if (busy_) {
        return defaultAPN_;
    }
    if (simStatus_ != SimStatus::kReady) {
        TAVI_LOG_ERROR("cannot get default APN when PIN is not ready");
        err = true;
    } else if (!Refresh(&USBModem_ATIF::GetATCommandGetDefaultAPN,
                        &USBModem_ATIF::ParseRetStringDefaultAPN, defaultAPN_,
                        [](const char* reply) {
                            TAVI_LOG_ERROR("error on reading default APN, ret: %s", reply);
                        })) {
        err = true;
    }
    return defaultAPN_;
}

std::string USBModem::GetDefaultISP(bool& err) {
    if (busy_) {
        return defaultISP_;
    }
    if (simStatus_ != SimStatus::kReady) {
        defaultISP_.clear();
    } else if (!Refresh(&USBModem_ATIF::GetATCommandGetDefaultISP,
                        &USBModem_ATIF::ParseRetStringDefaultISP, defaultISP_,
                        [](const char* reply) {
                            TAVI_LOG_ERROR("error on reading ISP, ret: %s", reply);
                        })) {
        err = true;
    }
    return defaultISP_;
}

std::string USBModem::GetDefaultLocation(bool& err) {
    bool ispFailed = false;
    const std::string isp = GetDefaultISP(ispFailed);
    err = err || ispFailed;
    if (ispFailed || isp.empty()) {
        TAVI_LOG_ERROR("No ISP");
        return "";
    }
    Json::Value locations;
    if (!ReadAPNData(locations)) {
        TAVI_LOG_ERROR("Failed to read APN data");
        err = true;
        return "";
    }
    err = false;  // alone among the queries, this one also clears it
    return FindLocation(locations, isp);
}

std::string USBModem::GetRoaming(bool& err) {
    if (!busy_ && netStatus_ == NetStatus::kConnected &&
        !Refresh(&USBModem_ATIF::GetATCommandGetRoaming, &USBModem_ATIF::ParseRetStringGetRoaming,
                 roaming_, [](const char*) { TAVI_LOG_ERROR("error on parsing roaming stats"); })) {
        err = true;
    }
    return roaming_;
}

std::string USBModem::GetIMSI(bool& err) {
    if (busy_) {
        return imsi_;
    }
    constexpr auto kLogFailure = [](const char* reply) {
        TAVI_LOG_ERROR("error on parsing string, ret %s", reply);
    };
    std::string imsi;
    if (simStatus_ != SimStatus::kReady ||
        !Refresh(&USBModem_ATIF::GetATCommandGetIMSI, &USBModem_ATIF::ParseRetStringDefaultFormat,
                 imsi, kLogFailure)) {
        err = true;
    } else if (!IsIMSI(imsi)) {
        kLogFailure(LoggableReply(imsi).c_str());  // may be the late echo of another command
        err = true;
    } else {
        imsi_ = imsi;
    }
    return imsi_;
}

std::string USBModem::GetProductName(bool& err) {
    if (!busy_ &&
        !Refresh(&USBModem_ATIF::GetATCommandGetProductName,
                 &USBModem_ATIF::ParseRetStringDefaultFormat, productName_, [](const char* reply) {
                     TAVI_LOG_ERROR("error on parsing product name, ret: [%s]", reply);
                 })) {
        err = true;
    }
    return productName_;
}

std::string USBModem::GetVendorName(bool& err) {
    if (!busy_ &&
        !Refresh(&USBModem_ATIF::GetATCommandGetVendorName,
                 &USBModem_ATIF::ParseRetStringDefaultFormat, vendorName_,
                 [](const char* reply) { TAVI_LOG_ERROR("error on parsing %s", reply); })) {
        err = true;
    }
    return vendorName_;
}

int USBModem::GetRSSI() {
    if (busy_ || simStatus_ != SimStatus::kReady) {
        return 0;
    }
    std::string reply;
    std::string rssi;
    if (ModemCmd(CommandSet().GetATCommandGetRSSI(), reply) != 0 ||
        CommandSet().ParseRetStringGetRSSI(reply, rssi) != 0) {
        return -1;
    }
    rssi_ = ToInt(rssi);
    return 0;
}

int USBModem::GetSignalQuality(bool& err) {
    if (simStatus_ != SimStatus::kReady) {
        return 0;
    }
    if (GetRSSI() != 0) {
        TAVI_LOG_ERROR("error on getting RSSI: %d", rssi_);
        err = true;
        return 0;
    }
    if (rssi_ == kUnknownRSSI) {
        rssi_ = 0;
    }
    if (!IsOnScale(rssi_)) {
        TAVI_LOG_ERROR("returned RSSI %d is not in range %d ~ %d", rssi_, kMinRSSI, kMaxRSSI);
        err = true;
        return 0;
    }
    return rssi_ * 100 / kMaxRSSI;
}

KnownModem USBModem::Known() const {
    const bool isReady = simStatus_ == SimStatus::kReady;
    const bool hasSIM =
        isReady || simStatus_ == SimStatus::kPINRequired || simStatus_ == SimStatus::kPUKRequired;
    // Both are 0 until they are read. A SIM without an attempt for its PUK is of no use any more.
    const bool isCounted = hasSIM && (pinAttemptsRemaining_ > 0 || pukAttemptsRemaining_ > 0);
    const bool isConnected = netStatus_ == NetStatus::kConnected;
    KnownModem known;
    known.vendor = vendorName_;
    known.product = productName_;
    known.carrier = isReady ? defaultISP_ : "";
    known.imsi = imsi_;
    known.signal = isReady && IsOnScale(rssi_) ? rssi_ * 100 / kMaxRSSI : 0;
    known.simStatus = NameOf(simStatus_);
    known.isPINProtected = pinProtection_ != 0;
    known.pinRemains = isCounted ? pinAttemptsRemaining_ : -1;
    known.pukRemains = isCounted && pukAttemptsRemaining_ > 0 ? pukAttemptsRemaining_ : -1;
    known.isRoaming = roaming_ == "true";
    known.netStatus = NameOf(netStatus_);
    known.interface = isConnected ? netIFName_ : "";
    known.address = isConnected ? netLocalIP_ : "";
    known.connectNode = connectNode_;
    known.queryNode = queryNode_;
    return known;
}

int USBModem::SetHardwareFuncLvl(const std::string& level) {
    if (busy_) {
        return kBusy;
    }
    std::string reply;
    if (ModemCmd(CommandSet().GetATCommandGetHardwareFuncLvl(), reply) != 0 ||
        CommandSet().ParseRetStringIsOK(reply) != 0) {
        TAVI_LOG_ERROR("Not support AT+CFUN?, skip setting hardware function lvl");
        return 0;
    }
    if (ModemCmd(CommandSet().GetATCommandSetHardwareFuncLvl(level), reply) != 0) {
        TAVI_LOG_ERROR("error on modem cmd: AT+CFUN=%s", level.c_str());
        return -1;
    }
    if (CommandSet().ParseRetStringIsOK(reply) != 0) {
        TAVI_LOG_ERROR("error on setting hardware function lvl, ret: %s",
                       LoggableReply(reply).c_str());
        return -1;
    }
    return 0;
}

int USBModem::SetUnsolicitedReports(bool enable) {
    if (busy_) {
        return kBusy;
    }
    const std::string query = CommandSet().GetATCommandGetUnsolicitedReports();
    std::string reply;
    std::string setting;
    if (query.empty() || ModemCmd(query, reply) != 0 ||
        CommandSet().ParseRetStringDefaultFormat(reply, setting) != 0) {
        TAVI_LOG_ERROR("skip unsolicited reports setting, not supported");
        return 0;
    }
    // Compatible with earlier releases: the whole reply is searched, not the value alone, so a
    // digit anywhere in it counts.
    if (reply.find(enable ? '1' : '0') != std::string::npos) {
        return 0;
    }
    if (ModemCmd(CommandSet().GetATCommandSetUnsolicitedReports(enable), reply) != 0) {
        TAVI_LOG_ERROR("error on modem cmd: change unsolicited reports setting");
        return -1;
    }
    if (CommandSet().ParseRetStringIsOK(reply) != 0) {
        TAVI_LOG_ERROR("error on changing unsolicited reports setting, ret: %s",
                       LoggableReply(reply).c_str());
        return -1;
    }
    return 0;
}

// The database is read anew for every lookup: it is small, and a changed file is seen at once.
bool USBModem::ReadAPNData(Json::Value& out) {
    std::ifstream file(kAPNDatabase);
    Json::Value root;
    try {
// Deprecated, but stricter than its successor, which takes a trailing comma, "+1" and more.
#pragma GCC diagnostic push
#pragma GCC diagnostic ignored "-Wdeprecated-declarations"
        if (Json::Reader().parse(file, root)) {
#pragma GCC diagnostic pop
            out = root;
            return true;
        }
    } catch (const std::exception&) {
        // nested too deeply, or cannot be read
    }
    TAVI_LOG_ERROR("Failed to parse json file [%s]", kAPNDatabase);
    return false;
}

}  // namespace taviwireless::usbmodem_lib
