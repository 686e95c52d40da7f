// SPDX-License-Identifier: MIT
// What a modem says, on its way through the record and the service's document to the command line.
#include <glib.h>
#include <json/json.h>

#include <algorithm>
#include <cstring>
#include <filesystem>
#include <regex>

#include "base/split.h"
#include "cli/modem/service_document.h"
#include "dbus/usbmodem_methods.h"
#include "tests/fuzz/fuzz.h"
#include "tests/fuzz/modem_line.h"
#include "tests/support/files.h"

namespace taviwireless::fuzz {
namespace {

constexpr char kStateDirectory[] = "/var/lib/usbmodem";

std::string ToUTF8(const std::string& text) {
    char* const valid = g_utf8_make_valid(text.c_str(), static_cast<gssize>(text.size()));
    const std::string result = valid;
    g_free(valid);
    return result;
}

std::string Without(std::string text, const char* characters) {
    const auto isOne = [&](char c) { return c != '\0' && strchr(characters, c) != nullptr; };
    text.erase(std::remove_if(text.begin(), text.end(), isOne), text.end());
    return text;
}

// An answer, with a byte for zero in it and one for the end of a line, so that a mutation has to hit
// one byte for these. A pause counts once, and where the reply is still read: what comes behind any
// other would come behind the draining, with the next reply.
std::string Answer(const std::string& input) {
    std::string text;
    for (const char c : input) {
        text += c == '\x05' ? "\r\n" : std::string(1, c);
    }
    const size_t first = text.find(ModemLine::kPause);
    const size_t kept = first < 1000 ? first + 1 : 0;
    std::replace(text.begin(), text.end(), '\x04', '\0');
    return text.substr(0, kept) + Without(text.substr(kept), "\x01");
}

void CheckReply(ModemLine& line, const std::string& command) {
    std::string reply;
    const int result = line.record.ModemCmd(command, reply);
    Demand(reply.size() <= 1024 && reply.find('\0') == reply.npos, "it is a text", reply);
    const std::string answer = line.answer(command);
    std::string inTime = answer.substr(0, answer.find(ModemLine::kPause));
    const auto isOdd = [](char c, char next) { return c == '\r' && next != '\r' && next != '\n'; };
    if (result != 0 || std::adjacent_find(inTime.begin(), inTime.end(), isOdd) != inTime.end()) {
        return;  // what stands behind a carriage return in a line comes before the next line
    }
    std::replace(inTime.begin(), inTime.end(), '\r', '\n');
    for (const std::string& text : Lines(reply)) {
        Demand(inTime.find(Without(text, "\r") + '\n') != text.npos,
               "a reply holds whole lines of the answer", reply);
        Demand(!text.empty() && text.find(command) == text.npos, "it is no echo", reply);
    }
}

std::string Document(ModemLine& line) {
    char* text = nullptr;
    char id[] = "usbmodem1";
    Demand(dbus::usbmodem_get_usbmodem(line.service, id, &text, nullptr) == TRUE, "it is told of");
    const std::string document = text;
    g_free(text);
    Demand(g_utf8_validate(document.c_str(), -1, nullptr) != FALSE, "it is UTF-8", document);
    test::MakeDirectories(kStateDirectory);
    for (const auto& entry : std::filesystem::directory_iterator(kStateDirectory)) {
        const std::string name = entry.path().filename();
        Demand(std::regex_match(name, std::regex("usbmodem\\.profile\\. *[0-9]{6,15}")),
               "an IMSI names a file", name);
        std::filesystem::remove(entry);
    }
    return document;
}

}  // namespace

void Fuzz(Input input) {
    const unsigned vendor = input.Choice(std::size(ModemLine::kVendors));
    std::map<std::string, std::string> answers;
    bool isPrompt = true;  // else it is asked for its SIM between, or for nothing more
    for (const char* command : {"AT+CPIN?", "AT+CGMM", "AT+CGMI", "AT+CSQ", "AT+COPS?",
                                "AT+CLCK=\"SC\",2", "AT+EPINC?", "AT+CIMI", "AT+CGDCONT?"}) {
        const std::string text = answers[command] = Answer(input.Text());
        isPrompt = isPrompt && !text.empty() && text[0] != ModemLine::kPause && text.size() < 500;
    }
    answers["AT^CPIN?"] = answers["AT+EPINC?"];
    ModemLine line(vendor, [&](const std::string& command) { return answers[command]; });
    CheckReply(line, "AT+CGMM");
    CheckReply(line, "AT+CGMI");
    usbmodem_lib::USBModem twin(1, "");
    twin = line.record;
    line.coming.clear();
    const std::string document = Document(line);
    const cli::ModemState state = cli::ReadModemDocument(document);
    Demand(state.id == "usbmodem1" && state.signal >= 0 && state.signal <= 100 &&
               state.netStatus == "disconnected",
           "it is this modem", document);
    if (!isPrompt) {
        return;
    }
    line.coming.clear();
    bool err = false;  // the same questions in the same order
    const std::string product = ToUTF8(twin.GetProductName(err));
    const std::string maker = ToUTF8(twin.GetVendorName(err));
    const int signal = twin.GetSignalQuality(err);
    const std::string carrier = ToUTF8(twin.GetDefaultISP(err));
    const std::string status = twin.GetPINStatus(err);
    const bool isWhole = carrier.find('\n') == carrier.npos;  // else its line ends there
    Demand(state.product == product && state.vendor == maker && state.signal == signal &&
               (state.carrier == carrier || !isWhole) && state.simStatus == status &&
               state.pinProtected == (twin.GetPINEnable() != 0) &&
               state.pinRemains == twin.PINGetAttemptRemain() &&
               state.pukRemains == twin.PUKGetAttemptRemain(),
           "what the record has is read", document);
    const std::map<std::string, std::string> texts = {{"ready", "+CPIN: READY"},
                                                      {"pin_protect", "+CPIN: SIM PIN"},
                                                      {"puk_protect", "+CPIN: SIM PUK"},
                                                      {"no_sim", ""}};
    Demand(Without(answers["AT+CPIN?"], "\r\n").find(texts.at(status)) != status.npos,
           "the SIM said so", document);
    int rssi = 0;
    int end = 0;  // 0 when the answer has another form
    sscanf(answers["AT+CSQ"].c_str(), "\r\n+CSQ: %2d,99\r\n%n", &rssi, &end);
    Demand(end == 0 || signal == (rssi <= 31 ? rssi * 100 / 31 : 0) || signal == 0,
           "the signal is that of the scale", document);
    answers["AT+CGMM"] = "ERROR\r\n";
    Demand(ToUTF8(twin.GetProductName(err)) == product && err, "what is known stays", document);
    Json::Value json;
    std::istringstream stream(document);
    Demand((product + maker + carrier).find_first_of("\"\\") != product.npos ||
               (Json::parseFromStream(Json::CharReaderBuilder(), stream, &json, nullptr) &&
                json["product"] == product && json["vendor"] == maker &&
                json["carrier"] == carrier && json["signal"] == signal),
           "it is JSON", document);
}

}  // namespace taviwireless::fuzz
