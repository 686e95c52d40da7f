// SPDX-License-Identifier: MIT
#include "cli/report.h"

#include <json/writer.h>

#include <algorithm>
#include <cerrno>
#include <cstring>
#include <iostream>
#include <numeric>

#include "base/wrap.h"
#include "cli/command_error.h"
#include "cli/terminal.h"
#include "cli/text_width.h"

namespace taviwireless::cli {

namespace {

constexpr size_t kGap = 2;  // columns between two cells

// The widths of the columns of the rows: those of their widest cells.
std::vector<size_t> Widths(const Table& rows) {
    std::vector<size_t> widths;
    for (const auto& row : rows) {
        widths.resize(std::max(widths.size(), row.size()));
        for (size_t column = 0; column < row.size(); ++column) {
            widths[column] = std::max(widths[column], TextWidth(row[column]));
        }
    }
    return widths;
}

size_t LineWidth(const std::vector<size_t>& widths) {
    return std::accumulate(widths.begin(), widths.end(), kGap * (widths.size() - 1));
}

std::string Line(const std::string& text) {
    return text.substr(0, text.find_last_not_of(' ') + 1) + "\n";
}

// Rows of no list: the last cell of each goes on below itself where the terminal ends.
std::string ToText(const Table& rows) {
    const auto room = static_cast<size_t>(TerminalWidth());
    std::vector<size_t> widths = Widths(rows);
    std::string text;
    for (const auto& row : rows) {
        std::string line;
        for (size_t column = 0; column + 1 < row.size(); ++column) {
            line += Padded(row[column], widths[column] + kGap);
        }
        const std::string& last = row.empty() ? line : row.back();
        const size_t indent = TextWidth(line);
        if (indent + TextWidth(last) <= room || room <= indent) {
            text += Line(line + last);
            continue;
        }
        for (const std::string& part : Wrap(last, room - indent, TextWidth)) {
            text += Line(line + part);
            line = std::string(indent, ' ');
        }
    }
    return text;
}

// The rows of a list, in the room that there is.
class ListText {
  public:
    ListText(const std::vector<Column>& columns, const Table& rows) : all_(columns) {
        Table cells = {{}};
        for (const Column& column : columns) {
            cells[0].push_back(column.title);
        }
        cells.insert(cells.end(), rows.begin(), rows.end());
        widths_ = Widths(cells);
        for (size_t column = 0; column < columns.size(); ++column) {
            widths_[column] = std::max(widths_[column], columns[column].width);
            shown_.push_back(column);
        }
        if (room_ > 0) {
            LeaveOut();
        }
        columns_ = Shown(all_);
        widths_ = Shown(widths_);
        if (room_ > 0) {
            Narrow();
        }
    }

    std::string Titles() const {
        if (isInBlocks_) {
            return "";
        }
        std::vector<std::string> titles;
        for (size_t column = 0; column < columns_.size(); ++column) {
            titles.push_back(Cut(columns_[column].title, widths_[column]));
        }
        const std::string line = Join(titles);
        return Coloured(Colour::kBold, line.substr(0, line.find_last_not_of(' ') + 1)) + "\n";
    }

    std::string Row(const std::vector<std::string>& row) const {
        return isInBlocks_ ? Block(row) : Line(Join(Fitting(Shown(row))));
    }

  private:
    // Of the values of all columns, those of the columns that are shown.
    template <typename Value>
    std::vector<Value> Shown(const std::vector<Value>& values) const {
        std::vector<Value> shown;
        for (const size_t column : shown_) {
            shown.push_back(values[column]);
        }
        return shown;
    }

    // Leaves columns out, the last first, until a row fits.
    void LeaveOut() {
        for (size_t column = all_.size(); column-- > 0;) {
            if (all_[column].isExtra && LineWidth(Shown(widths_)) > room_) {
                shown_.erase(std::find(shown_.begin(), shown_.end(), column));
            }
        }
    }

    // Takes from the widest column of text until a row fits.
    void Narrow() {
        constexpr size_t kLeast = 6;
        while (LineWidth(widths_) > room_) {
            size_t* widest = nullptr;
            for (size_t column = 0; column < columns_.size(); ++column) {
                if (columns_[column].isText && (widest == nullptr || widths_[column] > *widest)) {
                    widest = &widths_[column];
                }
            }
            if (widest == nullptr || *widest <= kLeast) {
                isInBlocks_ = true;
                return;
            }
            --*widest;
        }
    }

    // What is wider than its column takes the room at the end of the line; what is still wider is
    // cut if it is text.
    std::vector<std::string> Fitting(std::vector<std::string> row) const {
        size_t spare = room_ > 0 ? room_ - LineWidth(widths_) : std::string::npos;
        for (size_t column = 0; column < row.size(); ++column) {
            const size_t wanted = TextWidth(row[column]);
            const size_t more = wanted - std::min(wanted, widths_[column]);
            const size_t given = std::min(more, spare);
            spare -= given;
            if (columns_[column].isText) {
                row[column] = Cut(row[column], widths_[column] + given);
            }
        }
        return row;
    }

    std::string Join(const std::vector<std::string>& row) const {
        std::string line;
        for (size_t column = 0; column < row.size(); ++column) {
            line += Padded(row[column], widths_[column]) + std::string(kGap, ' ');
        }
        return line;
    }

    std::string Block(const std::vector<std::string>& row) const {
        Table lines;
        for (size_t column = 0; column < row.size(); ++column) {
            lines.push_back({all_[column].title, row[column]});
        }
        return ToText(lines) + "\n";
    }

    const std::vector<Column>& all_;
    std::vector<size_t> shown_;  // indices of columns
    std::vector<Column> columns_;
    const size_t room_ = static_cast<size_t>(TerminalWidth());  // 0 without a terminal
    std::vector<size_t> widths_;
    bool isInBlocks_ = false;
};

std::string ToText(const Report& report) {
    if (report.columns.empty()) {
        return ToText(report.rows);
    }
    const ListText list(report.columns, report.rows);
    std::string text = list.Titles();
    for (const auto& row : report.rows) {
        text += list.Row(row);
    }
    return text;
}

std::string ToText(const Json::Value& document, bool inOneLine) {
    Json::StreamWriterBuilder builder;
    builder["indentation"] = inOneLine ? "" : "  ";
    // "key": value, without a blank before the colon
    builder["enableYAMLCompatibility"] = !inOneLine;
    return Json::writeString(builder, document) + "\n";
}

}  // namespace

void Report::Add(const char* key, const char* title, const std::string& text) {
    Add(key, title, TextOrNull(text), Cell(text));
}

void Report::Add(const char* key, const char* title, const Json::Value& value,
                 const std::string& cell) {
    document[key] = value;
    rows.push_back({title, cell});
}

void Report::AddPart(const char* key, const std::string& prefix, const Report& part) {
    document[key] = part.document;
    for (const auto& row : part.rows) {
        rows.push_back({prefix + row[0], row[1]});
    }
}

Json::Value TextOrNull(const std::string& text) {
    return text.empty() ? Json::Value() : Json::Value(text);
}

std::string Cell(const std::string& text) {
    return text.empty() ? "-" : Printable(text);
}

std::string SecretText(const std::string& secret, bool showSecrets) {
    return secret.empty() || showSecrets ? secret : "********";
}

std::string Render(const Options& options, const Report& report, bool documentInOneLine) {
    return options.json ? ToText(report.document, documentInOneLine) : ToText(report);
}

void Print(const Options& options, const Report& report) {
    ShowProgress("");
    std::cout << Render(options, report);
}

void FlushOutput() {
    errno = 0;
    if (!std::cout.flush()) {
        const std::string reason = errno == 0 ? "" : std::string(": ") + strerror(errno);
        throw CommandError(kFailure, "the output could not be written" + reason);
    }
}

RowPrinter::RowPrinter(const Options& options, std::vector<Column> columns)
    : options_(options), columns_(std::move(columns)) {}

void RowPrinter::Add(const std::vector<std::string>& row, const Json::Value& document) {
    if (options_.json) {
        all_.append(document);
        return;
    }
    const ListText list(columns_, {});
    ShowProgress("");
    std::cout << (isFirst_ ? list.Titles() : "") << list.Row(row);
    isFirst_ = false;
    FlushOutput();
}

void RowPrinter::Finish(const std::string& withoutRows) {
    if (options_.json || isFirst_) {
        Print(options_, {{{withoutRows}}, all_});
    }
}

void PrintFailure(const Options& options, const std::string& sentence) {
    ShowProgress("");
    if (options.json) {
        Report report;
        report.document["error"] = sentence;
        Print(options, report);
    }
    if (!options.json || !std::cout.flush()) {
        std::cerr << "taviwireless: " << sentence << '\n';
    }
}

}  // namespace taviwireless::cli
