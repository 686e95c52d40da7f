// SPDX-License-Identifier: MIT
#include "cli/qr_code.h"

#include <qrencode.h>

#include <memory>

#include "cli/command_error.h"
#include "cli/terminal.h"

namespace taviwireless::cli {

namespace {

constexpr int kMargin = 4;  // dots on each side

// The dots of a code, those of the margin among them.
class Code {
  public:
    explicit Code(const std::string& text)
        : code_(QRcode_encodeString8bit(text.c_str(), 0, QR_ECLEVEL_L), QRcode_free) {
        if (!code_) {
            throw CommandError(kFailure, "there is no memory for a QR code");
        }
    }

    int Size() const { return code_->width + 2 * kMargin; }

    bool IsDark(int row, int column) const {
        const int y = row - kMargin;
        const int x = column - kMargin;
        const bool isInside = x >= 0 && y >= 0 && x < code_->width && y < code_->width;
        return isInside && (code_->data[y * code_->width + x] & 1) != 0;
    }

  private:
    std::unique_ptr<QRcode, decltype(&QRcode_free)> code_;
};

// Two characters a dot.
std::vector<std::string> DrawInASCII(const Code& code) {
    std::vector<std::string> lines;
    for (int row = 0; row < code.Size(); ++row) {
        std::string line;
        for (int column = 0; column < code.Size(); ++column) {
            line += code.IsDark(row, column) ? "##" : "  ";
        }
        lines.push_back(line);
    }
    return lines;
}

// Two dots, one above the other, a character. Light ones are drawn: most terminals are dark, and
// where there are colours these see to it.
std::vector<std::string> DrawInBlocks(const Code& code) {
    constexpr const char* kBlocks[] = {" ", "\u2580", "\u2584", "\u2588"};
    const bool hasColours = Coloured(Colour::kFaint, ".") != ".";
    std::vector<std::string> lines;
    for (int row = 0; row < code.Size(); row += 2) {
        std::string line = hasColours ? "\033[40;97m" : "";
        for (int column = 0; column < code.Size(); ++column) {
            const int upper = code.IsDark(row, column) ? 0 : 1;
            const int lower = code.IsDark(row + 1, column) ? 0 : 2;
            line += kBlocks[upper + lower];
        }
        lines.push_back(line + (hasColours ? "\033[0m" : ""));
    }
    return lines;
}

std::string Escaped(const std::string& text) {
    std::string escaped;
    for (const char c : text) {
        escaped += std::string("\\;,:\"").find(c) == std::string::npos ? "" : "\\";
        escaped += c;
    }
    return escaped;
}

}  // namespace

std::string WifiText(const CodeNetwork& network) {
    return "WIFI:T:" + std::string(network.kind) + ";S:" + Escaped(network.ssid) +
           (network.key.empty() ? "" : ";P:" + Escaped(network.key)) +
           (network.isHidden ? ";H:true;;" : ";;");
}

std::vector<std::string> DrawCode(const std::string& text) {
    const Code code(text);
    const bool isUTF8 = ShowsUTF8();
    const int wanted = code.Size() * (isUTF8 ? 1 : 2);
    const int width = TerminalWidth();
    if (width > 0 && width < wanted) {
        throw CommandError(kFailure, "the QR code needs " + std::to_string(wanted) +
                                         " columns, and the terminal has " + std::to_string(width) +
                                         "; --json shows its text");
    }
    return isUTF8 ? DrawInBlocks(code) : DrawInASCII(code);
}

void PrintCode(const Options& options, const CodeNetwork& network) {
    Report report;
    const std::string text = WifiText(network);
    report.document["ssid"] = network.ssid;
    report.document["qr_text"] = text;
    if (!options.json) {
        for (const std::string& line : DrawCode(text)) {
            report.rows.push_back({line});
        }
    }
    Print(options, report);
}

}  // namespace taviwireless::cli
