#include "dims/Session.h"

#include <charconv>
#include <limits>

#include <fmt/format.h>

#include "qlplatform/language/ParseTree.h"
#include "qlplatform/services/Diagnostics.h"
#include "qlplatform/symbolic/SymbolicExpr.h"
#include "qlplatform/symbolic/SymbolicExprParser.h"
#include "qlplatform/symbolic/SymbolicExprSimplify.h"
#include "qltypes/dimensions/DummyValidator.h"
#include "qltypes/dimensions/NumericDims.h"

namespace inspector {
namespace {

using nlohmann::ordered_json;
using QL::SymbolicExpr;
using QL::SymbolicExprTable;
using QL::SymbolicOp;
using QLTypeSys::GenerateCodeFlags;
using QLTypeSys::SymbDimsRange;

constexpr int lowest = std::numeric_limits<int>::min();
constexpr int highest = std::numeric_limits<int>::max();

// A symbolic id is an expression id minus one.
unsigned long exprIdOf(int id) { return static_cast<unsigned long>(id + 1); }
int idOf(unsigned long exprId) { return static_cast<int>(exprId) - 1; }

std::string joined(const std::vector<std::string>& parts, const char* between) {
    return fmt::format("{}", fmt::join(parts, between));
}

std::vector<std::string> namesOf(const std::vector<const QLBlock*>& blocks) {
    std::vector<std::string> names;
    for (const QLBlock* block : blocks)
        names.push_back(block->name);
    return names;
}

// "  (by Resize, Crop)"
std::string statedBy(const std::vector<const QLBlock*>& blocks) {
    return blocks.empty() ? "" : "  (by " + joined(namesOf(blocks), ", ") + ")";
}

ordered_json boundJson(int bound, int open) { return bound == open ? ordered_json() : ordered_json(bound); }

class SignalDims : public QLTypeSys::NumericDims {
  public:
    explicit SignalDims(std::vector<long> dims) : dims_(std::move(dims)) {}
    std::size_t getNumDims() const override { return dims_.size(); }
    long getDim(std::size_t index) const override { return dims_[index]; }

  private:
    std::vector<long> dims_;
};

// Every identifier is a symbol; keeps the dimensions that the signal has no place for.
class SymbolReader : public QLTypeSys::DummyValidator {
  public:
    void reportLossOfSymbolicDimensions(qlsvDiagnosticImpl*&, unsigned long exprId) override { lost.push_back(exprId); }
    std::vector<unsigned long> lost;
};

// A message whose further lines show the text, and a line with a mark under the place.
struct MarkedMessage {
    std::string text; // without those lines
    std::size_t position = 0;
};

MarkedMessage markedMessage(const qlsvDiagnosticImpl& diagnostic) {
    const std::string whole = diagnostic.text(0);
    const auto& arguments = diagnostic.item(0).arguments;
    const std::string* const marker = arguments.empty() ? nullptr : boost::get<std::string>(&arguments.back());
    const bool isMarker = marker && marker->size() >= 2 && marker->find_first_not_of(' ') == marker->size() - 1;
    return {whole.substr(0, whole.find(":\n")), isMarker ? marker->size() - 2 : 0};
}

bool asksGreater(Verb verb) { return verb == Verb::AskGreater || verb == Verb::AskLess; }

} // namespace

std::string rangeText(const SymbDimsRange& range) {
    if (range.min == range.max) return fmt::format("= {}", range.min);
    if (range.min == lowest && range.max == highest) return "anything";
    if (range.max == highest) return fmt::format("at least {}", range.min);
    if (range.min == lowest) return fmt::format("at most {}", range.max);
    return fmt::format("{} to {}", range.min, range.max);
}

Answer Session::run(const Statement& statement) {
    switch (statement.verb) {
    case Verb::Let:
        return let(statement);
    case Verb::Bind:
        return bind(statement);
    case Verb::Register:
        return registerText(statement);
    case Verb::Show:
        return show(statement);
    case Verb::Simplify: {
        const std::string simplified = text(readSimplified(statement.operands[0]));
        return {simplified, {{"expression", simplified}}, {}};
    }
    case Verb::Eval:
        return eval(statement);
    case Verb::Block:
        block_ = facts_.block(statement.name.text);
        return {};
    case Verb::StateEqual:
    case Verb::StateGreater:
    case Verb::StateLess:
    case Verb::StateRange:
        return state(statement);
    case Verb::AskEqual:
    case Verb::AskGreater:
    case Verb::AskLess:
        return ask(statement);
    case Verb::AskRange:
        return askRange(statement);
    case Verb::List:
        if (statement.operands.empty()) return listModel();
        return statement.operands[0].text == "code" ? listCode() : listBlock(statement.name.text);
    case Verb::Help:
        return {statementHelp(), {}, {}};
    case Verb::Quit:
        return {};
    }
    return {};
}

int Session::read(const ScriptPart& expression) {
    if (const std::size_t zero = expression.text.find('\0'); zero != std::string::npos)
        fail(expression, "found the byte 0x00", zero);
    auto [exprId, diagnostic] = QL::SymbolicExprParser(table_.getExprTable(), false, true)(expression.text.c_str());
    failForSyntax(expression, diagnostic);
    return idOf(withNamesReplaced(exprId, expression));
}

// For the message of a parser, if there is one. It begins with the place, which stands in front of complaints already.
void Session::failForSyntax(const ScriptPart& text, qlsvDiagnosticImpl* diagnostic) const {
    if (!diagnostic) return;
    const long position = boost::get<long>(diagnostic->item(0).arguments[0]);
    const std::string complaint = diagnostic->text(0);
    qlsvDiscardDiagnostic(diagnostic);
    fail(text, complaint.substr(complaint.find(": ") + 2), static_cast<std::size_t>(position));
}

int Session::readSimplified(const ScriptPart& expression) {
    unsigned long scratch = 0;
    QL::SymbolicExprSimplify simplify(table_.getExprTable(), 10,
                                      QL::SymbolicExprSimplify::isVariantKeywordsSimCodegenFeatureOn());
    return idOf(simplify.simplify(exprIdOf(read(expression)), scratch));
}

// Builds the expression again with what the names stand for, operands before what uses them.
unsigned long Session::withNamesReplaced(unsigned long root, const ScriptPart& expression) {
    SymbolicExprTable& table = table_.getExprTable();
    std::unordered_map<unsigned long, unsigned long> replaced = names_;
    std::vector<unsigned long> open{root};
    while (!open.empty()) {
        const unsigned long id = open.back();
        const SymbolicExpr expr = table.get(id);
        const std::size_t numWaiting = open.size();
        std::vector<unsigned long> operands;
        for (std::size_t i = 0; i < expr.getNumOperands(); ++i) {
            const auto found = replaced.find(expr.getOperand(i));
            if (found == replaced.end())
                open.push_back(expr.getOperand(i));
            else
                operands.push_back(found->second);
        }
        if (open.size() > numWaiting && !replaced.contains(id)) continue;
        open.resize(numWaiting - 1);
        if (replaced.contains(id)) continue;
        for (const unsigned long operand : operands)
            if (table.get(operand).getNumDimensions() > 0)
                fail(expression, "a name that stands for a list of dimensions must stand alone");
        replaced[id] = operands.empty() ? id : table.add(expr.getOp(), operands);
    }
    return replaced[root];
}

std::string Session::text(int id) const { return table_.getSymbolicDims(id).toString(); }

Answer Session::let(const Statement& statement) {
    const unsigned long symbol = table_.getExprTable().addSymbol(statement.name.text);
    names_[symbol] = exprIdOf(read(statement.operands[0]));
    return {};
}

Answer Session::bind(const Statement& statement) {
    const SymbolicExpr value = table_.getSymbolicExpr(exprIdOf(readSimplified(statement.operands[0])));
    if (value.getOp() == SymbolicOp::IntValue)
        table_.registerValue(statement.name.text, value.getIntValue());
    else if (value.getOp() == SymbolicOp::DoubleValue)
        table_.registerValue(statement.name.text, value.getDoubleValue());
    else
        fail(statement.operands[0], fmt::format("expected a number, found '{}'", statement.operands[0].text));
    return {};
}

Answer Session::registerText(const Statement& statement) {
    const ScriptPart& source = statement.operands[0];
    std::vector<long> numeric;
    for (std::size_t i = 1; i < statement.operands.size(); ++i)
        numeric.push_back(bound(statement.operands[i], lowest));
    qlsvDiagnosticImpl* refusal = nullptr;
    delete_parse_tree(generate_parse_tree(source.text, &refusal));
    failForSyntax(source, refusal);
    SymbolReader reader;
    auto [exprId, diagnostic] = table_.registerSymbolicTExpr(source.text, SignalDims(numeric), reader);
    const MarkedMessage message = diagnostic ? markedMessage(*diagnostic) : MarkedMessage();
    qlsvDiscardDiagnostic(diagnostic);
    if (exprId == SymbolicExprTable::noExpr && !message.text.empty()) fail(source, message.text, message.position);
    Answer answer;
    if (exprId == SymbolicExprTable::noExpr) {
        answer.text = "not symbolic";
        answer.values["expression"] = nullptr;
    } else {
        exprId = withNamesReplaced(exprId, source);
        names_[table_.getExprTable().addSymbol(statement.name.text)] = exprId;
        answer.text = text(idOf(exprId));
        answer.values["expression"] = answer.text;
    }
    answer.values["lost"] = ordered_json::array();
    for (const unsigned long lost : reader.lost) {
        const std::string shown = lost == SymbolicExprTable::noExpr ? "a number" : text(idOf(lost));
        answer.text += fmt::format("  (without {})", shown);
        answer.values["lost"].push_back(shown);
    }
    if (!message.text.empty()) {
        answer.text += fmt::format("  ({})", message.text);
        answer.values["message"] = message.text;
    }
    return answer;
}

Answer Session::show(const Statement& statement) {
    const int id = read(statement.operands[0]);
    const std::string own = text(id);
    const std::string host = table_.getTorvexExpr(id);
    const std::string shown = own == host ? own : fmt::format("{}  (host language: {})", own, host);
    return {shown, {{"expression", own}, {"hostExpression", host}}, {}};
}

Answer Session::eval(const Statement& statement) {
    const int id = read(statement.operands[0]);
    SymbolicExprTable& table = table_.getExprTable();
    std::vector<std::string> symbols;
    table_.getSymbolicDimsSymbols(id, symbols);
    std::vector<std::string> unbound;
    for (const std::string& name : symbols)
        if (SymbolicExprTable::isUnsetValue(table.getValueId(table.addSymbol(name)))) unbound.push_back(name);
    if (!unbound.empty())
        return {fmt::format("not known, no value of {}", joined(unbound, ", ")),
                {{"values", {}}, {"unbound", unbound}},
                {}};
    const std::vector<double> values = table_.eval(id);
    std::vector<std::string> texts;
    for (const double value : values)
        texts.push_back(fmt::format("{}", value));
    const bool isList = table_.getSymbolicExpr(exprIdOf(id)).getOp() == SymbolicOp::ND;
    return {isList ? "[" + joined(texts, " ") + "]" : joined(texts, " "),
            {{"values", values}, {"unbound", ordered_json::array()}},
            {}};
}

Answer Session::state(const Statement& statement) {
    Fact fact;
    fact.verb = statement.verb;
    fact.statement = statement.whole;
    fact.block = block_;
    fact.first = readSimplified(statement.operands[0]);
    if (statement.verb == Verb::StateRange) {
        fact.min = bound(statement.operands[1], lowest);
        fact.max = bound(statement.operands[2], highest);
        if (statement.operands.size() > 3) fact.flags = hiddenBounds(statement.operands[3]);
        fact.second = fact.first;
    } else {
        fact.second = readSimplified(statement.operands[1]);
    }
    if (!table_.isaSymbolicDimension(fact.first) || !table_.isaSymbolicDimension(fact.second))
        fail(statement.whole, "nothing can be stated of INHERIT and NOSYMBOLIC");
    return {"", {}, facts_.state(fact)};
}

Answer Session::ask(const Statement& statement) {
    int first = readSimplified(statement.operands[0]);
    int second = readSimplified(statement.operands[1]);
    if (statement.verb == Verb::AskLess) std::swap(first, second);
    const bool isKnown = asksGreater(statement.verb) ? facts_.known().isGreaterThan(first, second)
                                                     : facts_.known().isEqual(first, second);
    return {isKnown ? "yes" : "not known", {{"known", isKnown}}, {}};
}

Answer Session::askRange(const Statement& statement) {
    const SymbDimsRange range = facts_.known().getRange(readSimplified(statement.operands[0]));
    return {rangeText(range), {{"min", boundJson(range.min, lowest)}, {"max", boundJson(range.max, highest)}}, {}};
}

Answer Session::listModel() const {
    std::vector<QLTypeSys::SymbolicDimsConstraint> facts;
    facts_.known().getSymbolicDimsConstraints(facts);
    Answer answer{facts.empty() ? "nothing" : "", {{"facts", ordered_json::array()}}, {}};
    for (const auto& fact : facts) {
        answer.text += text(fact.id) + statedBy(fact.blocks) + "\n";
        answer.values["facts"].push_back({{"expression", text(fact.id)}, {"blocks", namesOf(fact.blocks)}});
    }
    return answer;
}

Answer Session::listCode() const {
    Answer answer;
    const auto add = [&](const char* key, const char* sign, const auto& pairs) {
        answer.values[key] = ordered_json::array();
        for (const QLTypeSys::SymbolicDimsCGConstraint& pair : pairs) {
            answer.text +=
                fmt::format("{} {} {}{}\n", text(pair.first), sign, text(pair.second), statedBy(pair.blocks));
            answer.values[key].push_back(
                {{"first", text(pair.first)}, {"second", text(pair.second)}, {"blocks", namesOf(pair.blocks)}});
        }
    };
    std::vector<QLTypeSys::SymbolicDimsCGConstraint> pairs;
    facts_.known().getEquivalentSymbolicDims(pairs);
    add("equal", "==", pairs);
    facts_.known().getGreaterThanSymbolicDims(pairs);
    add("greater", ">", pairs);
    facts_.known().getLessThanSymbolicDims(pairs);
    add("less", "<", pairs);
    if (answer.text.empty()) answer.text = "nothing";
    return answer;
}

Answer Session::listBlock(const std::string& name) {
    std::vector<int> ids;
    facts_.known().getSymbolicDimsConstraints(facts_.block(name), ids);
    Answer answer{ids.empty() ? "nothing" : "", {{"facts", ordered_json::array()}}, {}};
    for (const int id : ids) {
        answer.text += text(id) + "\n";
        answer.values["facts"].push_back({{"expression", text(id)}});
    }
    return answer;
}

int Session::bound(const ScriptPart& part, int open) const {
    if (part.text == "*") return open;
    int value = 0;
    const char* const end = part.text.data() + part.text.size();
    const auto [stop, error] = std::from_chars(part.text.data(), end, value);
    if (error != std::errc() || stop != end)
        fail(part, fmt::format("expected an integer of 32 bits, or * for no bound, found '{}'", part.text));
    return value;
}

GenerateCodeFlags Session::hiddenBounds(const ScriptPart& words) const {
    if (words.text == "without lower") return QLTypeSys::omitLowerBound;
    if (words.text == "without upper") return QLTypeSys::omitUpperBound;
    if (words.text == "without both") return QLTypeSys::omitBothBounds;
    fail(words, fmt::format("expected 'without lower', 'without upper' or 'without both', found '{}'", words.text));
}

void Session::fail(const ScriptPart& at, const std::string& complaint, std::size_t offset) const {
    throw InputError(placeOf(file_, at, offset), complaint);
}

} // namespace inspector
