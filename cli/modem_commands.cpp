// taviwireless modem: the USB modems that are plugged in.
#include <json/json.h>
#include <taviwireless/usbmodem_list.h>

#include <CLI/CLI.hpp>
#include <iostream>
#include <map>
#include <memory>
#include <optional>

#include "cli/commands.h"
#include "cli/output.h"
#include "cli/plugged_modem.h"

namespace taviwireless::cli {

namespace {

using usbmodem_lib::USBModem;
using usbmodem_lib::USBModemList;

// What is known of a modem after it was asked. Nothing where the modem gave no answer.
struct ModemState {
    std::string id;
    std::optional<std::string> vendor;
    std::optional<std::string> product;
    std::optional<std::string> imsi;
    std::optional<std::string> carrier;
    std::optional<std::string> location;
    std::optional<std::string> apn;
    std::optional<int> signal;  // percent
    std::string sim;            // "ready", "pin_protect", "puk_protect", "no_sim", "no_answer"
    std::optional<bool> pinProtected;
    std::optional<int> pinAttempts;
    std::optional<int> pukAttempts;
};

using TextQuery = std::string (USBModem::*)(bool& err);

std::optional<std::string> Ask(USBModem& modem, TextQuery query) {
    bool failed = false;
    std::string answer = (modem.*query)(failed);
    const size_t begin = answer.find_first_not_of(' ');  // the layer keeps blanks of "+CGMI: NAME"
    if (failed || begin == std::string::npos) {
        return std::nullopt;
    }
    return answer.substr(begin);
}

std::optional<int> UnlessNegative(int number) {
    return number < 0 ? std::nullopt : std::optional<int>(number);
}

void AskReadySIM(USBModem& modem, ModemState& state) {
    state.imsi = Ask(modem, &USBModem::GetIMSI);
    state.carrier = Ask(modem, &USBModem::GetDefaultISP);
    state.apn = Ask(modem, &USBModem::GetDefaultAPN);
    bool failed = false;
    const int signal = modem.GetSignalQuality(failed);
    if (!failed) {
        state.signal = signal;
    }
}

// Asks everything; a modem that does not answer costs up to six seconds.
ModemState Read(USBModem& modem) {
    ModemState state;
    state.id = modem.GetDevId();
    ShowProgress("Finding the ports of " + state.id + " ...");
    if (!modem.IsInited() && modem.InitInfo() != 0) {
        state.sim = "no_answer";
        return state;
    }
    ShowProgress("Reading " + state.id + " ...");
    state.vendor = Ask(modem, &USBModem::GetVendorName);
    state.product = Ask(modem, &USBModem::GetProductName);
    bool failed = false;
    state.sim = modem.GetPINStatus(failed);
    if (state.sim == "ready") {
        AskReadySIM(modem, state);
    }
    if (state.sim != "no_sim") {
        const int protection = modem.PINGetEnableProtection();
        if (protection >= 0) {
            state.pinProtected = protection != 0;
        }
        state.pinAttempts = UnlessNegative(modem.PINGetAttemptRemain());
        state.pukAttempts = UnlessNegative(modem.PUKGetAttemptRemain());
    }
    return state;
}

template <typename T>
Json::Value OrNull(const std::optional<T>& value) {
    return value ? Json::Value(*value) : Json::Value();
}

Json::Value ToJson(const ModemState& state) {
    Json::Value document;
    document["id"] = state.id;
    document["vendor"] = OrNull(state.vendor);
    document["product"] = OrNull(state.product);
    document["imsi"] = OrNull(state.imsi);
    document["carrier"] = OrNull(state.carrier);
    document["location"] = OrNull(state.location);
    document["apn"] = OrNull(state.apn);
    document["signal"] = OrNull(state.signal);
    document["sim_status"] = state.sim;
    document["pin_protected"] = OrNull(state.pinProtected);
    document["pin_remains"] = OrNull(state.pinAttempts);
    document["puk_remains"] = OrNull(state.pukAttempts);
    return document;
}

std::string Cell(const std::optional<std::string>& text) {
    return text ? Printable(*text) : "-";
}

std::string Cell(const std::optional<int>& number, const char* unit = "") {
    return number ? std::to_string(*number) + unit : "-";
}

std::string SIMText(const std::string& status) {
    static const std::map<std::string, std::string> texts = {
        {"ready", "ready"},
        {"pin_protect", "wants PIN"},
        {"puk_protect", "wants PUK"},
        {"no_sim", "no SIM"},
        {"no_answer", "modem does not answer"}};
    return texts.at(status);
}

std::string ProtectionText(const std::optional<bool>& on) {
    return on ? (*on ? "on" : "off") : "-";
}

std::string AttemptsText(const ModemState& state) {
    return Cell(state.pinAttempts) + " / " + Cell(state.pukAttempts);
}

void List(const Options& options) {
    USBModemList list;
    FindModems(list);
    // Each modem is initialised on its own: one that is dead does not hide those behind it.
    Json::Value documents(Json::arrayValue);
    Table table{{"DEVICE", "VENDOR", "PRODUCT", "IMSI", "OPERATOR", "SIGNAL", "SIM", "PIN LOCK",
                 "PIN/PUK LEFT"}};
    for (USBModem& modem : list) {
        const ModemState state = Read(modem);
        documents.append(ToJson(state));
        table.push_back({state.id, Cell(state.vendor), Cell(state.product), Cell(state.imsi),
                         Cell(state.carrier), Cell(state.signal, "%"), SIMText(state.sim),
                         ProtectionText(state.pinProtected), AttemptsText(state)});
    }
    ShowProgress("");
    if (options.json) {
        Print(documents);
    } else if (table.size() == 1) {
        std::cout << "No modem is plugged in: there is no usbmodem.info file in /tmp/.\n";
    } else {
        Print(table);
    }
}

void Show(const Options& options, const std::string& id) {
    USBModemList list;
    USBModem& modem = InitialisedModem(list, id);
    ModemState state = Read(modem);
    if (state.carrier) {
        state.location = Ask(modem, &USBModem::GetDefaultLocation);
    }
    ShowProgress("");
    if (options.json) {
        Print(ToJson(state));
    } else {
        Print(Table{{"Device", state.id},
                    {"Vendor", Cell(state.vendor)},
                    {"Product", Cell(state.product)},
                    {"SIM", SIMText(state.sim)},
                    {"IMSI", Cell(state.imsi)},
                    {"Operator", Cell(state.carrier)},
                    {"Location", Cell(state.location)},
                    {"APN", Cell(state.apn)},
                    {"Signal", Cell(state.signal, "%")},
                    {"PIN lock", ProtectionText(state.pinProtected)},
                    {"PIN attempts", Cell(state.pinAttempts)},
                    {"PUK attempts", Cell(state.pukAttempts)}});
    }
}

}  // namespace

void AddModemCommands(CLI::App& app, const Options& options) {
    CLI::App* modem = app.add_subcommand("modem", "USB modems that are plugged in");
    modem->require_subcommand(1);
    modem->fallthrough();

    modem->add_subcommand("list", "List the modems and what they say of themselves")
        ->callback([&options] { List(options); });

    CLI::App* show = modem->add_subcommand("show", "Show one modem");
    auto id = std::make_shared<std::string>();
    show->add_option("ID", *id, "Device id, such as usbmodem0")->required();
    show->callback([&options, id] { Show(options, *id); });

    AddProfileCommands(*modem, options);
    AddConnectionCommands(*modem, options);
}

}  // namespace taviwireless::cli
