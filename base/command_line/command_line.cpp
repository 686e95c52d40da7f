#include "base/command_line/command_line.h"

#include <CLI/CLI.hpp>
#include <optional>

namespace taviwireless {

namespace {

// Nothing in the help.
CLI::Validator Silent(CLI::Validator validator) {
    return validator.description("");
}

}  // namespace

Argument& Argument::Required() {
    option_->required();
    return *this;
}

Argument& Argument::Between(int first, int last) {
    option_->check(Silent(CLI::Range(first, last)));
    return *this;
}

Argument& Argument::ExistingFolder() {
    option_->check(Silent(CLI::ExistingDirectory));
    return *this;
}

Argument& Argument::OneOf(const std::vector<std::string>& words) {
    option_->check(CLI::IsMember(words));
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
    return Argument(option);
}

using Words = const char*;
template Argument Command::AddOption(Words, std::string&, Words, Words) const;
template Argument Command::AddOption(Words, std::vector<std::string>&, Words, Words) const;
template Argument Command::AddOption(Words, std::optional<int>&, Words, Words) const;
template Argument Command::AddOption(Words, unsigned&, Words, Words) const;

Argument Command::AddFlag(const char* names, bool& value, const char* description) const {
    return Argument(app_->add_flag(names, value, description));
}

void Command::AddFlag(const char* names, std::function<void()> run, const char* description) const {
    app_->add_flag_callback(names, std::move(run), description);
}

void Command::SetVersion(const std::string& text) const {
    app_->set_version_flag("--version", text);
}

void Command::SetHelp(const char* description) const {
    app_->set_help_flag("-h,--help", description);
}

void Command::SetFooter(const std::string& text) const {
    app_->footer(text);
}

bool ReadCommandLine(int argc, char** argv, const char* name, const char* description,
                     const std::function<void(const Command& program)>& define) {
    CLI::App app(description, name);
    define(Command(&app));
    try {
        app.parse(argc, argv);
        return true;
    } catch (const CLI::ParseError& error) {
        if (error.get_exit_code() != static_cast<int>(CLI::ExitCodes::Success)) {
            throw UsageError(error.what());
        }
        app.exit(error);
        return false;
    }
}

}  // namespace taviwireless
