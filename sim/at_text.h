// SPDX-License-Identifier: MIT
#ifndef TAVIWIRELESS_SIM_AT_TEXT_H
#define TAVIWIRELESS_SIM_AT_TEXT_H

#include <string>
#include <vector>

// AT command lines as text: nothing here knows what a command does.
namespace taviwireless::sim {

// The line in capital letters and without blanks, except within quotes.
std::string Normalise(const std::string& line);

// The commands of a normalised line that begins with "AT", each with "AT" before it:
// "ATE1+CSQ;+CREG?" gives ATE1, AT+CSQ, AT+CREG?. A dial command takes the rest of the line. "AT"
// alone gives none.
std::vector<std::string> SplitCommands(const std::string& line);

// What follows the command's first "=", split at commas, without the quotes.
std::vector<std::string> Arguments(const std::string& command);

// True when the pattern is the command, or ends in "*" and the command begins with what precedes
// that. Quotes count on neither side, since modems take arguments with and without them.
bool MatchesPattern(const std::string& pattern, const std::string& command);

}  // namespace taviwireless::sim

#endif
