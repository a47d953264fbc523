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

void addLayoutCommand(CLI::App& app);

} // namespace inspector
