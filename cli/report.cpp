#include "cli/report.h"

#include <json/json.h>
#include <unistd.h>

#include <algorithm>
#include <cstdio>
#include <iostream>

namespace taviwireless::cli {

namespace {

// Characters of UTF-8 text, which is what a terminal gives a column each in nearly all names.
size_t Width(const std::string& text) {
    return static_cast<size_t>(
        std::count_if(text.begin(), text.end(), [](char c) { return (c & 0xC0) != 0x80; }));
}

}  // namespace

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

void Print(const Table& table) {
    ShowProgress("");
    std::cout << ToText(table);
}

void Print(const Json::Value& document) {
    ShowProgress("");
    Json::StreamWriterBuilder builder;
    builder["indentation"] = "  ";
    builder["enableYAMLCompatibility"] = true;  // "key": value, without a blank before the colon
    std::cout << Json::writeString(builder, document) << '\n';
}

std::string ToLine(const Json::Value& document) {
    Json::StreamWriterBuilder builder;
    builder["indentation"] = "";
    return Json::writeString(builder, document);
}

void PrintFailure(bool json, const std::string& sentence) {
    ShowProgress("");
    if (json) {
        Json::Value document;
        document["error"] = sentence;
        Print(document);
    } else {
        std::cerr << "taviwireless: " << sentence << '\n';
    }
}

std::string Printable(const std::string& text) {
    std::string printable;
    for (size_t i = 0; i < text.size(); ++i) {
        const auto byte = static_cast<unsigned char>(text[i]);
        const auto next = static_cast<unsigned char>(text[i + 1]);      // zero at the end
        const bool isC1 = byte == 0xC2 && next >= 0x80 && next < 0xA0;  // in UTF-8, two bytes
        printable += byte < 0x20 || byte == 0x7F || isC1 ? '?' : text[i];
        i += isC1 ? 1 : 0;
    }
    return printable;
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

void ShowProgress(const std::string& text) {
    if (isatty(STDERR_FILENO)) {
        std::fprintf(stderr, "\r\033[K%s", text.c_str());
    }
}

}  // namespace taviwireless::cli
