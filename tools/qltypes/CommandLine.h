// How the command is called: subcommands with their options, help and complaints. The parser behind it is known to one
// source only, because it takes long to compile.
//
//   Subcommand command = line.subcommand("table", "Lists the fixed types");
//   command.flag("--json", *asJson, "Print JSON with stable keys");
//   command.run([asJson] { print(*asJson ? tableJson() : tableText()); });
#pragma once

#include <functional>
#include <memory>
#include <optional>
#include <string>
#include <vector>

namespace CLI {
class App;
class Option;
} // namespace CLI

namespace inspector {

/// An option or a positional argument of a subcommand. Copies are the same option.
class Option {
  public:
    explicit Option(CLI::Option* option) : option_(option) {}

    Option required();
    Option excludes(Option other);
    Option needs(Option other);
    Option oneOf(const std::vector<std::string>& values);
    Option numValues(int number);
    /// Several values may stand in one argument.
    Option delimiter(char between);

  private:
    CLI::Option* option_; // owned by the command line
};

/// Where options put what was written. The variables must live until the command has run.
class Subcommand {
  public:
    explicit Subcommand(CLI::App* app) : app_(app) {}

    Option flag(const std::string& name, bool& isGiven, const std::string& help);
    Option option(const std::string& name, std::string& value, const std::string& help);
    Option option(const std::string& name, std::optional<std::string>& value, const std::string& help);
    Option option(const std::string& name, std::vector<std::string>& values, const std::string& help);
    void footer(const std::string& text);
    void run(std::function<void()> action);

  private:
    CLI::App* app_; // owned by the command line
};

class CommandLine {
  public:
    CommandLine(const std::string& name, const std::string& version, const std::string& description,
                const std::string& footer);
    ~CommandLine();

    Subcommand subcommand(const std::string& name, const std::string& description);

    /// Runs the subcommand that the arguments ask for, or prints help or version. False, with a complaint on standard
    /// error, where they cannot be read. What the subcommand throws comes through.
    bool run(int argc, char** argv);

  private:
    std::unique_ptr<CLI::App> app_;
};

} // namespace inspector
