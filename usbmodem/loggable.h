#ifndef TAVIWIRELESS_USBMODEM_LOGGABLE_H
#define TAVIWIRELESS_USBMODEM_LOGGABLE_H

#include <string>

// PINs and PUKs never reach the log or a terminal.
namespace taviwireless::usbmodem_lib {

// Whether the line holds a command that carries a PIN or PUK.
bool CarriesSecret(const std::string& line);

// Returns an AT command with "***" in place of the PINs and PUKs in it.
std::string LoggableCommand(const std::string& command);

// Returns the reply to a command that carried a PIN or PUK with "***" in place of every line that
// is no result or status: a modem may repeat the command damaged, so that it is not known as its
// echo.
std::string LoggableReply(const std::string& reply);

}  // namespace taviwireless::usbmodem_lib

#endif
