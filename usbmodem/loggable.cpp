#include "usbmodem/loggable.h"

#include <algorithm>
#include <iterator>
#include <sstream>

#include "usbmodem/text.h"

namespace taviwireless::usbmodem_lib {

namespace {

// What stands in front of the secrets in the commands that carry them.
constexpr const char* kBeforeSecrets[] = {"AT+CPIN=", "AT+CPWD=\"SC\",", "AT+CLCK=\"SC\",0,",
                                          "AT+CLCK=\"SC\",1,"};

// How the lines begin that a modem writes itself.
constexpr const char* kOwnLines[] = {"OK", "ERROR", "+CME ERROR:", "+CPIN: ", "BUSY"};

bool IsModemsOwn(const std::string& line) {
    return std::any_of(std::begin(kOwnLines), std::end(kOwnLines),
                       [&line](const char* begin) { return line.rfind(begin, 0) == 0; });
}

}  // namespace

bool CarriesSecret(const std::string& line) {
    return std::any_of(std::begin(kBeforeSecrets), std::end(kBeforeSecrets),
                       [&line](const char* before) { return Contains(line, before); });
}

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
        line.erase(0, line.find_first_not_of('\r'));  // left over from the end of an echo
        loggable += IsModemsOwn(line) ? line + '\n' : "***\n";
    }
    return loggable;
}

}  // namespace taviwireless::usbmodem_lib
