// The subcommands of the inspector, one cmd_*.cpp each.
#pragma once

#include <stdexcept>
#include <string>

#include <CLI/CLI.hpp>

namespace inspector {

/// A call that cannot be carried out as it was made.
class UsageError : public std::runtime_error {
  public:
    using std::runtime_error::runtime_error;
};

/// Ends a command with 1 once it has said all: a loss or a difference was found.
struct DifferenceFound {};

void addLayoutCommand(CLI::App& app);
void addTypeCommand(CLI::App& app);
void addConvertCommand(CLI::App& app);
void addDimsCommand(CLI::App& app);
void addTimeCommand(CLI::App& app);
void addTableCommand(CLI::App& app);
void addMessagesCommand(CLI::App& app);
void addFlagsCommand(CLI::App& app);

} // namespace inspector
