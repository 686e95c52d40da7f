#ifndef TAVIWIRELESS_TESTS_SIM_CLIENT_H
#define TAVIWIRELESS_TESTS_SIM_CLIENT_H

#include <fcntl.h>
#include <poll.h>

#include <chrono>
#include <stdexcept>
#include <string>

#include "base/unique_fd.h"

namespace taviwireless::test {

// A program that talks to a modem's port, as bare as can be: no settings of its own.
class Client {
  public:
    static constexpr int kQuiet = 100;      // ms; nothing more comes after that
    static constexpr int kPatience = 5000;  // ms; far above what any reply needs

    explicit Client(int port) : Client("/dev/ttyUSB" + std::to_string(port)) {}
    explicit Client(const std::string& path) : line_(open(path.c_str(), O_RDWR | O_NOCTTY)) {
        if (line_.Get() < 0) {
            throw std::runtime_error("Cannot open " + path);
        }
    }

    void Write(const std::string& text) {
        if (write(line_.Get(), text.data(), text.size()) != static_cast<ssize_t>(text.size())) {
            throw std::runtime_error("The line does not take " + text);
        }
    }

    // What comes until nothing comes for so long, or the line is hung up.
    std::string ReadUntilQuiet(int quiet = kQuiet) {
        std::string text;
        while (ReadMore(quiet, &text)) {
        }
        return text;
    }

    // Sends the command and returns everything up to the end of its result.
    std::string Ask(const std::string& command) {
        Write(command + "\r");
        return ReadReply();
    }

    std::string ReadReply() {
        std::string text;
        while (!EndsReply(text) && ReadMore(kPatience, &text)) {
        }
        return text;
    }

    // False when nothing comes for so long, or the line is hung up.
    bool ReadMore(int patience, std::string* text) {
        pollfd readable{line_.Get(), POLLIN, 0};
        char buffer[4096];
        if (poll(&readable, 1, patience) <= 0) {
            return false;
        }
        const ssize_t count = read(line_.Get(), buffer, sizeof buffer);
        hungUp_ = count <= 0;
        text->append(buffer, hungUp_ ? 0 : count);
        return !hungUp_;
    }
    bool IsHungUp() const { return hungUp_; }

  private:
    static bool EndsReply(const std::string& text) {
        const size_t last = text.rfind("\r\n", text.size() - 3);
        if (text.size() < 4 || last == std::string::npos ||
            text.substr(text.size() - 2) != "\r\n") {
            return false;
        }
        const std::string line = text.substr(last + 2, text.size() - last - 4);
        return line == "OK" || line == "CONNECT" || line.find("ERROR") != std::string::npos;
    }

    UniqueFd line_;
    bool hungUp_ = false;
};

}  // namespace taviwireless::test

#endif
