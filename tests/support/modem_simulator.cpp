#include "tests/support/modem_simulator.h"

#include <json/reader.h>
#include <json/writer.h>

#include <filesystem>
#include <sstream>
#include <stdexcept>

#include "tests/support/files.h"

namespace taviwireless::test {
namespace {

constexpr Process::Milliseconds kPatience = Process::kPatience;

std::vector<std::string> CommandLine(const std::string& linkDir, const std::string& infoDir,
                                     const std::vector<std::string>& arguments) {
    std::vector<std::string> all = {
        BuiltProgram("modemsim"), "--control", "--link-dir", linkDir, "--info-dir", infoDir};
    all.insert(all.end(), arguments.begin(), arguments.end());
    return all;
}

std::string ToJson(const std::string& text) {
    Json::StreamWriterBuilder builder;
    builder["indentation"] = "";
    return Json::writeString(builder, text);
}

}  // namespace

void InstallDialler(const std::string& script) {
    WriteFile("/etc/ppp/peers/wvdial", "noauth\n");
    WriteFile(kDialler, "#!/bin/sh\nprintf '%s\\n' \"$@\" >/tmp/arguments\n" + script +
                            "\nexec sleep 1000\n");
    std::filesystem::permissions(kDialler, std::filesystem::perms(0755));
}

ModemSimulator::ModemSimulator(const std::vector<std::string>& arguments)
    : process_(CommandLine("/dev", "/tmp", arguments)) {
    ReadUntil("ready");
}

ModemSimulator::ModemSimulator(const std::string& folder, const std::vector<std::string>& arguments)
    : process_(CommandLine(folder, folder, arguments)) {
    ReadUntil("ready");
}

ModemSimulator::~ModemSimulator() {
    process_.CloseInput();
    process_.Wait(kPatience);
}

std::string ModemSimulator::ReadUntil(const std::string& last) {
    std::string lines;
    for (;;) {
        const auto line = process_.ReadLine(kPatience);
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

void ModemSimulator::Fault(const std::string& target, const std::string& fault) {
    Command("fault " + target + " " + fault);
}

void ModemSimulator::Reply(const std::string& id, const std::string& command,
                           const std::string& text) {
    Command("reply " + id + " " + command + " " + ToJson(text));
}

void ModemSimulator::ReplyOnce(const std::string& id, const std::string& command,
                               const std::string& text) {
    Command("reply-once " + id + " " + command + " " + ToJson(text));
}

void ModemSimulator::Set(const std::string& id, const std::string& name, const std::string& value) {
    Command("set " + id + " " + name + " " + value);
}

void ModemSimulator::Send(const std::string& target, const std::string& text) {
    Command("send " + target + " " + ToJson(text));
}

void ModemSimulator::Unplug(const std::string& target) {
    Command("unplug " + target);
}

void ModemSimulator::Plug(const std::string& target) {
    Command("plug " + target);
}

}  // namespace taviwireless::test
