// SPDX-License-Identifier: MIT
#include "base/command_line/position.h"

#include "base/split.h"

namespace taviwireless::command_line {

namespace {

CLI::App* FindCommand(CLI::App& group, const std::string& name) {
    for (CLI::App* command : group.get_subcommands([](CLI::App*) { return true; })) {
        if (command->get_name() == name) {
            return command;
        }
    }
    return nullptr;
}

// Takes "--name", "--name=value", "-n" or "-nvalue". Returns whether there is such an option.
bool TakeOption(Position& position, const std::string& word) {
    const bool isLong = word[1] == '-';
    const std::string name = word.substr(0, isLong ? word.find('=') : 2);
    const CLI::Option* option = FindOption(*position.command, name);
    if (option != nullptr && TakesValue(*option) && name == word) {
        position.option = option;
    }
    return option != nullptr;
}

size_t MostArguments(const CLI::App& command) {
    size_t count = 0;
    for (const CLI::Option* argument : ArgumentsOf(command)) {
        count += static_cast<size_t>(argument->get_items_expected_max());
    }
    return count;
}

// Returns whether the word may stand there.
bool Take(Position& position, const std::string& word) {
    if (position.option != nullptr) {
        position.option = nullptr;
        return true;
    }
    if (!position.onlyArguments && word == "--") {
        position.onlyArguments = true;
        return true;
    }
    if (!position.onlyArguments && word.size() > 1 && word[0] == '-') {
        return TakeOption(position, word);
    }
    if (!IsGroup(*position.command)) {
        position.arguments.push_back(word);
        return position.arguments.size() <= MostArguments(*position.command);
    }
    if (CLI::App* command = FindCommand(*position.command, word)) {
        position.command = command;
        return true;
    }
    position.wantsHelp = position.wantsHelp || word == kHelp;
    return word == kHelp;
}

}  // namespace

Position Find(CLI::App& program, const Words& words) {
    Position position{&program, {}, {}};
    for (const std::string& word : words) {
        if (!Take(position, word)) {
            position.unknown = word;
            break;
        }
    }
    return position;
}

std::vector<CLI::App*> CommandsIn(const CLI::App& command) {
    std::vector<CLI::App*> commands;
    for (const CLI::App* inner : command.get_subcommands({})) {
        if (!inner->get_group().empty()) {
            commands.push_back(const_cast<CLI::App*>(inner));
        }
    }
    return commands;
}

std::vector<const CLI::Option*> ArgumentsOf(const CLI::App& command) {
    return command.get_options([](const CLI::Option* option) { return option->get_positional(); });
}

std::vector<const CLI::Option*> OptionsOf(const CLI::App& command) {
    return command.get_options([](const CLI::Option* option) { return option->nonpositional(); });
}

// Not by CLI11's own function, which a lack of memory ends the program in.
const CLI::Option* FindOption(const CLI::App& command, const std::string& name) {
    for (const CLI::App* place = &command; place != nullptr; place = place->get_parent()) {
        for (const CLI::Option* option : place->get_options()) {
            if (option->check_name(name)) {
                return option;
            }
        }
    }
    return nullptr;
}

bool IsGroup(const CLI::App& command) {
    return !CommandsIn(command).empty();
}

bool TakesValue(const CLI::Option& option) {
    return option.get_items_expected_max() > 0;
}

Words WordsFor(const CLI::Option& option) {
    try {
        Words words = Split(
            const_cast<CLI::Option&>(option).get_validator(kWordsName)->get_description(), ',');
        for (std::string& word : words) {
            word.erase(0, word.find_first_not_of(' '));
        }
        return words;
    } catch (const CLI::OptionNotFound&) {
        return {};
    }
}

std::string FullName(const CLI::App& command) {
    const CLI::App* outer = command.get_parent();
    return (outer == nullptr ? "" : FullName(*outer) + ' ') + command.get_name();
}

}  // namespace taviwireless::command_line
