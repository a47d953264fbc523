// qltypes dims: a script of what is stated and asked of symbolic dimensions.
#include "Commands.h"

#include <cstdio>
#include <iostream>

#include <unistd.h>

#include <fmt/format.h>

#include "description/Files.h"
#include "dims/Dot.h"
#include "dims/Script.h"
#include "dims/Session.h"
#include "output/Json.h"
#include "output/Output.h"

namespace inspector {
namespace {

constexpr const char* standardInput = "(standard input)";

struct Options {
    std::string script = "-";
    std::string format = "text";
    bool asJson = false;
};

// What a refused statement is complained of with: the message, then what it contradicts.
void complain(const std::string& file, const Statement& statement, const Contradiction& found) {
    fmt::print(stderr, "{}: refused: {}\n", toText(placeOf(file, statement.whole)), found.message);
    for (const ScriptPart& earlier : found.against)
        fmt::print(stderr, "  contradicts {}: {}\n", toText(placeOf(file, earlier)), earlier.text);
}

std::string answerText(const Statement& statement, const Answer& answer) {
    if (answer.text.empty()) return "";
    if (answer.text.back() != '\n') return fmt::format("{} -> {}\n", statement.whole.text, answer.text);
    std::string text = statement.whole.text + " ->\n";
    for (std::size_t begin = 0; begin < answer.text.size();) {
        const std::size_t end = answer.text.find('\n', begin) + 1;
        text += "  " + answer.text.substr(begin, end - begin);
        begin = end;
    }
    return text;
}

nlohmann::ordered_json answerJson(const Statement& statement, const Answer& answer) {
    nlohmann::ordered_json json{{"line", statement.whole.line}, {"statement", statement.whole.text}};
    if (answer.values.is_object()) json.update(answer.values);
    if (answer.contradiction) {
        nlohmann::ordered_json against = nlohmann::ordered_json::array();
        for (const ScriptPart& earlier : answer.contradiction->against)
            against.push_back({{"line", earlier.line}, {"statement", earlier.text}});
        json["refused"] = {{"identifier", answer.contradiction->identifier},
                           {"message", answer.contradiction->message},
                           {"contradicts", against}};
    }
    return json;
}

void runScript(const std::string& file, const std::string& text, const Options& options) {
    const std::vector<Statement> script = readScript(file, text);
    Session session(file);
    std::string printed;
    nlohmann::ordered_json statements = nlohmann::ordered_json::array();
    bool isRefused = false;
    for (const Statement& statement : script) {
        if (statement.verb == Verb::Quit) break;
        const Answer answer = session.run(statement);
        if (answer.contradiction) complain(file, statement, *answer.contradiction);
        isRefused = isRefused || answer.contradiction;
        printed += answerText(statement, answer);
        if (options.format == "json") statements.push_back(answerJson(statement, answer));
    }
    if (options.format == "json")
        print(jsonText({{"statements", statements}}));
    else
        print(options.format == "dot" ? dotText(session) : printed);
    if (isRefused) throw DifferenceFound();
}

// A line at a time; what is wrong with one is said, and the next one is asked for.
void converse() {
    Session session(standardInput);
    print("Statements, a line each; help lists them.\n");
    std::string line;
    for (std::size_t number = 1; print("dims> "), std::getline(std::cin, line); ++number) {
        try {
            const auto statement = readStatement(standardInput, line, number);
            if (!statement) continue;
            if (statement->verb == Verb::Quit) return;
            const Answer answer = session.run(*statement);
            if (answer.contradiction) complain(standardInput, *statement, *answer.contradiction);
            print(answer.text.empty() || answer.text.back() == '\n' ? answer.text : answer.text + "\n");
        } catch (const InputError& e) {
            fmt::print(stderr, "{}\n", e.what());
        }
    }
    print("\n");
}

} // namespace

void addDimsCommand(CommandLine& line) {
    const auto options = std::make_shared<Options>();
    Subcommand command =
        line.subcommand("dims", "Runs a script that states facts of symbolic dimensions and asks what follows");
    command.option("SCRIPT", options->script,
                   "File of statements; - or nothing is standard input, with a prompt on a terminal");
    command.option("--format", options->format, "text, json, or dot: the facts at the end as a graph for Graphviz")
        .oneOf({"text", "json", "dot"});
    command.flag("--json", options->asJson, "Print JSON with stable keys");
    command.footer(
        "Statements, a line each, # begins a comment; A and B are expressions or lists of dimensions:\n" +
        statementHelp() +
        "Facts are stated and asked of simplified expressions. What contradicts them is refused: the message\n"
        "and the statements that it contradicts go to standard error, and the command ends with 1.\n"
        "Examples:\n"
        "  qltypes dims examples/filter_bank.dims\n"
        "  echo 'simplify (K*L + 2*K)/K' | qltypes dims\n"
        "  qltypes dims examples/filter_bank.dims --format dot | dot -Tsvg > facts.svg");
    command.run([options] {
        if (options->asJson) options->format = "json";
        const bool isStandardInput = options->script == "-";
        if (isStandardInput && options->format == "text" && isatty(STDIN_FILENO) == 1) return converse();
        if (isStandardInput)
            runScript(standardInput, readStandardInput(), *options);
        else
            runScript(options->script, readFileText(options->script), *options);
    });
}

} // namespace inspector
