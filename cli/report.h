#ifndef TAVIWIRELESS_CLI_REPORT_H
#define TAVIWIRELESS_CLI_REPORT_H

#include <json/forwards.h>

#include <string>
#include <vector>

namespace taviwireless::cli {

// Rows of cells, each column as wide as its widest cell; the first row is the heading.
using Table = std::vector<std::vector<std::string>>;

// The table as it is printed.
std::string ToText(const Table& table);

// Print on standard output; what ShowProgress shows goes away.
void Print(const Table& table);
void Print(const Json::Value& document);

// The document in one line, without its end.
std::string ToLine(const Json::Value& document);

// Reports a failure: {"error": SENTENCE} on standard output, or the sentence on standard error.
void PrintFailure(bool json, const std::string& sentence);

// Returns text with control characters replaced by "?": what a modem sends may not steer the
// terminal.
std::string Printable(const std::string& text);

// What is not known is null in documents and "-" in tables.
Json::Value TextOrNull(const std::string& text);
std::string Cell(const std::string& text);

// Stars, unless secrets are to be shown.
std::string SecretText(const std::string& secret, bool showSecrets);

// Shows on standard error what is being waited for, one line that each call replaces; the empty
// text removes it. Nothing is shown unless standard error is a terminal.
void ShowProgress(const std::string& text);

}  // namespace taviwireless::cli

#endif
