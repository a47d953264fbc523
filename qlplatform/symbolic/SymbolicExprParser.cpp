#include "qlplatform/symbolic/SymbolicExprParser.h"

#include <algorithm>
#include <charconv>
#include <cstdio>
#include <limits>
#include <optional>
#include <span>
#include <string>
#include <string_view>
#include <vector>

#include "qlplatform/services/MessageTexts.h"
#include "qlplatform/services/Raise_internal.h"
#include "qlplatform/symbolic/ExprSpelling_internal.h"

namespace QL {
namespace {

constexpr const char* category = "Quillane:SymbolicExpr";
constexpr MessageText texts[] = {
    {category, "UnexpectedToken", "at byte {0}: expected {1}, found {2}"},
    {category, "InvalidNumber", "at byte {0}: '{1}' is no number, {2}"},
    {category, "UnknownFunction", "at byte {0}: there is no function '{1}'"},
    {category, "WrongNumberOfArguments", "at byte {0}: '{1}' takes {2} arguments, not {3}"},
    {category, "NestingTooDeep", "at byte {0}: the expression is nested deeper than {1} levels"},
    {category, "ListTooLong", "at byte {0}: the list that begins here has more dimensions than a list can have"},
};
const MessageTextTable registeredTexts(texts, std::size(texts));

// A list may have this many dimensions in a table.
constexpr std::size_t maxListLength = (std::size_t{1} << 23) - 1;

[[noreturn]] void raiseAt(const char* leaf, std::size_t position, auto... arguments) {
    hostservices::raise(category, leaf, static_cast<long>(position), std::move(arguments)...);
}

bool isBlank(char c) { return c == ' ' || (c >= '\t' && c <= '\r'); }
bool isDigit(char c) { return c >= '0' && c <= '9'; }
bool beginsName(char c) {
    return (c >= 'a' && c <= 'z') || (c >= 'A' && c <= 'Z') || c == '_' || static_cast<unsigned char>(c) > 127;
}
bool continuesName(char c) { return beginsName(c) || isDigit(c); }

struct Sign {
    std::string_view text;
    SymbolicOp op;
    Level level;
};

std::string_view trimmed(std::string_view text) {
    while (text.front() == ' ')
        text.remove_prefix(1);
    while (text.back() == ' ')
        text.remove_suffix(1);
    return text;
}

// The binary operators of a form, longer signs first.
std::vector<Sign> binarySigns(bool host) {
    std::vector<Sign> signs;
    for (int i = 0; i < numSymbolicOps; ++i) {
        const auto op = static_cast<SymbolicOp>(i);
        const Spelling spelling = spellingOf(op, host, host);
        if (spelling.level != atomLevel && numOperandsOf(op) == 2)
            signs.push_back({trimmed(spelling.text), op, spelling.level});
    }
    std::stable_sort(signs.begin(), signs.end(),
                     [](const Sign& a, const Sign& b) { return a.text.size() > b.text.size(); });
    return signs;
}

struct Function {
    std::string_view name;
    SymbolicOp op;
};

// The functions of both forms. rem is Rem, also where it is how a printer writes Modulo.
std::vector<Function> namedFunctions() {
    std::vector<Function> functions{{"power", SymbolicOp::Power}};
    for (int i = 0; i < numSymbolicOps; ++i) {
        const auto op = static_cast<SymbolicOp>(i);
        for (const bool host : {false, true}) {
            const Spelling spelling = spellingOf(op, host, host);
            if (spelling.level == atomLevel && !spelling.text.empty() && op != SymbolicOp::Modulo)
                functions.push_back({spelling.text, op});
        }
    }
    return functions;
}

// One entry to make, operands before what uses them.
struct Step {
    SymbolicOp op;
    std::size_t size; // number of operands; bytes of a symbol's name
    const char* name; // of a symbol
    double number;    // of a value
};

// Reads a text into steps. Operators and brackets that are open wait on a stack of their own, so that depth costs no
// recursion.
class Reader {
  public:
    Reader(std::string_view text, bool host, bool lists)
        : text_(text), host_(host), lists_(lists), signs_(signsOf(host)) {}

    const std::vector<Step>& read() {
        at_ = behindBlanks(0);
        if (lists_ && byte(at_) == '[') openList();
        do {
            const std::size_t begin = behindBlanks(at_);
            isBehindBlank_ = begin != at_;
            at_ = begin;
        } while (expectsOperand_ ? readOperand() : readBehindOperand());
        return steps_;
    }

  private:
    enum class Open { sign, parenthesis, call, list };
    // What waits for operands: an operator, or a bracket and how many operands were separated in it so far.
    struct Pending {
        Open kind;
        SymbolicOp op;
        Level level;
        std::size_t begin;
        std::size_t numSeparated;
    };
    struct Number {
        SymbolicOp op;
        double value;
        std::size_t end;
    };

    static const std::vector<Sign>& signsOf(bool host) {
        static const std::vector<Sign> c = binarySigns(false);
        static const std::vector<Sign> hostLanguage = binarySigns(true);
        return host ? hostLanguage : c;
    }

    char byte(std::size_t i) const { return i < text_.size() ? text_[i] : '\0'; }
    std::size_t behindBlanks(std::size_t i) const {
        while (isBlank(byte(i)))
            ++i;
        return i;
    }

    // Where an operand must begin.
    bool readOperand() {
        const char c = byte(at_);
        if (const std::optional<Number> number = numberAt(at_, false)) return take(*number);
        if (beginsName(c)) return readName();
        if (c == '-') return readMinus();
        if (c == '+')
            ++at_;
        else if (c == notSign())
            prefix(SymbolicOp::Not);
        else if (c == '(')
            open({Open::parenthesis, SymbolicOp::ND, orLevel, at_, 0}, at_ + 1);
        else
            fail(c == '[' ? "an operand, for a list of dimensions stands alone" : "an operand");
        return true;
    }

    bool readMinus() {
        const std::optional<Number> number = numberAt(behindBlanks(at_ + 1), true);
        // A power takes the number before the sign does.
        const bool isRaised = number && host_ && byte(behindBlanks(number->end)) == '^';
        if (number && !isRaised) return take(*number);
        prefix(SymbolicOp::UnaryMinus);
        return true;
    }

    char notSign() const { return host_ ? '~' : '!'; }
    void prefix(SymbolicOp op) { pending_.push_back({Open::sign, op, signLevel, at_++, 0}); }

    bool readName() {
        const std::size_t end = nameEnd(at_);
        const std::string_view name = text_.substr(at_, end - at_);
        const std::size_t next = behindBlanks(end);
        // In a list, a parenthesis behind a blank begins the next element.
        if (byte(next) == '(' && (next == end || !isDirectlyInList())) return openCall(name, next);
        if (name == "true" || name == "false")
            steps_.push_back({SymbolicOp::BoolSymbol, 0, nullptr, name == "true" ? 1.0 : 0.0});
        else
            steps_.push_back({SymbolicOp::StringSymbol, name.size(), name.data(), 0});
        at_ = end;
        expectsOperand_ = false;
        return true;
    }

    // A name, and names joined to it by points.
    std::size_t nameEnd(std::size_t begin) const {
        std::size_t end = begin;
        while (beginsName(byte(end))) {
            while (continuesName(byte(end)))
                ++end;
            if (byte(end) != '.' || !beginsName(byte(end + 1))) break;
            ++end;
        }
        return end;
    }

    bool openCall(std::string_view name, std::size_t parenthesis) {
        static const std::vector<Function> functions = namedFunctions();
        const auto found =
            std::find_if(functions.begin(), functions.end(), [&](const Function& f) { return f.name == name; });
        if (found == functions.end()) raiseAt("UnknownFunction", at_, std::string(name));
        open({Open::call, found->op, orLevel, at_, 0}, parenthesis + 1);
        return true;
    }

    void openList() {
        open({Open::list, SymbolicOp::ND, orLevel, at_, 0}, at_ + 1);
        if (byte(behindBlanks(at_)) != ']') return;
        at_ = behindBlanks(at_) + 1;
        closeBracket(0);
    }

    void open(const Pending& bracket, std::size_t next) {
        if (brackets_.size() == SymbolicExprParser::nestingLimit)
            raiseAt("NestingTooDeep", at_, static_cast<long>(SymbolicExprParser::nestingLimit));
        brackets_.push_back(pending_.size());
        pending_.push_back(bracket);
        at_ = next;
    }

    const Pending* bracket() const { return brackets_.empty() ? nullptr : &pending_[brackets_.back()]; }
    bool isDirectlyInList() const { return bracket() && bracket()->kind == Open::list; }

    bool take(const Number& number) {
        steps_.push_back({number.op, 0, nullptr, number.value});
        at_ = number.end;
        expectsOperand_ = false;
        return true;
    }

    // The number that begins there, if one does.
    std::optional<Number> numberAt(std::size_t begin, bool isNegative) const {
        const double sign = isNegative ? -1 : 1;
        if (beginsName(byte(begin))) {
            const std::string_view word = text_.substr(begin, nameEnd(begin) - begin);
            double value = 0;
            if (word == (host_ ? "Inf" : "inf"))
                value = std::numeric_limits<double>::infinity();
            else if (word == (host_ ? "NaN" : "nan"))
                value = std::numeric_limits<double>::quiet_NaN();
            else
                return std::nullopt;
            return Number{SymbolicOp::DoubleValue, sign * value, begin + word.size()};
        }
        if (!isDigit(byte(begin)) && !(byte(begin) == '.' && isDigit(byte(begin + 1)))) return std::nullopt;
        const std::size_t end = literalEnd(begin);
        const std::string_view literal = text_.substr(begin, end - begin);
        const double value = sign * valueOf(literal, begin);
        const bool isInt = std::all_of(literal.begin(), literal.end(), isDigit) &&
                           value >= std::numeric_limits<int>::min() && value <= std::numeric_limits<int>::max();
        return Number{isInt ? SymbolicOp::IntValue : SymbolicOp::DoubleValue, value, end};
    }

    std::size_t literalEnd(std::size_t begin) const {
        const auto behindDigits = [&](std::size_t i) {
            while (isDigit(byte(i)))
                ++i;
            return i;
        };
        std::size_t end = behindDigits(begin);
        if (byte(end) == '.') end = behindDigits(end + 1);
        if ((byte(end) | 0x20) == 'e') {
            ++end;
            if (byte(end) == '+' || byte(end) == '-') ++end;
            end = behindDigits(end);
        }
        return end;
    }

    double valueOf(std::string_view literal, std::size_t begin) const {
        const char* const end = literal.data() + literal.size();
        double value = 0;
        const auto [stop, error] = std::from_chars(literal.data(), end, value);
        if (error != std::errc()) refuse(begin, literal, "it is out of range");
        if (stop != end) refuse(begin, literal, "expected the digits of its exponent");
        const char next = byte(begin + literal.size());
        if (continuesName(next) || next == '.') refuse(begin, literal, "expected an operator behind it");
        // The host language rounds such a number.
        if (!host_ && std::all_of(literal.begin(), literal.end(), isDigit) && !isExactly(value, literal))
            refuse(begin, literal, "no double has this value; with a point it is rounded");
        return value;
    }

    // Whether the digits say that value.
    static bool isExactly(double value, std::string_view digits) {
        digits.remove_prefix(std::min(digits.find_first_not_of('0'), digits.size() - 1));
        char exact[400];
        const char* const end =
            std::to_chars(std::begin(exact), std::end(exact), value, std::chars_format::fixed, 0).ptr;
        return digits == std::string_view(exact, static_cast<std::size_t>(end - exact));
    }

    [[noreturn]] void refuse(std::size_t begin, std::string_view literal, std::string reason) const {
        std::size_t end = begin + literal.size();
        while (continuesName(byte(end)) || byte(end) == '.')
            ++end;
        raiseAt("InvalidNumber", begin, excerpt(begin, end), std::move(reason));
    }

    // Behind an operand: an operator, what separates or closes, or the end of the text.
    bool readBehindOperand() {
        const char c = byte(at_);
        if (isDirectlyInList() && isBehindBlank_ && beginsElement()) return separate(at_);
        if (at_ == text_.size() && brackets_.empty()) {
            reduce(orLevel);
            return false;
        }
        if (isList_) fail("the end of the text behind a list of dimensions");
        if (c == ',' && bracket() && bracket()->kind != Open::parenthesis) return separate(at_ + 1);
        if ((c == ')' && bracket() && bracket()->kind != Open::list) || (c == ']' && isDirectlyInList())) {
            reduce(orLevel);
            ++at_;
            closeBracket(bracket()->numSeparated + 1);
            return true;
        }
        const auto sign = std::find_if(signs_.begin(), signs_.end(),
                                       [&](const Sign& s) { return text_.substr(at_).starts_with(s.text); });
        if (sign == signs_.end()) failBehindOperand();
        reduce(sign->level);
        pending_.push_back({Open::sign, sign->op, sign->level, at_, 0});
        at_ += sign->text.size();
        expectsOperand_ = true;
        return true;
    }

    // Whether what stands behind a blank in a list is the next element.
    bool beginsElement() const {
        const char c = byte(at_);
        if (continuesName(c) || c == '.' || c == '(' || c == '[') return true;
        if (c == notSign()) return byte(at_ + 1) != '=';
        return (c == '-' || c == '+') && !isBlank(byte(at_ + 1));
    }

    bool separate(std::size_t next) {
        reduce(orLevel);
        ++pending_.back().numSeparated;
        at_ = next;
        expectsOperand_ = true;
        return true;
    }

    // Makes the operators that wait in the innermost bracket and bind at least as tightly as `level`.
    void reduce(Level level) {
        while (!pending_.empty() && pending_.back().kind == Open::sign && pending_.back().level >= level) {
            const SymbolicOp op = pending_.back().op;
            steps_.push_back({op, numOperandsOf(op), nullptr, 0});
            pending_.pop_back();
        }
    }

    void closeBracket(std::size_t numOperands) {
        const Pending closed = pending_.back();
        pending_.pop_back();
        brackets_.pop_back();
        expectsOperand_ = false;
        if (closed.kind == Open::parenthesis) return;
        if (closed.kind == Open::call && numOperands != numOperandsOf(closed.op)) {
            const std::string_view name = text_.substr(closed.begin, nameEnd(closed.begin) - closed.begin);
            raiseAt("WrongNumberOfArguments", closed.begin, std::string(name),
                    static_cast<long>(numOperandsOf(closed.op)), static_cast<long>(numOperands));
        }
        if (numOperands > maxListLength) raiseAt("ListTooLong", closed.begin);
        isList_ = closed.kind == Open::list;
        steps_.push_back({closed.op, numOperands, nullptr, 0});
    }

    [[noreturn]] void failBehindOperand() const {
        if (!bracket()) fail("an operator or the end of the text");
        const Open kind = bracket()->kind;
        const std::size_t opener = kind == Open::call ? text_.find('(', bracket()->begin) : bracket()->begin;
        fail(std::string(kind == Open::parenthesis ? "an operator" : "an operator, ','") + " or '" +
             (kind == Open::list ? "]" : ")") + "' for the '" + text_[opener] + "' at byte " + std::to_string(opener));
    }

    [[noreturn]] void fail(std::string expected) const {
        raiseAt("UnexpectedToken", at_, std::move(expected), shown());
    }

    // What stands at the current place, for a message.
    std::string shown() const {
        if (at_ == text_.size()) return "the end of the text";
        const char c = text_[at_];
        if (c < ' ' || c > '~') {
            if (continuesName(c)) return "'" + excerpt(at_, nameEnd(at_)) + "'";
            char digits[8];
            std::snprintf(digits, sizeof digits, "0x%02X", static_cast<unsigned>(static_cast<unsigned char>(c)));
            return std::string("the byte ") + digits;
        }
        if (isDigit(c)) return "'" + excerpt(at_, literalEnd(at_)) + "'";
        return "'" + excerpt(at_, std::max(nameEnd(at_), at_ + 1)) + "'";
    }

    std::string excerpt(std::size_t begin, std::size_t end) const {
        constexpr std::size_t longest = 60;
        const bool isCut = end - begin > longest;
        return std::string(text_.substr(begin, isCut ? longest : end - begin)) + (isCut ? "..." : "");
    }

    std::string_view text_;
    bool host_;
    bool lists_;
    const std::vector<Sign>& signs_;
    std::vector<Step> steps_;
    std::vector<Pending> pending_;
    std::vector<std::size_t> brackets_; // which pending ones are brackets
    std::size_t at_ = 0;
    bool expectsOperand_ = true;
    bool isBehindBlank_ = false;
    bool isList_ = false; // a list was read, which nothing may follow
};

unsigned long build(SymbolicExprTable& table, const std::vector<Step>& steps) {
    std::vector<unsigned long> ids;
    for (const Step& step : steps) {
        switch (step.op) {
        case SymbolicOp::StringSymbol:
            ids.push_back(table.addSymbol(std::string(step.name, step.size)));
            break;
        case SymbolicOp::IntValue:
            ids.push_back(table.addInt(static_cast<int>(step.number)));
            break;
        case SymbolicOp::DoubleValue:
            ids.push_back(table.addDouble(step.number));
            break;
        case SymbolicOp::BoolSymbol:
            ids.push_back(table.addBool(step.number != 0));
            break;
        default: {
            const auto first = ids.end() - static_cast<std::ptrdiff_t>(step.size);
            const unsigned long id = table.add(step.op, std::span(first, ids.end()));
            ids.erase(first, ids.end());
            ids.push_back(id);
        }
        }
    }
    return ids.back();
}

} // namespace

SymbolicExprParser::Result SymbolicExprParser::operator()(const char* text) const {
    try {
        Reader reader(text, hostLanguage_, lists_);
        return {build(table_, reader.read()), nullptr};
    } catch (const foundation::core::except::IException& refusal) {
        return {SymbolicExprTable::noExpr, qlsvCreateDiagnosticFromIException(refusal, false)};
    }
}

} // namespace QL
