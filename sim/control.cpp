// SPDX-License-Identifier: MIT
#include "sim/control.h"

#include <json/reader.h>
#include <json/writer.h>

#include <cstdio>
#include <memory>
#include <optional>
#include <stdexcept>

#include "sim/user_text.h"

namespace taviwireless::sim {

struct Control::Verb {
    const char* name;
    const char* arguments;
    const char* meaning;
    std::string (Control::*run)(std::string rest);
};

// ID names a modem, ID.K its port K (from 0, in the order of its ports).
struct Control::Target {
    SimulatedModem& modem;
    std::optional<size_t> port;

    template <typename Function>
    void ForEachPort(Function function) const {
        for (size_t index = 0; index < modem.Ports().size(); ++index) {
            if (!port || *port == index) {
                function(modem.Ports()[index]);
            }
        }
    }
};

const Control::Verb Control::kVerbs[] = {
    {"fault", "ID[.PORT] FAULT|off", "makes a modem or one port misbehave, or behave again",
     &Control::Fault},
    {"set", "ID NAME VALUE", "changes a setting, as in --modem", &Control::Set},
    {"reply", "ID COMMAND JSON|off", "answers COMMAND with this text, as it stands, from now on",
     &Control::Reply},
    {"reply-once", "ID COMMAND JSON", "the same for the next time only", &Control::ReplyOnce},
    {"received", "ID[.PORT]", "prints, and forgets, the commands received, as a JSON array",
     &Control::Received},
    {"send", "ID[.PORT] JSON", "sends this text, as it stands, to clients now", &Control::Send},
    {"unplug", "ID[.PORT]", "takes the modem or one port away", &Control::Unplug},
    {"plug", "ID[.PORT]", "brings it back, and prints its ports", &Control::Plug},
    {"help", "", "prints this list", &Control::ShowHelp},
    {"quit", "", "ends the program, as the end of the input does", &Control::Quit},
};

namespace {

// Takes the first word off `rest`.
std::string TakeWord(std::string* rest) {
    const size_t end = rest->find(' ');
    const std::string word = rest->substr(0, end);
    const size_t next = end == std::string::npos ? end : rest->find_first_not_of(' ', end);
    *rest = next == std::string::npos ? "" : rest->substr(next);
    if (word.empty()) {
        throw std::invalid_argument("something is missing; see help");
    }
    return word;
}

std::string ParseJsonText(const std::string& json) {
    Json::CharReaderBuilder builder;
    Json::Value value;
    std::string errors;
    const std::unique_ptr<Json::CharReader> reader(builder.newCharReader());
    if (!reader->parse(json.data(), json.data() + json.size(), &value, &errors) ||
        !value.isString()) {
        throw std::invalid_argument("a text as JSON is expected, such as \"\\r\\nOK\\r\\n\"");
    }
    return value.asString();
}

}  // namespace

std::string Control::Execute(const std::string& line) {
    std::string rest = line;
    try {
        const std::string name = TakeWord(&rest);
        for (const Verb& verb : kVerbs) {
            if (name == verb.name) {
                return (this->*verb.run)(rest) + "ok\n";
            }
        }
        throw std::invalid_argument("there is no command '" + name + "'; see help");
    } catch (const std::exception& error) {
        return "error: " + std::string(error.what()) + "\n";
    }
}

std::string Control::Help() {
    std::string help;
    for (const Verb& verb : kVerbs) {
        char line[160];
        const std::string written = std::string(verb.name) + " " + verb.arguments;
        std::snprintf(line, sizeof line, "  %-28s %s\n", written.c_str(), verb.meaning);
        help += line;
    }
    return help;
}

Control::Target Control::ParseTarget(const std::string& text) {
    const size_t dot = text.find('.');
    Target target{simulator_.Find(ParseNumber(text.substr(0, dot), "a modem's id")), {}};
    if (dot != std::string::npos) {
        target.port = ParseNumber(text.substr(dot + 1), "a port");
        if (*target.port >= target.modem.Ports().size()) {
            throw std::invalid_argument("modem " + text.substr(0, dot) + " has no port " +
                                        text.substr(dot + 1));
        }
    }
    return target;
}

void Control::AddFault(const std::string& target, const std::string& fault) {
    ParseTarget(target).ForEachPort([&fault](Port& port) { port.faults.Add(fault); });
}

std::string Control::Fault(std::string rest) {
    const std::string target = TakeWord(&rest);
    AddFault(target, rest);
    return "";
}

std::string Control::Set(std::string rest) {
    const Target target = ParseTarget(TakeWord(&rest));
    const std::string name = TakeWord(&rest);
    target.modem.Core().Set(name, rest);
    return "";
}

std::string Control::Reply(std::string rest) {
    return SetReply(rest, false);
}

std::string Control::ReplyOnce(std::string rest) {
    return SetReply(rest, true);
}

std::string Control::SetReply(std::string rest, bool once) {
    Modem& modem = ParseTarget(TakeWord(&rest)).modem.Core();
    const std::string command = TakeWord(&rest);
    if (rest == "off") {
        modem.RemoveOverride(command);
    } else {
        modem.OverrideReply(command, ParseJsonText(rest), once);
    }
    return "";
}

std::string Control::Received(std::string rest) {
    Json::Value commands(Json::arrayValue);
    ParseTarget(TakeWord(&rest)).ForEachPort([&commands](Port& port) {
        for (const auto& command : port.TakeReceived()) {
            commands.append(command);
        }
    });
    Json::StreamWriterBuilder builder;
    builder["indentation"] = "";
    return Json::writeString(builder, commands) + "\n";
}

std::string Control::Send(std::string rest) {
    const Target target = ParseTarget(TakeWord(&rest));
    const std::string text = ParseJsonText(rest);
    target.ForEachPort([&text](Port& port) {
        if (port.Line() != nullptr) {
            port.Send(text, Clock::now());
        }
    });
    return "";
}

std::string Control::Plug(std::string rest) {
    const Target target = ParseTarget(TakeWord(&rest));
    target.modem.Plug(target.port);
    return target.modem.Describe();
}

std::string Control::Unplug(std::string rest) {
    const Target target = ParseTarget(TakeWord(&rest));
    target.modem.Unplug(target.port);
    return "";
}

std::string Control::ShowHelp(std::string) {
    return Help() + "Faults:\n" + FaultHelp();
}

std::string Control::Quit(std::string) {
    quits_ = true;
    return "";
}

}  // namespace taviwireless::sim
