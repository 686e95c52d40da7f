// SPDX-License-Identifier: MIT
// The help about a command.
#include <algorithm>

#include "base/command_line/position.h"
#include "base/join.h"
#include "base/split.h"
#include "base/wrap.h"

namespace taviwireless::command_line {

namespace {

struct Row {
    std::string name;
    std::string text;
};

// Writes in lines of at most so many columns.
class Page {
  public:
    explicit Page(size_t columns) : columns_(columns) {}

    // A paragraph; lines after its first are indented.
    void Write(const std::string& text, size_t indent = 0) {
        Continue("", Wrap(text, columns_ - indent), indent);
    }

    // A section, which an empty list does not have.
    void Write(const std::string& title, const std::vector<Row>& rows, bool inOneLine = false) {
        if (rows.empty()) {
            return;
        }
        text_ += "\n" + title + ":\n";
        const size_t left = Left(rows);
        for (const Row& row : rows) {
            std::string name = "  " + row.name;
            if (name.size() + 2 > left) {
                text_ += name + "\n";
                name.clear();
            }
            name.resize(left, ' ');
            std::vector<std::string> lines = Wrap(row.text, columns_ - left);
            if (inOneLine && lines.size() > 1) {
                lines = Wrap(row.text, columns_ - left - 3);
                lines = {lines[0] + " .."};
            }
            Continue(name, lines, left);
        }
    }

    // Text in lines of its own making. What is too long goes on below the last of its columns, which
    // two blanks or more divide, or below its beginning where the columns are few.
    void WriteLines(const std::string& text) {
        constexpr size_t kDeeper = 4;
        for (const std::string& line : Lines(text)) {
            const size_t begin = std::min(line.find_first_not_of(' '), line.size());
            const size_t gap = std::min(line.find("  ", begin), line.size());
            const size_t column = std::min(line.find_first_not_of(' ', gap), line.size());
            if (line.size() <= columns_) {
                Continue(line, {""}, 0);
            } else if (column < line.size() && column <= columns_ / 2) {
                Continue(line.substr(0, column), Wrap(line.substr(column), columns_ - column),
                         column);
            } else {
                const size_t indent = std::min(begin, kDeeper);
                const size_t rest = begin == 0 ? 0 : indent + kDeeper;
                Continue(std::string(indent, ' '),
                         Wrap(line.substr(begin, gap - begin), columns_ - indent), rest);
                if (column < line.size()) {
                    Continue(std::string(rest, ' '), Wrap(line.substr(column), columns_ - rest),
                             rest);
                }
            }
        }
    }

    const std::string& Text() const { return text_; }

  private:
    // Where the texts of the rows begin: behind the names, but below those that are long.
    size_t Left(const std::vector<Row>& rows) const {
        const size_t most = std::max(columns_ * 2 / 5, size_t{17});
        size_t left = 8;
        for (const Row& row : rows) {
            const size_t wanted = row.name.size() + 4;
            left = wanted <= most ? std::max(left, wanted) : left;
        }
        return left;
    }

    void Continue(std::string begin, const std::vector<std::string>& lines, size_t indent) {
        for (const std::string& line : lines) {
            text_ += begin + line;
            text_.erase(text_.find_last_not_of(' ') + 1);
            text_ += '\n';
            begin = std::string(indent, ' ');
        }
    }

    const size_t columns_;
    std::string text_;
};

std::string Usage(const CLI::App& command) {
    std::string usage = "Usage: " + FullName(command) + " [OPTIONS]";
    for (const CLI::Option* argument : ArgumentsOf(command)) {
        const bool isMany = argument->get_items_expected_max() > 1;
        const std::string name = argument->get_name(true) + (isMany ? "..." : "");
        usage += argument->get_required() ? " " + name : " [" + name + "]";
    }
    return usage + (IsGroup(command) ? " COMMAND" : "");
}

std::string Description(const CLI::Option& option) {
    std::string words;
    for (const std::string& word : WordsFor(option)) {
        AddItem(words, word);
    }
    return option.get_description() + (words.empty() ? "" : ": " + words);
}

std::string Names(const CLI::Option& option) {
    std::string names;
    for (const std::string& name : option.get_snames()) {
        AddItem(names, "-" + name);
    }
    for (const std::string& name : option.get_lnames()) {
        AddItem(names, "--" + name);
    }
    std::string type = option.get_type_name();
    if (!WordsFor(option).empty()) {
        type.erase(type.find(':'));  // and the words
    }
    return names + (TakesValue(option) ? " " + type : "");
}

std::vector<Row> Options(const CLI::App& command) {
    std::vector<Row> rows;
    for (const CLI::Option* option : OptionsOf(command)) {
        rows.push_back({Names(*option), Description(*option)});
    }
    return rows;
}

std::vector<Row> Arguments(const CLI::App& command) {
    std::vector<Row> rows;
    for (const CLI::Option* argument : ArgumentsOf(command)) {
        rows.push_back({argument->get_name(true), Description(*argument)});
    }
    return rows;
}

// What stands before a semicolon tells enough in a list.
std::vector<Row> Commands(const CLI::App& command) {
    std::vector<Row> rows;
    for (const CLI::App* inner : CommandsIn(command)) {
        const std::string text = inner->get_description();
        rows.push_back({inner->get_name(), text.substr(0, text.find(';'))});
    }
    return rows;
}

// The options of what the command is in; its own help is listed already.
std::vector<Row> OuterOptions(const CLI::App& command) {
    std::vector<Row> rows;
    for (const CLI::App* outer = command.get_parent(); outer; outer = outer->get_parent()) {
        for (const CLI::Option* option : OptionsOf(*outer)) {
            if (option != outer->get_help_ptr()) {
                rows.push_back({Names(*option), Description(*option)});
            }
        }
    }
    return rows;
}

}  // namespace

std::string HelpText(const CLI::App& command, size_t columns) {
    constexpr bool kInOneLine = true;
    constexpr size_t kUsageIndent = 7;
    Page page(columns);
    page.Write(Usage(command), kUsageIndent);
    page.Write("");
    page.Write(command.get_description());
    page.Write("Arguments", Arguments(command));
    page.Write("Commands", Commands(command), kInOneLine);
    page.Write("Options", Options(command));
    page.Write("Options of all commands", OuterOptions(command));
    if (!command.get_footer().empty()) {
        page.Write("");
        page.WriteLines(command.get_footer());
    }
    return page.Text();
}

}  // namespace taviwireless::command_line
