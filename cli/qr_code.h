// SPDX-License-Identifier: MIT
#ifndef TAVIWIRELESS_CLI_QR_CODE_H
#define TAVIWIRELESS_CLI_QR_CODE_H

#include <string>
#include <vector>

#include "cli/report.h"

// QR codes by which a telephone joins a network.
namespace taviwireless::cli {

struct CodeNetwork {
    std::string ssid;
    const char* kind;  // "WPA", "WEP" or "nopass"
    std::string key;   // empty without one
    bool isHidden = false;
};

// "WIFI:T:WPA;S:My Home;P:the key;;"
std::string WifiText(const CodeNetwork& network);

// The code of a text as a picture for this terminal, a text for each of its lines, with the margin
// that scanners want. Throws CommandError when the terminal is too narrow for it.
std::vector<std::string> DrawCode(const std::string& text);

// The picture of a network's code, or the text in it for a program.
void PrintCode(const Options& options, const CodeNetwork& network);

}  // namespace taviwireless::cli

#endif
