// SPDX-License-Identifier: MIT
#ifndef TAVIWIRELESS_CLI_REPORT_H
#define TAVIWIRELESS_CLI_REPORT_H

#include <json/value.h>

#include <string>
#include <vector>

#include "cli/options.h"

namespace taviwireless::cli {

// Rows of cells, each column as wide as its widest cell.
using Table = std::vector<std::vector<std::string>>;

// A column of a list.
struct Column {
    std::string title;
    bool isText = false;   // may be cut where the terminal is too narrow: no number, no id
    size_t width = 0;      // what nearly all of its cells need: for rows that come one by one
    bool isExtra = false;  // left out where the terminal is too narrow
};
constexpr bool kText = true;
constexpr bool kExtra = true;

// What a command has to tell: rows for a person, a document for a program. What is not known is
// "-" in rows and null in documents.
struct Report {
    Table rows;
    Json::Value document;
    std::vector<Column> columns = {};  // of a list: stand above the rows

    // A value with a title and a key. What is empty is not known.
    void Add(const char* key, const char* title, const std::string& text);
    // A value that a person reads in other words.
    void Add(const char* key, const char* title, const Json::Value& value, const std::string& cell);

    // Another thing as a part of this one; the prefix stands before its titles.
    void AddPart(const char* key, const std::string& prefix, const Report& part);
};

Json::Value TextOrNull(const std::string& text);
std::string Cell(const std::string& text);

// Stars, unless secrets are to be shown.
std::string SecretText(const std::string& secret, bool showSecrets);

// The report as it is printed, in the form that the options ask for.
std::string Render(const Options& options, const Report& report, bool documentInOneLine = false);

// Prints on standard output; what ShowProgress shows goes away.
void Print(const Options& options, const Report& report);

// Writes out what was printed. Throws CommandError where that cannot be done.
void FlushOutput();

// A list of which each row is printed as it is known; with --json, one array at the end. At a
// terminal that is too narrow for the columns a row is a block of lines.
class RowPrinter {
  public:
    RowPrinter(const Options& options, std::vector<Column> columns);
    void Add(const std::vector<std::string>& row, const Json::Value& document);
    // Ends the list. A person reads the sentence when there was no row.
    void Finish(const std::string& withoutRows);

  private:
    const Options& options_;
    const std::vector<Column> columns_;
    bool isFirst_ = true;
    Json::Value all_ = Json::arrayValue;
};

// What a command that changed something ends with: a sentence for a person, none when it is empty;
// for a program the new state, which is looked at for it alone.
template <typename State>
void PrintOutcome(const Options& options, const std::string& sentence, const State& state) {
    const Table rows = sentence.empty() ? Table() : Table{{sentence}};
    Print(options, options.json ? state() : Report{rows, {}});
}

// Reports a failure: {"error": SENTENCE} on standard output, or the sentence on standard error, where
// it also is when the document cannot be written.
void PrintFailure(const Options& options, const std::string& sentence);

}  // namespace taviwireless::cli

#endif
