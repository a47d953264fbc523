#include "dims/Script.h"

#include <algorithm>

#include <fmt/format.h>

namespace inspector {
namespace {

// What stands behind a verb.
enum class Shape { Nothing, Assignment, Registration, Name, Operands, Words };

struct VerbRow {
    const char* word;
    Verb verb;
    Shape shape;
    std::size_t minOperands;
    std::size_t maxOperands;
    const char* usage;
    const char* meaning;
};

// clang-format off
constexpr VerbRow verbs[] = {
    {"let",      Verb::Let,          Shape::Assignment, 1, 1, "let NAME = A",            "NAME stands for A from here on"},
    {"bind",     Verb::Bind,         Shape::Assignment, 1, 1, "bind NAME = NUMBER",      "the value of a symbol, for eval"},
    {"register", Verb::Register,     Shape::Registration, 1, 0, "register NAME(D, ...) = TEXT", "the same, read from the host language for a signal of these numeric dimensions"},
    {"show",     Verb::Show,         Shape::Operands,   1, 1, "show A",                  "the expression, C-like and in the host language"},
    {"simplify", Verb::Simplify,     Shape::Operands,   1, 1, "simplify A",              "the simplified form"},
    {"eval",     Verb::Eval,         Shape::Operands,   1, 1, "eval A",                  "the value under the bindings"},
    {"block",    Verb::Block,        Shape::Name,       0, 0, "block NAME",              "who states the facts from here on"},
    {"equal",    Verb::StateEqual,   Shape::Operands,   2, 2, "equal A, B",              "states that A equals B"},
    {"greater",  Verb::StateGreater, Shape::Operands,   2, 2, "greater A, B",            "states that A exceeds B"},
    {"less",     Verb::StateLess,    Shape::Operands,   2, 2, "less A, B",               "states that A is below B"},
    {"range",    Verb::StateRange,   Shape::Operands,   3, 4, "range A, MIN, MAX",       "states bounds, * for none; then: , without lower|upper|both (in code)"},
    {"equal?",   Verb::AskEqual,     Shape::Operands,   2, 2, "equal? A, B",             "whether that is known; of lists, the sizes"},
    {"greater?", Verb::AskGreater,   Shape::Operands,   2, 2, "greater? A, B",           "whether that is known"},
    {"less?",    Verb::AskLess,      Shape::Operands,   2, 2, "less? A, B",              "whether that is known"},
    {"range?",   Verb::AskRange,     Shape::Operands,   1, 1, "range? A",                "the bounds that are known"},
    {"list",     Verb::List,         Shape::Words,      0, 2, "list [code | block NAME]", "the facts: all, as for generated code, or those of a block"},
    {"help",     Verb::Help,         Shape::Nothing,    0, 0, "help",                    "these lines"},
    {"quit",     Verb::Quit,         Shape::Nothing,    0, 0, "quit",                    "ends the script"},
};
// clang-format on

bool isBlank(char c) { return c == ' ' || (c >= '\t' && c <= '\r'); }
bool beginsName(char c) {
    return (c >= 'a' && c <= 'z') || (c >= 'A' && c <= 'Z') || c == '_' || static_cast<unsigned char>(c) > 127;
}
bool continuesName(char c) { return beginsName(c) || (c >= '0' && c <= '9') || c == '.'; }

ScriptPart trimmed(ScriptPart part) {
    const auto begin = std::find_if_not(part.text.begin(), part.text.end(), isBlank);
    part.column += static_cast<std::size_t>(begin - part.text.begin());
    part.text.erase(part.text.begin(), begin);
    while (!part.text.empty() && isBlank(part.text.back()))
        part.text.pop_back();
    return part;
}

// The part from `begin` up to before `end`, without the blanks around it.
ScriptPart part(const ScriptPart& whole, std::size_t begin, std::size_t end = std::string::npos) {
    begin = std::min(begin, whole.text.size());
    return trimmed(
        {whole.text.substr(begin, end == std::string::npos ? end : end - begin), whole.line, whole.column + begin});
}

// Splits at commas outside of brackets.
std::vector<ScriptPart> operandsOf(const ScriptPart& text) {
    std::vector<ScriptPart> operands;
    int depth = 0;
    std::size_t begin = 0;
    for (std::size_t i = 0; i < text.text.size(); ++i) {
        const char c = text.text[i];
        if (c == '(' || c == '[') ++depth;
        if (c == ')' || c == ']') --depth;
        if (c != ',' || depth > 0) continue;
        operands.push_back(part(text, begin, i));
        begin = i + 1;
    }
    if (!text.text.empty()) operands.push_back(part(text, begin));
    return operands;
}

class LineReader {
  public:
    LineReader(const std::string& file, ScriptPart line) : file_(file), line_(std::move(line)) {}

    Statement read() const {
        const std::size_t wordEnd = endOf(0, [](char c) { return !isBlank(c); });
        const std::string word = line_.text.substr(0, wordEnd);
        const auto row =
            std::find_if(std::begin(verbs), std::end(verbs), [&](const VerbRow& r) { return word == r.word; });
        if (row == std::end(verbs)) fail(line_, fmt::format("there is no statement '{}'; help lists them", word));
        Statement statement{row->verb, line_, {}, {}};
        const ScriptPart rest = part(line_, wordEnd);
        switch (row->shape) {
        case Shape::Nothing:
            if (!rest.text.empty()) fail(rest, fmt::format("expected nothing behind '{}'", word));
            break;
        case Shape::Name:
            statement.name = rest;
            checkName(rest);
            break;
        case Shape::Assignment:
            readAssignment(statement, rest, row->usage);
            break;
        case Shape::Registration:
            readRegistration(statement, rest, row->usage);
            break;
        case Shape::Words:
            readWords(statement, rest);
            break;
        case Shape::Operands:
            statement.operands = operandsOf(rest);
            if (statement.operands.size() < row->minOperands || statement.operands.size() > row->maxOperands)
                fail(rest, fmt::format("expected {}", row->usage));
            break;
        }
        return statement;
    }

  private:
    template <class Belongs> std::size_t endOf(std::size_t begin, Belongs belongs) const {
        while (begin < line_.text.size() && belongs(line_.text[begin]))
            ++begin;
        return begin;
    }

    void readAssignment(Statement& statement, const ScriptPart& rest, const char* usage) const {
        const std::size_t sign = rest.text.find('=');
        if (sign == std::string::npos) fail(rest, fmt::format("expected {}", usage));
        statement.name = part(rest, 0, sign);
        checkName(statement.name);
        statement.operands = {part(rest, sign + 1)};
    }

    void readRegistration(Statement& statement, const ScriptPart& rest, const char* usage) const {
        const std::size_t open = rest.text.find('(');
        const std::size_t close = rest.text.find(')');
        const std::size_t sign = rest.text.find('=');
        if (open == std::string::npos || !(open < close && close < sign && sign != std::string::npos))
            fail(rest, fmt::format("expected {}", usage));
        if (const ScriptPart between = part(rest, close + 1, sign); !between.text.empty())
            fail(between, fmt::format("expected '=', found '{}'", between.text));
        statement.name = part(rest, 0, open);
        checkName(statement.name);
        statement.operands = operandsOf(part(rest, open + 1, close));
        statement.operands.insert(statement.operands.begin(), part(rest, sign + 1));
    }

    void readWords(Statement& statement, const ScriptPart& rest) const {
        std::size_t end = 0;
        while (end < rest.text.size() && !isBlank(rest.text[end]))
            ++end;
        const ScriptPart what = part(rest, 0, end);
        const ScriptPart name = part(rest, end);
        if (what.text == "block") {
            checkName(name);
            statement.name = name;
        } else if ((!what.text.empty() && what.text != "code") || !name.text.empty()) {
            fail(rest, "expected nothing, 'code', or 'block' and its name behind 'list'");
        }
        if (!what.text.empty()) statement.operands = {what};
    }

    void checkName(const ScriptPart& name) const {
        const std::string& text = name.text;
        if (text.empty() || !beginsName(text.front()) || !std::all_of(text.begin(), text.end(), continuesName))
            fail(name, fmt::format("expected a name, found '{}'", text));
    }

    [[noreturn]] void fail(const ScriptPart& at, const std::string& complaint) const {
        throw InputError(placeOf(file_, at), complaint);
    }

    const std::string& file_;
    ScriptPart line_;
};

} // namespace

Place placeOf(const std::string& file, const ScriptPart& part, std::size_t offset) {
    return {file, fmt::format("{}:{}", part.line, part.column + offset)};
}

std::optional<Statement> readStatement(const std::string& file, std::string_view line, std::size_t lineNumber) {
    const ScriptPart text = trimmed({std::string(line.substr(0, line.find('#'))), lineNumber, 1});
    if (text.text.empty()) return std::nullopt;
    return LineReader(file, text).read();
}

std::vector<Statement> readScript(const std::string& file, std::string_view text) {
    std::vector<Statement> script;
    for (std::size_t number = 1; !text.empty(); ++number) {
        const std::string_view line = text.substr(0, text.find('\n'));
        text.remove_prefix(std::min(line.size() + 1, text.size()));
        if (auto statement = readStatement(file, line, number)) script.push_back(*std::move(statement));
    }
    return script;
}

std::string statementHelp() {
    std::string text;
    for (const VerbRow& row : verbs)
        text += fmt::format("  {:<30}{}\n", row.usage, row.meaning);
    return text;
}

} // namespace inspector
