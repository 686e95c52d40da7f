// SPDX-License-Identifier: MIT
#ifndef TAVIWIRELESS_CLI_TEXT_WIDTH_H
#define TAVIWIRELESS_CLI_TEXT_WIDTH_H

#include <string>

namespace taviwireless::cli {

// Columns that the text takes on a terminal: wide letters take two, those that join others none.
size_t TextWidth(const std::string& text);

// The text, cut with "…" (".." without UTF-8) when it takes more than these columns.
std::string Cut(const std::string& text, size_t columns);

// The text with blanks behind it, so that it takes these columns.
std::string Padded(const std::string& text, size_t columns);

}  // namespace taviwireless::cli

#endif
