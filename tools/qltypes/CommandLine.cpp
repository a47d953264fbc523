#include "CommandLine.h"

#include <utility>

#include <CLI/CLI.hpp>

namespace inspector {

Option Option::required() {
    option_->required();
    return *this;
}

Option Option::excludes(Option other) {
    option_->excludes(other.option_);
    return *this;
}

Option Option::needs(Option other) {
    option_->needs(other.option_);
    return *this;
}

Option Option::oneOf(const std::vector<std::string>& values) {
    option_->check(CLI::IsMember(values));
    return *this;
}

Option Option::numValues(int number) {
    option_->expected(number);
    return *this;
}

Option Option::delimiter(char between) {
    option_->delimiter(between);
    return *this;
}

Option Subcommand::flag(const std::string& name, bool& isGiven, const std::string& help) {
    return Option(app_->add_flag(name, isGiven, help));
}

Option Subcommand::option(const std::string& name, std::string& value, const std::string& help) {
    return Option(app_->add_option(name, value, help));
}

Option Subcommand::option(const std::string& name, std::optional<std::string>& value, const std::string& help) {
    return Option(app_->add_option(name, value, help));
}

Option Subcommand::option(const std::string& name, std::vector<std::string>& values, const std::string& help) {
    return Option(app_->add_option(name, values, help));
}

void Subcommand::footer(const std::string& text) { app_->footer(text); }

void Subcommand::run(std::function<void()> action) { app_->callback(std::move(action)); }

CommandLine::CommandLine(const std::string& name, const std::string& version, const std::string& description,
                         const std::string& footer)
    : app_(std::make_unique<CLI::App>(description, name)) {
    app_->set_version_flag("--version", name + " " + version);
    app_->require_subcommand(1);
    app_->footer(footer);
}

CommandLine::~CommandLine() = default;

Subcommand CommandLine::subcommand(const std::string& name, const std::string& description) {
    return Subcommand(app_->add_subcommand(name, description));
}

bool CommandLine::run(int argc, char** argv) {
    try {
        app_->parse(argc, argv);
    } catch (const CLI::ParseError& e) {
        return app_->exit(e) == 0; // help and version are thrown too
    }
    return true;
}

} // namespace inspector
