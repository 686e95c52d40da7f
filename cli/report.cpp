#include "cli/report.h"

#include <json/writer.h>

#include <algorithm>
#include <iostream>

#include "cli/terminal.h"

namespace taviwireless::cli {

namespace {

// Characters of UTF-8 text, which is what a terminal gives a column each in nearly all names.
size_t Width(const std::string& text) {
    return static_cast<size_t>(
        std::count_if(text.begin(), text.end(), [](char c) { return (c & 0xC0) != 0x80; }));
}

std::string ToText(const Table& table) {
    std::vector<size_t> widths;
    for (const auto& row : table) {
        widths.resize(std::max(widths.size(), row.size()));
        for (size_t column = 0; column < row.size(); ++column) {
            widths[column] = std::max(widths[column], Width(row[column]));
        }
    }
    std::string text;
    for (const auto& row : table) {
        std::string line;
        for (size_t column = 0; column < row.size(); ++column) {
            line += row[column] + std::string(widths[column] - Width(row[column]) + 2, ' ');
        }
        line.erase(line.find_last_not_of(' ') + 1);
        text += line + "\n";
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
    return options.json ? ToText(report.document, documentInOneLine) : ToText(report.rows);
}

void Print(const Options& options, const Report& report) {
    ShowProgress("");
    std::cout << Render(options, report);
}

void PrintFailure(const Options& options, const std::string& sentence) {
    ShowProgress("");
    if (options.json) {
        Report report;
        report.document["error"] = sentence;
        Print(options, report);
    } else {
        std::cerr << "taviwireless: " << sentence << '\n';
    }
}

}  // namespace taviwireless::cli
