// SPDX-License-Identifier: MIT
// The words that a command line can go on with, for the completion of a shell.
#include <iostream>
#include <memory>

#include "base/command_line/command_line.h"
#include "base/command_line/position.h"

namespace taviwireless {

namespace {

using command_line::Words;

// A word as it was typed, without its quotes; it may end within them.
std::string Unquoted(const std::string& typed) {
    std::string text;
    char quote = '\0';
    for (size_t i = 0; i < typed.size(); ++i) {
        const char c = typed[i];
        const bool isEscape = c == '\\' && quote != '\'' && i + 1 < typed.size();
        if (isEscape) {
            text += typed[++i];
        } else if (c == quote) {
            quote = '\0';
        } else if (quote == '\0' && (c == '"' || c == '\'')) {
            quote = c;
        } else {
            text += c;
        }
    }
    return text;
}

Words OptionNames(const CLI::App& command) {
    Words names;
    for (const CLI::App* place = &command; place != nullptr; place = place->get_parent()) {
        for (const CLI::Option* option : command_line::OptionsOf(*place)) {
            for (const std::string& name : option->get_lnames()) {
                names.push_back("--" + name);
            }
        }
    }
    return names;
}

Words Values(const CLI::Option& option, const ArgumentValues& valuesOf) {
    const auto values = valuesOf.find(option.get_name(true));
    return values == valuesOf.end() ? command_line::WordsFor(option) : values->second();
}

// What may stand behind the words; the last of them has begun.
Words Candidates(const command_line::Position& position, const std::string& begun,
                 const ArgumentValues& valuesOf) {
    if (!position.unknown.empty()) {
        return {};
    }
    if (position.option != nullptr) {
        return Values(*position.option, valuesOf);
    }
    if (begun[0] == '-' && !position.onlyArguments) {
        return OptionNames(*position.command);
    }
    if (command_line::IsGroup(*position.command)) {
        Words names = {command_line::kHelp};
        for (const CLI::App* command : command_line::CommandsIn(*position.command)) {
            names.push_back(command->get_name());
        }
        return names;
    }
    size_t index = position.arguments.size();
    for (const CLI::Option* argument : command_line::ArgumentsOf(*position.command)) {
        const auto taken = static_cast<size_t>(argument->get_items_expected_max());
        if (index < taken) {
            return Values(*argument, valuesOf);
        }
        index -= taken;
    }
    return {};
}

void PrintCandidates(CLI::App& program, Words words, const ArgumentValues& valuesOf) {
    if (words.empty()) {
        words.emplace_back();
    }
    for (std::string& word : words) {
        word = Unquoted(word);
    }
    const std::string begun = words.back();
    words.pop_back();
    for (const std::string& word :
         Candidates(command_line::Find(program, words), begun, valuesOf)) {
        if (word.rfind(begun, 0) == 0 && word.find('\n') == std::string::npos) {
            std::cout << word << '\n';
        }
    }
}

}  // namespace

void Command::AddCompletion(const char* name, const ArgumentValues& valuesOf) const {
    const auto words = std::make_shared<Words>();
    CLI::App* command = app_->add_subcommand(name, "")->group("");  // in no help
    command->add_option("WORD", *words);
    command->callback(
        [program = app_, words, valuesOf] { PrintCandidates(*program, *words, valuesOf); });
}

}  // namespace taviwireless
