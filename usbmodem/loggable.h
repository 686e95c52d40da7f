// SPDX-License-Identifier: MIT
#ifndef TAVIWIRELESS_USBMODEM_LOGGABLE_H
#define TAVIWIRELESS_USBMODEM_LOGGABLE_H

#include <initializer_list>
#include <string>

// PINs and PUKs never reach the log or a terminal; whatever else a modem is told or says stays
// readable there. What callers receive is not touched.
namespace taviwireless::usbmodem_lib {

// Returns the lines of text with "***" in place of the PINs and PUKs in the AT commands that carry
// some, in whatever case these are written. A line of a reply may be such a command, too: its echo
// may come late.
std::string LoggableCommand(const std::string& text);

// Returns a reply as one line, masked as LoggableCommand does it, with its last line feed.
std::string LoggableReply(const std::string& reply);

// Returns the reply to a command that held these codes as one line. The codes are masked wherever
// they stand. A modem may repeat the command damaged, so that a piece of a code is left; hence all
// digits are masked, except in lines that are diagnostics.
std::string LoggableReply(const std::string& reply, std::initializer_list<std::string> codes);

// Returns the reply to this command, whatever that is, as one line without the codes in it.
std::string LoggableReplyTo(const std::string& command, const std::string& reply);

}  // namespace taviwireless::usbmodem_lib

#endif
