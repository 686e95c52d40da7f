// SPDX-License-Identifier: MIT
// Foreign text in a command: a real shell splits it at blanks and does nothing else with it, and the
// description of the command hides what is secret.
#include <filesystem>

#include "tests/fuzz/fuzz.h"
#include "wireless/system/shell.h"

namespace taviwireless::fuzz {
namespace {

using wireless::Argument;

// What printf prints of the words, each with a zero byte behind it.
std::string Words(const std::string& text) {
    std::string words;
    for (const char c : text) {
        const bool isBlank = c == ' ' || c == '\t';
        if (!isBlank || (!words.empty() && words.back() != '\0')) {
            words += isBlank ? '\0' : c;
        }
    }
    return words + '\0';
}

auto Files() {
    const std::filesystem::directory_iterator folder("/");  // where commands run
    return std::distance(begin(folder), end(folder));
}

}  // namespace

void Fuzz(Input input) {
    const size_t size = (input.Choice(255) + 1) * 16;
    const Argument secret{input.Text(), true}, first{input.Text()}, second{input.Text()};
    const wireless::Command command(size,
                                    {"printf '%s\\0' ", secret, " ", first, " x", second, "y"});
    const std::string others = " " + first.text + " x" + second.text + "y";
    const std::string described = "printf '%s\\0' " + std::string(secret.text.size(), '*') + others;
    Demand(command.Described() == described.substr(0, size - 1), "secrets are hidden", described);
    if (secret.text.empty() && first.text.empty() && second.text.empty()) {
        return;  // so many short inputs need no shell each
    }
    const auto before = Files();
    wireless::Pipe pipe(command);
    const bool fits = described.size() < size;
    Demand(fits || !pipe, "a command is not cut short", described);
    if (fits && pipe) {
        std::string output(8192, '\0');
        output.resize(fread(output.data(), 1, output.size(), pipe.get()));
        Demand(pipe.Close() == 0, "printf has run", described);
        Demand(output == Words(secret.text + others), "it has these words", output);
    }
    Demand(Files() == before, "nothing else has happened", described);
}

}  // namespace taviwireless::fuzz
