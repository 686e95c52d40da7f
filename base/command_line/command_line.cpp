// SPDX-License-Identifier: MIT
#include "base/command_line/command_line.h"

#include <unistd.h>

#include <CLI/CLI.hpp>
#include <algorithm>
#include <cstdlib>
#include <iostream>
#include <optional>

#include "base/command_line/position.h"
#include "base/join.h"
#include "base/split.h"
#include "base/terminal_columns.h"

namespace taviwireless {

namespace {

using Words = const char*;

// A check that says what is wrong with a value; nothing in the help.
CLI::Validator Check(std::function<std::string(std::string&)> check) {
    return CLI::Validator(std::move(check), "");
}

bool IsNumberBetween(const std::string& text, int first, int last) {
    int number = 0;
    return CLI::detail::lexical_cast(text, number) && number >= first && number <= last;
}

// On a terminal as wide as can be read well; elsewhere what COLUMNS says, which manual pages use.
size_t HelpColumns() {
    constexpr int kNarrowest = 20;
    const int columns = ColumnsOf(STDOUT_FILENO);
    if (columns > 0) {
        return static_cast<size_t>(std::clamp(columns, kNarrowest, 100));
    }
    const char* text = getenv("COLUMNS");
    const int wanted = text == nullptr ? 0 : atoi(text);
    return static_cast<size_t>(wanted <= 0 ? 80 : std::clamp(wanted, kNarrowest, 9999));
}

void PrintHelp(const CLI::App& command) {
    std::cout << command_line::HelpText(command, HelpColumns());
}

}  // namespace

Argument& Argument::Required() {
    option_->required();
    return *this;
}

Argument& Argument::Between(int first, int last) {
    option_->check(Check([first, last](const std::string& text) {
        return IsNumberBetween(text, first, last)
                   ? ""
                   : '"' + text + "\" is no number from " + std::to_string(first) + " to " +
                         std::to_string(last);
    }));
    return *this;
}

Argument& Argument::ExistingFolder() {
    option_->check(Check([](std::string& path) {
        return CLI::ExistingDirectory(path).empty() ? "" : "there is no folder \"" + path + '"';
    }));
    return *this;
}

Argument& Argument::OneOf(const std::vector<std::string>& words) {
    std::string list;
    for (const std::string& word : words) {
        AddItem(list, word);
    }
    const auto check = [words, list](const std::string& text) {
        const bool isKnown = std::find(words.begin(), words.end(), text) != words.end();
        return isKnown ? ""
                       : '"' + text + "\" is none of " + list + command_line::Guess(text, words);
    };
    option_->check(check, list, command_line::kWordsName);
    return *this;
}

Argument& Argument::Needs(const Argument& other) {
    option_->needs(other.option_);
    return *this;
}

Argument& Argument::Excludes(const Argument& other) {
    option_->excludes(other.option_);
    return *this;
}

Command Command::AddGroup(const char* name, const char* description) const {
    CLI::App* group = app_->add_subcommand(name, description);
    group->require_subcommand(1);
    group->fallthrough();
    return Command(group);
}

Command Command::AddCommand(const char* name, const char* description,
                            std::function<void()> run) const {
    CLI::App* command = app_->add_subcommand(name, description);
    command->callback(std::move(run));
    command->fallthrough();
    return Command(command);
}

void Command::RequireCommand() const {
    app_->require_subcommand(1);
    app_->fallthrough();
}

template <typename Value>
Argument Command::AddOption(const char* names, Value& value, const char* description,
                            const char* type) const {
    CLI::Option* option = app_->add_option(names, value, description)->type_name(type);
    if (!option->get_positional()) {
        option->allow_extra_args(false);  // one value each time
    }
    if (option->get_items_expected_max() == 1) {
        option->take_last();
    }
    return Argument(option);
}

template Argument Command::AddOption(Words, std::string&, Words, Words) const;
template Argument Command::AddOption(Words, std::vector<std::string>&, Words, Words) const;
template Argument Command::AddOption(Words, std::optional<int>&, Words, Words) const;
template Argument Command::AddOption(Words, unsigned&, Words, Words) const;

Argument Command::AddFlag(const char* names, bool& value, const char* description) const {
    return Argument(app_->add_flag(names, value, description)->disable_flag_override());
}

void Command::AddFlag(const char* names, std::function<void()> run, const char* description) const {
    app_->add_flag_callback(names, std::move(run), description)->disable_flag_override();
}

void Command::SetVersion(const std::string& text) const {
    app_->set_version_flag("--version", text, "Print the version");
}

void Command::SetFooter(const std::string& text) const {
    app_->footer(text);
}

bool ReadCommandLine(int argc, char** argv, const char* name, const char* description,
                     const std::function<void(const Command& program)>& define) {
    CLI::App app(description, name);
    app.set_help_flag("-h,--help", "Print this help");
    define(Command(&app));
    const std::vector<std::string> words(argv + 1, argv + argc);
    const command_line::Position position = command_line::Find(app, words);
    if (!position.unknown.empty()) {
        throw UsageError(command_line::UnknownWord(app, position));
    }
    if (position.wantsHelp) {
        PrintHelp(*position.command);
        return false;
    }
    try {
        app.parse(argc, argv);
        return true;
    } catch (const CLI::CallForHelp&) {
        PrintHelp(*position.command);
    } catch (const CLI::CallForVersion& version) {
        std::cout << version.what() << '\n';
    } catch (const CLI::ParseError& error) {
        throw UsageError(command_line::Mistake(position, error));
    }
    return false;
}

}  // namespace taviwireless
