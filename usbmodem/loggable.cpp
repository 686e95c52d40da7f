#include "usbmodem/loggable.h"

#include <sstream>

namespace taviwireless::usbmodem_lib {

namespace {

// What stands in front of the secrets in the commands that carry them.
constexpr const char* kBeforeSecrets[] = {"AT+CPIN=", "AT+CPWD=\"SC\",", "AT+CLCK=\"SC\",0,",
                                          "AT+CLCK=\"SC\",1,"};

}  // namespace

std::string LoggableCommand(const std::string& command) {
    for (const std::string prefix : kBeforeSecrets) {
        if (command.rfind(prefix, 0) == 0) {
            return prefix + "***";
        }
    }
    return command;
}

std::string LoggableReply(const std::string& reply) {
    std::istringstream lines(reply);
    std::string loggable;
    for (std::string line; std::getline(lines, line);) {
        const size_t equals = line.find('=');
        loggable += equals == std::string::npos ? line : line.substr(0, equals) + "=***";
        loggable += '\n';
    }
    return loggable;
}

}  // namespace taviwireless::usbmodem_lib
