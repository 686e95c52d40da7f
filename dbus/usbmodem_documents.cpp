#include "dbus/usbmodem_documents.h"

#include <sstream>

namespace taviwireless::dbus {

namespace {

using usbmodem_lib::USBModem;

// Values stand in a document as they come, without escapes, and what could not be read is empty:
// front ends read these layouts line by line and know no others.
class Document {
  public:
    explicit Document(USBModem& modem) : modem_(modem) {}

    void Quoted(const char* indent, const char* key, const std::string& value) {
        text_ << indent << '"' << key << "\": \"" << value << "\",\n";
    }
    template <typename T>
    void Bare(const char* indent, const char* key, const T& value) {
        text_ << indent << '"' << key << "\": " << value << ",\n";
    }
    void Line(const char* line) { text_ << line << '\n'; }

    using Query = std::string (USBModem::*)(bool& err);
    std::string Ask(Query query) {
        bool ignored = false;
        return (modem_.*query)(ignored);
    }
    std::string Text() const { return text_.str(); }

  private:
    USBModem& modem_;
    std::ostringstream text_;
};

void AddProfile(Document& document, const char* indent) {
    document.Quoted(indent, "location", document.Ask(&USBModem::GetProfileLocation));
    document.Quoted(indent, "isp", document.Ask(&USBModem::GetProfileISP));
    document.Quoted(indent, "apn", document.Ask(&USBModem::GetProfileAPN));
    document.Quoted(indent, "number", document.Ask(&USBModem::GetProfilePhone));
    document.Quoted(indent, "user", document.Ask(&USBModem::GetProfileUsername));
    document.Quoted(indent, "pass", document.Ask(&USBModem::GetProfilePassword));
    document.Bare(indent, "roaming", document.Ask(&USBModem::GetRoaming));
    const bool takesRoute = document.Ask(&USBModem::GetProfileDefaultGW) == "true";
    document.Line(
        (std::string(indent) + "\"default_gw\": " + (takesRoute ? "true" : "false")).c_str());
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
    bool ignored = false;
    document.Line("{");
    document.Quoted("\t", "id", modem.GetDevId());
    document.Quoted("\t", "product", document.Ask(&USBModem::GetProductName));
    document.Quoted("\t", "vendor", document.Ask(&USBModem::GetVendorName));
    document.Bare("\t", "signal", modem.GetSignalQuality(ignored));
    document.Quoted("\t", "ip", document.Ask(&USBModem::GetNetLocalIP));
    document.Quoted("\t", "carrier", document.Ask(&USBModem::GetDefaultISP));
    document.Quoted("\t", "net_status", document.Ask(&USBModem::GetNetStatus));
    document.Quoted("\t", "sim_status", document.Ask(&USBModem::GetPINStatus));
    document.Bare("\t", "pin_protected", modem.PINGetEnableProtection() != 0 ? "true" : "false");
    document.Bare("\t", "pin_remains", modem.PINGetAttemptRemain());
    document.Bare("\t", "puk_remains", modem.PUKGetAttemptRemain());
    document.Line("\t\"profile\": ");
    document.Line("\t{");
    AddProfile(document, "\t\t");
    document.Line("\t}");
    document.Line("}");
    return document.Text();
}

}  // namespace taviwireless::dbus
