// SPDX-License-Identifier: MIT
#include "dbus/usbmodem_documents.h"

#include <chrono>
#include <functional>
#include <vector>

#include "usbmodem/rules/profile.h"

namespace taviwireless::dbus {

namespace {

namespace profile = usbmodem_lib::profile;
using usbmodem_lib::USBModem;

// Compatible with front ends, which read these layouts line by line and know no others: values
// stand in a document as they come, without escapes, and what could not be read is empty.
//
// Once a modem does not answer any more, the rest of the document is what is known of it: others
// are waiting, and every question to it costs a second or more.
class Document {
  public:
    explicit Document(USBModem& modem) : modem_(&modem) {}

    void Quoted(const char* indent, const char* key, const std::string& value) {
        Bare(indent, key, '"' + value + '"');
    }
    void Bare(const char* indent, const char* key, const std::string& value) {
        Last(indent, key, value + ',');
    }
    void Last(const char* indent, const char* key, const std::string& value) {
        text_ += std::string(indent) + '"' + key + "\": " + value + '\n';
    }
    void Line(const char* line) { text_ += std::string(line) + '\n'; }

    // query(modem, err) returns what is asked for.
    template <typename Query>
    auto Ask(Query query) {
        bool err = false;
        const auto begin = std::chrono::steady_clock::now();
        const auto answer = std::invoke(query, *modem_, err);
        if (err && std::chrono::steady_clock::now() - begin > kPatience && IsMute()) {
            modem_->IncreaseErrorCounter();
            known_ = *modem_;
            known_.CloseFileDevice();  // the copy's; nothing can be asked of it any more
            modem_ = &known_;
        }
        return answer;
    }
    // Asks for a number that is negative when it could not be read.
    int AskNumber(int (USBModem::*query)()) {
        return Ask([query](USBModem& modem, bool& err) {
            const int number = (modem.*query)();
            err = number < 0;
            return number;
        });
    }
    std::string Text() const { return text_; }

  private:
    // Some modems leave a command that they do not know unanswered, but every one answers this.
    bool IsMute() { return modem_->IsError() || modem_->UpdateSIMStatus() < 0; }

    USBModem* modem_;
    USBModem known_{0, ""};
    std::string text_;
};

void AddProfile(Document& document, const char* indent) {
    const std::vector<std::string> keys = {
        profile::kLocation, profile::kISP,      profile::kAPN,           profile::kNumber,
        profile::kUser,     profile::kPassword, profile::kDefaultGateway};
    const std::vector<std::string> values = document.Ask(
        [&keys](USBModem& modem, bool& err) { return modem.GetProfileWithKeys(keys, err); });
    for (size_t i = 0; i + 1 < keys.size(); ++i) {
        document.Quoted(indent, keys[i].c_str(), values[i]);
    }
    document.Bare(indent, profile::kRoaming, document.Ask(&USBModem::GetRoaming));
    document.Last(indent, profile::kDefaultGateway, values.back() == "true" ? "true" : "false");
}

}  // namespace

std::string ProfileDocument(USBModem& modem) {
    Document document(modem);
    document.Line("{");
    AddProfile(document, "\t");
    document.Line("}");
    return document.Text();
}

std::string ModemDocument(USBModem& modem) {
    modem.UpdateNetStatus();
    Document document(modem);
    document.Line("{");
    document.Quoted("\t", "id", modem.GetDevId());
    document.Quoted("\t", "product", document.Ask(&USBModem::GetProductName));
    document.Quoted("\t", "vendor", document.Ask(&USBModem::GetVendorName));
    document.Bare("\t", "signal", std::to_string(document.Ask(&USBModem::GetSignalQuality)));
    document.Quoted("\t", "ip", document.Ask(&USBModem::GetNetLocalIP));
    document.Quoted("\t", "carrier", document.Ask(&USBModem::GetDefaultISP));
    document.Quoted("\t", "net_status", document.Ask(&USBModem::GetNetStatus));
    document.Quoted("\t", "sim_status", document.Ask(&USBModem::GetPINStatus));
    const bool isProtected = document.AskNumber(&USBModem::PINGetEnableProtection) != 0;
    document.Bare("\t", "pin_protected", isProtected ? "true" : "false");
    document.Bare("\t", "pin_remains",
                  std::to_string(document.AskNumber(&USBModem::PINGetAttemptRemain)));
    document.Bare("\t", "puk_remains",
                  std::to_string(document.AskNumber(&USBModem::PUKGetAttemptRemain)));
    document.Line("\t\"profile\": ");
    document.Line("\t{");
    AddProfile(document, "\t\t");
    document.Line("\t}");
    document.Line("}");
    return document.Text();
}

}  // namespace taviwireless::dbus
