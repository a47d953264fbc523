// The subcommands of the inspector, one cmd_*.cpp each.
#pragma once

#include <stdexcept>
#include <string>

#include "CommandLine.h"

namespace inspector {

/// A call that cannot be carried out as it was made.
class UsageError : public std::runtime_error {
  public:
    using std::runtime_error::runtime_error;
};

/// Ends a command with 1 once it has said all: a loss or a difference was found.
struct DifferenceFound {};

void addLayoutCommand(CommandLine& line);
void addTypeCommand(CommandLine& line);
void addConvertCommand(CommandLine& line);
void addDimsCommand(CommandLine& line);
void addTimeCommand(CommandLine& line);
void addTableCommand(CommandLine& line);
void addMessagesCommand(CommandLine& line);
void addFlagsCommand(CommandLine& line);

} // namespace inspector
