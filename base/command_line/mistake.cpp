// SPDX-License-Identifier: MIT
// What is wrong with a command line, and what it was perhaps to be.
#include <algorithm>

#include "base/command_line/position.h"
#include "base/join.h"

namespace taviwireless::command_line {

namespace {

std::string Quoted(const std::string& text) {
    return '"' + text + '"';
}

// How many letters have to be changed, added, removed, or swapped with their neighbours, to make
// one word the other.
size_t Distance(const std::string& from, const std::string& to) {
    std::vector<size_t> before;
    std::vector<size_t> last(to.size() + 1);
    for (size_t j = 0; j < last.size(); ++j) {
        last[j] = j;
    }
    for (size_t i = 1; i <= from.size(); ++i) {
        std::vector<size_t> row = {i};
        for (size_t j = 1; j <= to.size(); ++j) {
            const size_t changed = last[j - 1] + (from[i - 1] == to[j - 1] ? 0 : 1);
            row.push_back(std::min({changed, last[j] + 1, row[j - 1] + 1}));
            if (i > 1 && j > 1 && from[i - 1] == to[j - 2] && from[i - 2] == to[j - 1]) {
                row[j] = std::min(row[j], before[j - 2] + 1);
            }
        }
        before = std::exchange(last, row);
    }
    return last.back();
}

// The word that was perhaps meant; empty when none is near.
std::string Nearest(const std::string& wrong, const Words& words) {
    std::string nearest;
    size_t least = std::max(size_t{1}, wrong.size() / 3) + 1;
    for (const std::string& word : words) {
        const bool isBegun = wrong.size() > 1 && word.rfind(wrong, 0) == 0;
        const size_t distance = isBegun ? 1 : Distance(wrong, word);
        if (distance < least) {
            least = distance;
            nearest = word;
        }
    }
    return nearest;
}

// Such as "modem list", or the program.
std::string ShortName(const CLI::App& command) {
    const CLI::App* outer = command.get_parent();
    const bool isBelow = outer != nullptr && outer->get_parent() != nullptr;
    return (isBelow ? ShortName(*outer) + ' ' : "") + command.get_name();
}

std::string In(const CLI::App& command) {
    return command.get_parent() == nullptr ? "" : " in " + ShortName(command);
}

// The commands of this name, wherever they are.
void AddCommandsCalled(const std::string& name, const CLI::App& command, std::string& found) {
    for (const CLI::App* inner : CommandsIn(command)) {
        if (inner->get_name() == name) {
            AddItem(found, Quoted(FullName(*inner)), " or ");
        }
        AddCommandsCalled(name, *inner, found);
    }
}

std::string CommandMistake(CLI::App& program, const Position& position) {
    Words names;
    for (const CLI::App* command : CommandsIn(*position.command)) {
        names.push_back(command->get_name());
    }
    std::string guess = Guess(position.unknown, names);
    std::string elsewhere;
    AddCommandsCalled(position.unknown, program, elsewhere);
    if (!elsewhere.empty()) {
        guess = " (did you mean " + elsewhere + "?)";
    }
    return "there is no command " + Quoted(position.unknown) + In(*position.command) + guess;
}

std::string OptionMistake(const Position& position) {
    const std::string name = position.unknown.substr(0, position.unknown.find('='));
    Words names;
    const CLI::App* command = position.command;
    do {
        for (const CLI::Option* option : OptionsOf(*command)) {
            for (const std::string& known : option->get_lnames()) {
                names.push_back("--" + known);
            }
        }
        command = command->get_parent();
    } while (command != nullptr);
    return "there is no option " + Quoted(name) + In(*position.command) + Guess(name, names);
}

std::string SentenceOnUnknown(CLI::App& program, const Position& position) {
    if (position.unknown[0] == '-' && position.unknown.size() > 1 && !position.onlyArguments) {
        return OptionMistake(position);
    }
    if (IsGroup(*position.command)) {
        return CommandMistake(program, position);
    }
    const size_t count = position.arguments.size() - 1;
    return ShortName(*position.command) + " takes " +
           (count == 0 ? "no argument" : "no more arguments") + ": " + Quoted(position.unknown) +
           " is too many";
}

std::string MissingWord(const CLI::App& command) {
    if (IsGroup(command)) {
        std::string names;
        for (const CLI::App* inner : CommandsIn(command)) {
            AddItem(names, inner->get_name());
        }
        return ShortName(command) + " wants a command: " + names;
    }
    for (const CLI::Option* argument : ArgumentsOf(command)) {
        if (argument->get_required() && argument->count() == 0) {
            return ShortName(command) + " wants " + argument->get_name(true) + " (" +
                   argument->get_description() + ")";
        }
    }
    return ShortName(command) + " wants more";
}

// Options that do not go together, or not alone.
std::string WrongCompany(const CLI::App& command) {
    for (const CLI::Option* option : OptionsOf(command)) {
        for (const CLI::Option* other : option->get_excludes()) {
            if (option->count() > 0 && other->count() > 0) {
                return option->get_name() + " and " + other->get_name() + " exclude each other";
            }
        }
        for (const CLI::Option* other : option->get_needs()) {
            if (option->count() > 0 && other->count() == 0) {
                return option->get_name() + " is for use with " + other->get_name() + " only";
            }
        }
    }
    return "these options do not go together";
}

// CLI11 names the option at the beginning, a flag without its dashes.
std::string WrongCount(const CLI::App& command, const std::string& what) {
    const std::string name = what.substr(0, what.find_first_of(": "));
    const CLI::Option* option = FindOption(command, name);
    return option != nullptr && TakesValue(*option)
               ? name + " wants a value: " + option->get_description()
               : "--" + name + " takes no value";
}

std::string SeeHelp(const Position& position) {
    return "; see " + FullName(*position.command) + " --help";
}

}  // namespace

std::string Guess(const std::string& wrong, const Words& words) {
    const std::string meant = Nearest(wrong, words);
    return meant.empty() ? "" : " (did you mean " + Quoted(meant) + "?)";
}

std::string UnknownWord(CLI::App& program, const Position& position) {
    return SentenceOnUnknown(program, position) + SeeHelp(position);
}

std::string Mistake(const Position& position, const CLI::ParseError& error) {
    std::string sentence = error.what();  // for a value that is refused: the check's own
    if (dynamic_cast<const CLI::RequiredError*>(&error) != nullptr) {
        sentence = MissingWord(*position.command);
    } else if (dynamic_cast<const CLI::ArgumentMismatch*>(&error) != nullptr) {
        sentence = WrongCount(*position.command, sentence);
    } else if (dynamic_cast<const CLI::ValidationError*>(&error) == nullptr) {
        sentence = WrongCompany(*position.command);
    }
    return sentence + SeeHelp(position);
}

}  // namespace taviwireless::command_line
