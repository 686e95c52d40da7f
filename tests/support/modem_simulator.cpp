// SPDX-License-Identifier: MIT
#include "tests/support/modem_simulator.h"

#include <json/reader.h>
#include <json/writer.h>

#include <sstream>
#include <stdexcept>

#include "tests/support/files.h"

namespace taviwireless::test {
namespace {

std::string ToJson(const std::string& text) {
    Json::StreamWriterBuilder builder;
    builder["indentation"] = "";
    return Json::writeString(builder, text);
}

}  // namespace

void InstallDialler(const std::string& script) {
    WriteFile("/etc/ppp/peers/wvdial", "noauth\n");
    WriteProgram(kDialler, "#!/bin/sh\nprintf '%s\\n' \"$@\" >/tmp/arguments\n" + script +
                               "\nexec sleep 1000\n");
}

ModemSimulator::ModemSimulator(const std::vector<std::string>& arguments, const std::string& folder)
    : process_([&] {
          std::vector<std::string> command = {
              BuiltProgram("modemsim"),         "--control",  "--link-dir",
              folder.empty() ? "/dev" : folder, "--info-dir", folder.empty() ? "/tmp" : folder};
          command.insert(command.end(), arguments.begin(), arguments.end());
          return command;
      }()) {
    ReadUntil("ready");
}

ModemSimulator::~ModemSimulator() {
    process_.CloseInput();
    process_.Wait();
}

std::string ModemSimulator::ReadUntil(const std::string& last) {
    std::string lines;
    for (;;) {
        const auto line = process_.ReadLine();
        if (!line) {
            throw std::runtime_error(process_.AtEnd() ? "modemsim ended before it said " + last
                                                      : "modemsim does not say " + last);
        }
        if (*line == last) {
            return lines;
        }
        if (line->rfind("error: ", 0) == 0) {
            throw std::runtime_error("modemsim: " + *line);
        }
        lines += *line + "\n";
    }
}

std::string ModemSimulator::Command(const std::string& line) {
    process_.WriteLine(line);
    return ReadUntil("ok");
}

std::vector<std::string> ModemSimulator::Received(const std::string& target) {
    std::istringstream json(Command("received " + target));
    Json::Value commands;
    json >> commands;
    std::vector<std::string> lines;
    for (const auto& command : commands) {
        lines.push_back(command.asString());
    }
    return lines;
}

void ModemSimulator::Reply(const std::string& id, const std::string& command,
                           const std::string& text) {
    Command("reply " + id + " " + command + " " + ToJson(text));
}

void ModemSimulator::ReplyOnce(const std::string& id, const std::string& command,
                               const std::string& text) {
    Command("reply-once " + id + " " + command + " " + ToJson(text));
}

void ModemSimulator::Send(const std::string& target, const std::string& text) {
    Command("send " + target + " " + ToJson(text));
}

}  // namespace taviwireless::test
