// SPDX-License-Identifier: MIT
#include "sim/transcript.h"

#include <fcntl.h>
#include <unistd.h>

#include <cerrno>
#include <chrono>
#include <cstring>
#include <ctime>
#include <stdexcept>

namespace taviwireless::sim {
namespace {

std::string Visible(const std::string& bytes) {
    std::string visible;
    for (const char byte : bytes) {
        const auto c = static_cast<unsigned char>(byte);
        char code[5];
        if (c == '\r' || c == '\n') {
            visible += c == '\r' ? "\\r" : "\\n";
        } else if (c < ' ' || c > '~') {
            std::snprintf(code, sizeof code, "\\x%02x", c);
            visible += code;
        } else {
            visible += static_cast<char>(c);
        }
    }
    return visible;
}

std::string TimeOfDay() {
    using namespace std::chrono;
    const auto now = system_clock::now();
    const time_t seconds = system_clock::to_time_t(now);
    const auto rest = duration_cast<milliseconds>(now.time_since_epoch()).count() % 1000;
    tm local{};
    localtime_r(&seconds, &local);
    char text[16];
    std::strftime(text, sizeof text, "%H:%M:%S", &local);
    std::string fraction = std::to_string(1000 + rest);
    return text + ("." + fraction.substr(1));
}

}  // namespace

Transcript::Transcript(const std::string& path)
    : file_(path == "-" ? fdopen(fcntl(STDERR_FILENO, F_DUPFD_CLOEXEC, 0), "w")
                        : std::fopen(path.c_str(), "ae")) {
    if (!file_) {
        throw std::runtime_error("Cannot write the log " + path + ": " + std::strerror(errno) +
                                 ".");
    }
}

void Transcript::Note(const std::string& port, char direction, const std::string& bytes) {
    if (file_) {
        std::fprintf(file_.get(), "%s %s %c %s\n", TimeOfDay().c_str(), port.c_str(), direction,
                     Visible(bytes).c_str());
        std::fflush(file_.get());
    }
}

}  // namespace taviwireless::sim
