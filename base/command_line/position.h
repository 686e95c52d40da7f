// SPDX-License-Identifier: MIT
#ifndef TAVIWIRELESS_BASE_COMMAND_LINE_POSITION_H
#define TAVIWIRELESS_BASE_COMMAND_LINE_POSITION_H

#include <CLI/CLI.hpp>
#include <string>
#include <vector>

namespace taviwireless::command_line {

using Words = std::vector<std::string>;

// Where the words of a command line lead.
struct Position {
    CLI::App* command;                    // the last one that was named
    Words arguments;                      // of it
    std::string unknown;                  // the first word that is no command, option or argument
    const CLI::Option* option = nullptr;  // whose value has to follow the words
    bool wantsHelp = false;               // "help" stands where a command may stand
    bool onlyArguments = false;           // "--" was there
};
Position Find(CLI::App& program, const Words& words);

// The commands in one, and the arguments and options that it has itself, as the help shows them.
std::vector<CLI::App*> CommandsIn(const CLI::App& command);
std::vector<const CLI::Option*> ArgumentsOf(const CLI::App& command);
std::vector<const CLI::Option*> OptionsOf(const CLI::App& command);

// The option of this name that the command or one around it has; null when there is none.
const CLI::Option* FindOption(const CLI::App& command, const std::string& name);

bool IsGroup(const CLI::App& command);
bool TakesValue(const CLI::Option& option);
// The words that a value may be; none when it may be anything else.
Words WordsFor(const CLI::Option& option);
// Such as "taviwireless modem list".
std::string FullName(const CLI::App& command);

constexpr char kWordsName[] = "words";  // of the check for these
constexpr char kHelp[] = "help";

// The help about a command, in lines of at most these columns.
std::string HelpText(const CLI::App& command, size_t columns);

// What was perhaps meant instead of a wrong word, in brackets; empty when none of these is near.
std::string Guess(const std::string& wrong, const Words& words);

// What is wrong with a command line, in a sentence: that of an unknown word, or what CLI11 found.
std::string UnknownWord(CLI::App& program, const Position& position);
std::string Mistake(const Position& position, const CLI::ParseError& error);

}  // namespace taviwireless::command_line

#endif
