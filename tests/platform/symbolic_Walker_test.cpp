// The walker from texts to expressions, and what it tells its checker.
#include <cmath>
#include <limits>
#include <map>

#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include "qlplatform/arrays/HostElements.h"
#include "qlplatform/services/Diagnostics.h"
#include "qlplatform/services/MessageTexts.h"
#include "qlplatform/strings/Strings.h"
#include "qlplatform/symbolic/SymbolicExpr.h"
#include "qlplatform/symbolic/SymbolicExprFromTParseTree.h"
#include "qlplatform/symbolic/SymbolicExprPrinter.h"
#include "tests/support/FailingNew.h"
#include "tests/support/Raises.h"
#include "tests/support/Slots.h"

namespace {

using QL::SymbolicExprTable;
using QL::SymbolicOp;
using testing::ElementsAre;
using testsupport::describe;
using testsupport::expectedMessage;
using testsupport::slotOf;
using Node = _T_parse_tree_T<char>;
using Array = std::shared_ptr<const txArray_tag>;

Array array(txArray_tag* made) { return {made, txDestroyArray}; }

// A walker whose answers a test sets; every identifier is a symbol unless `symbols` says something else.
class Walker : public QL::SymbolicExprFromTParseTree {
  public:
    explicit Walker(SymbolicExprTable& table) : SymbolicExprFromTParseTree(table) { setErrorChecker(checker); }
    bool readsMatrixAsList() const override { return lists; }
    bool shouldCreateIntValueNodeForIntegerValue() const override { return keepsClass; }
    bool supportLogicalValues() const override { return logicals; }
    bool acceptsNode(Node* node, const char*) override { return node->operatorCode() != refused; }
    QL::SymbolRecord resolveSymbol(const std::string& name, const char*, unsigned long position) override {
        asked.push_back(name + "@" + std::to_string(position));
        const auto found = symbols.find(name);
        return found == symbols.end() ? QL::SymbolRecord{nullptr, name} : found->second;
    }
    using SymbolicExprFromTParseTree::operator();
    Registration operator()(const char* text) { return (*this)(qlsvUtf16FromUtf8(text)); }

    QL::QLSymbolicExprErrorChecker checker;
    std::map<std::string, QL::SymbolRecord> symbols;
    std::vector<std::string> asked;
    bool lists = true;
    bool keepsClass = false;
    bool logicals = true;
    ParseOperator refused = ParseOperator::cell;
};

class SymbolicWalker : public testing::Test {
  protected:
    std::string shown(unsigned long id) {
        if (id == SymbolicExprTable::noExpr) return "none";
        return QL::SymbolicExprPrinter(table, QL::SymbolicExprPrinter::Predicate::instance(), false, false, false,
                                       {})(table.get(id));
    }

    // The expression in C's form and what was said of the text; nothing more when nothing was.
    std::string read(const std::string& text) {
        auto [id, diagnostic] = walk(text.c_str());
        std::string result = shown(id);
        if (diagnostic) result += "\n" + describe(diagnostic);
        qlsvDiscardDiagnostic(diagnostic);
        return result;
    }

    std::string number(const Array& value) {
        const unsigned long id = walk.getNumberFromTxArray(value.get(), "N", "2*N", 2);
        std::string result = shown(id);
        if (walk.checker.pending()) result += "\n" + describe(walk.checker.pending());
        walk.checker.clearPending();
        return result;
    }

    SymbolicExprTable table{QL::SymbolDomain::Integers};
    Walker walk{table};
};

TEST_F(SymbolicWalker, ReadsTexts) {
    const char* rows[][2] = {
        {"N", "N"},
        {" ( N ) % comment", "N"},
        {"N + 2*M - 1", "N + 2*M - 1"},
        {"N .* M", "N*M"},
        {"N/M", "N/M"},
        {"N./M", "N/M"},
        {"N\\M", "M/N"},
        {"N.\\M", "M/N"},
        {"2^N", "pow(2, N)"},
        {"2.^N", "pow(2, N)"},
        {"-N", "-N"},
        {"+N", "N"},
        {"N'", "N"},
        {"N.'", "N"},
        {"N < M", "N < M"},
        {"N <= M", "N <= M"},
        {"N > M", "N > M"},
        {"N >= M", "N >= M"},
        {"N == M", "N == M"},
        {"N ~= M", "N != M"},
        {"N & M", "N && M"},
        {"N && M", "N && M"},
        {"N | M", "N || M"},
        {"N || M", "N || M"},
        {"~N", "!N"},
        {"abs(N)", "abs(N)"},
        {"ceil(N)", "ceil(N)"},
        {"fix(N)", "trunc(N)"},
        {"floor(N)", "floor(N)"},
        {"round(N)", "round(N)"},
        {"not(N)", "!N"},
        {"min(N, M)", "min(N, M)"},
        {"max(N, M)", "max(N, M)"},
        {"mod(N, M)", "mod(N, M)"},
        {"rem(N, M)", "N % M"},
        {"power(N, M)", "pow(N, M)"},
        {"eq(N, M)", "N == M"},
        {"ne(N, M)", "N != M"},
        {"lt(N, M)", "N < M"},
        {"le(N, M)", "N <= M"},
        {"gt(N, M)", "N > M"},
        {"ge(N, M)", "N >= M"},
        {"and(N, M)", "N && M"},
        {"or(N, M)", "N || M"},
        {"max(N, min(M, 3)) + 1", "max(N, min(M, 3)) + 1"},
        {"true", "true"},
        {"N == false", "N == false"},
        {"12", "12"},
        {"1e3", "1000"},
        {"1d3", "1000"},
        {"3.0", "3"},
        {"0x1F", "31"},
        {"0b101u8", "5"},
        {"-5", "-5"},
        {"-(5)", "-(5)"},
        {"-2147483648", "-2147483648"},
        {"N - 5", "N - 5"},
        {"-2^2", "-pow(2, 2)"},
        {"[N M 3]", "[N M 3]"},
        {"[N, M, 3,]", "[N M 3]"},
        {"[N; M; 3]", "[N M 3]"},
        {"[N\n M]", "[N M]"},
        {"[1 -2]", "[1 -2]"},
        {"[1 - 2]", "1 - 2"},
        {"[N]", "N"},
        {"([N M])", "[N M]"},
    };
    for (const auto& row : rows) {
        SCOPED_TRACE(row[0]);
        EXPECT_EQ(read(row[0]), row[1]);
    }
}

TEST_F(SymbolicWalker, LiteralsAreIntegersAndTheirMinusBelongsToThem) {
    const auto op = [&](const char* text) { return table.get(walk(text).first).getOp(); };
    EXPECT_EQ(walk("12").first, table.addInt(12));
    EXPECT_EQ(walk("-12").first, table.addInt(-12));
    EXPECT_EQ(walk("-2147483648").first, table.addInt(std::numeric_limits<int>::min()));
    EXPECT_EQ(op("-N"), SymbolicOp::UnaryMinus);
    EXPECT_EQ(walk("true").first, table.addBool(true));
    walk.keepsClass = true; // which is about values, not about literals
    EXPECT_EQ(walk("12").first, table.addInt(12));
}

TEST_F(SymbolicWalker, ComplaintsOfTheBase) {
    const std::string c = "Quillane:SymbolicExpr:";
    struct Row {
        const char* text;
        const char* expression;
        std::string leaf;
        const char* name;
        std::size_t position;
    };
    const Row rows[] = {
        {"2 + s.x", "none", "UnhandledExpression", "s.x", 4},
        {"s.('x')", "none", "UnhandledExpression", "s.('x')", 0},
        {"2 + s.x(3)", "none", "UnhandledExpression", "s.x(3)", 4},
        {"c{2}", "none", "UnhandledExpression", "c{2}", 0},
        {"1:N", "none", "UnhandledExpression", "1:N", 0},
        {"2*[N M]", "none", "UnhandledExpression", "[N M]", 2},
        {"[N [M 2]]", "none", "UnhandledExpression", "[M 2]", 3},
        {"[N M; 2 3]", "none", "UnhandledExpression", "[N M; 2 3]", 0},
        {"[]", "none", "UnhandledExpression", "[]", 0},
        {"[;]", "none", "UnhandledExpression", "[;]", 0},
        {"@sin", "none", "UnhandledExpression", "@sin", 0},
        {"@(x) x", "none", "UnhandledExpression", "@(x) x", 0},
        {"min(N, :)", "none", "UnhandledExpression", ":", 7},
        {"min(N, end)", "none", "UnhandledExpression", "end", 7},
        {"2*sqrt(N)", "none", "UnsupportedFunction", "sqrt", 2},
        {"N(2)", "none", "UnsupportedFunction", "N", 0},
        {"N + 3i", "none", "ComplexValue", "3i", 4},
        {"2*'N'", "none", "InvalidLiteral", "'N'", 2},
        {"2*\"N\"", "none", "InvalidLiteral", "\"N\"", 2},
        {"N*0.5", "N*0.5", "InvalidLiteral", "0.5", 2},
        {"N - -0.5", "N - -0.5", "InvalidLiteral", "-0.5", 4},
        {"N*1e999", "N*inf", "InvalidLiteral", "1e999", 2},
        {"N*Inf", "N*inf", "InvalidLiteral", "Inf", 2},
        {"N*inf", "N*inf", "InvalidLiteral", "inf", 2},
        {"N*NaN", "N*nan", "InvalidLiteral", "NaN", 2},
        {"N*nan", "N*nan", "InvalidLiteral", "nan", 2},
        {"N + 2147483648", "N + 2147483648.0", "IntegerLiteralOverflow", "2147483648", 4},
        {"-2147483649", "-2147483649.0", "IntegerLiteralOverflow", "-2147483649", 0},
    };
    for (const Row& row : rows) {
        SCOPED_TRACE(row.text);
        EXPECT_EQ(read(row.text), row.expression + ("\n" + expectedMessage(c + row.leaf, row.name, row.text,
                                                                           std::string(row.position + 1, ' ') + "^")));
    }
    EXPECT_EQ(read("2*abs(N, M)"),
              "none\n" + expectedMessage(c + "InvalidNumArguments", "abs", 2, 1, "2*abs(N, M)", "   ^"));
    EXPECT_EQ(read("min(N)"), "none\n" + expectedMessage(c + "InvalidNumArguments", "min", 1, 2, "min(N)", " ^"));
    EXPECT_EQ(read("max()"), "none\n" + expectedMessage(c + "InvalidNumArguments", "max", 0, 2, "max()", " ^"));
    EXPECT_EQ(read("[N \xC3\xA4]"), "none\n" + expectedMessage(c + "NonAsciiText", u"[N \u00e4]"));
    walk.logicals = false;
    EXPECT_EQ(read("N + true"), "none\n" + expectedMessage(c + "LogicalValue", "true", "N + true", "     ^"));
}

TEST_F(SymbolicWalker, TheDivisionOfTheBaseIsReportedAtItsSign) {
    qlsvDiagnosticImpl* refusal = nullptr;
    Node* tree = generate_parse_tree("2*N /M", &refusal);
    walk.checker.reportDivisionExpr(tree->child(0), "2*N /M");
    EXPECT_EQ(describe(walk.checker.pending()),
              expectedMessage("Quillane:SymbolicExpr:UnsupportedDivision", "2*N /M", "2*N /M", "     ^"));
    EXPECT_EQ(walk.checker.pending()->text(), "the division in '2*N /M' is not supported:\n  2*N /M\n      ^");
    delete_parse_tree(tree);
}

TEST_F(SymbolicWalker, EveryMessageHasAText) {
    for (const char* text : {"s.x", "sqrt(N)", "abs()", "3i", "0.5", "2147483648", "\xC3\xA4", "N +"}) {
        SCOPED_TRACE(text);
        qlsvDiagnosticImpl* diagnostic = walk(text).second;
        for (int i = 0; i < qlsvGetNumItemsInDiagnostic(diagnostic); ++i)
            EXPECT_NE(qlsvFindMessageText(diagnostic->item(static_cast<std::size_t>(i))), nullptr);
        qlsvDiscardDiagnostic(diagnostic);
    }
}

TEST_F(SymbolicWalker, WhatTheParserRefuses) {
    EXPECT_EQ(read("[N 3"),
              "none\n" + expectedMessage("Quillane:SymbolicExpr:InvalidExpression", "[N 3", "     ^") + "\n" +
                  expectedMessage("Quillane:Language:UnexpectedToken", 4,
                                  "an operator, ',', ';' or ']' for the '[' at byte 0", "the end of the text"));
    const std::string nul = read(std::string("N\0M", 3));
    EXPECT_EQ(nul.substr(0, nul.find('(')), "N"); // what a text that ends in a zero says
    auto [id, diagnostic] = walk(std::u16string(u"N\0M", 3));
    EXPECT_EQ(id, SymbolicExprTable::noExpr);
    EXPECT_EQ(qlsvGetNumItemsInDiagnostic(diagnostic), 2);
    qlsvDiscardDiagnostic(diagnostic);
}

TEST_F(SymbolicWalker, ComplaintsComeTogetherInTheOrderOfTheText) {
    const std::string text = "[0.5*N, s.x + sqrt(M), 2i]";
    const auto message = [&](const char* leaf, const char* name) {
        return "\n" + expectedMessage(std::string("Quillane:SymbolicExpr:") + leaf, name, text,
                                      std::string(text.find(name) + 1, ' ') + "^");
    };
    EXPECT_EQ(read(text), "none" + message("InvalidLiteral", "0.5") + message("UnhandledExpression", "s.x") +
                              message("UnsupportedFunction", "sqrt") + message("ComplexValue", "2i"));
    EXPECT_EQ(read("N"), "N"); // nothing is left over
}

TEST_F(SymbolicWalker, ATextOfErrorsIsNotReadToItsEnd) {
    std::string text = "[";
    for (int i = 0; i < 20000; ++i)
        text += "1i ";
    auto [id, diagnostic] = walk((text + "]").c_str());
    EXPECT_EQ(id, SymbolicExprTable::noExpr);
    EXPECT_EQ(qlsvGetNumItemsInDiagnostic(diagnostic), Walker::maxMessages);
    qlsvDiscardDiagnostic(diagnostic);
}

TEST_F(SymbolicWalker, TheFilterRefusesNodes) {
    walk.refused = ParseOperator::multiply;
    EXPECT_EQ(read("1 + 2*N"), "none"); // reporting is up to the filter
    EXPECT_EQ(read("1 + N"), "1 + N");
    walk.refused = ParseOperator::none; // terminals, under a minus too
    EXPECT_EQ(read("-3"), "none");
    walk.refused = ParseOperator::matrix;
    EXPECT_EQ(read("[N M]"), "[N M]"); // as a whole it is the list itself
    walk.lists = false;
    walk.refused = ParseOperator::cell;
    EXPECT_EQ(read("[N M]"),
              "none\n" + expectedMessage("Quillane:SymbolicExpr:UnhandledExpression", "[N M]", "[N M]", " ^"));
}

TEST_F(SymbolicWalker, WhatIdentifiersStandFor) {
    const Array four = array(txCreateDoubleScalar(4));
    walk.symbols = {
        {"plain", {nullptr, ""}},     // nothing
        {"number", {four, ""}},       // the number itself
        {"K", {nullptr, "K"}},        // a symbol
        {"N", {four, "N"}},           // one with a value
        {"alias", {nullptr, "M"}},    // a symbol of another name
        {"aliased", {four, "Fours"}}, // and with a value
        {"bad", {array(txCreateDoubleScalar(0.5)), "bad"}},
        {"worse", {array(txCreateString("text")), "worse"}},
    };
    const auto value = [&](const char* name) { return shown(table.getValueId(table.addSymbol(name))); };
    EXPECT_EQ(read("plain"), "none");
    EXPECT_EQ(read("K + plain"), "none");
    EXPECT_EQ(read("K + number"), "K + 4");
    EXPECT_EQ(value("number"), "none");
    EXPECT_EQ(read("K"), "K");
    EXPECT_EQ(value("K"), "none");
    EXPECT_EQ(read("2*N"), "2*N");
    EXPECT_EQ(value("N"), "4");
    EXPECT_THAT(walk.eval(walk("[2*N, N]").first), ElementsAre(8.0, 4.0));
    EXPECT_EQ(read("alias"), "M");
    EXPECT_EQ(value("alias"), "M");
    EXPECT_EQ(read("aliased"), "Fours");
    EXPECT_EQ(value("Fours"), "4");
    EXPECT_THAT(walk.eval(table.addSymbol("aliased")), ElementsAre(4.0));
    EXPECT_EQ(read("bad"), "bad\n" + expectedMessage("Quillane:SymbolicExpr:NonIntegerValue", "bad", "bad", " ^"));
    EXPECT_EQ(value("bad"), "0.5");
    EXPECT_EQ(read("worse"),
              "none\n" + expectedMessage("Quillane:SymbolicExpr:UnsupportedValue", "worse", "worse", " ^"));
    EXPECT_EQ(value("worse"), "none");
}

TEST_F(SymbolicWalker, AnAliasLeavesAValueAlone) {
    table.registerValueId("alias", table.addInt(7));
    walk.symbols = {{"alias", {nullptr, "M"}}};
    EXPECT_EQ(read("alias"), "M");
    EXPECT_EQ(table.getValueId(table.addSymbol("alias")), table.addInt(7));
}

TEST_F(SymbolicWalker, IdentifiersAreAskedForWithTheirPositions) {
    read("2*N + max(M, s.x)"); // neither functions nor fields, and what is not visited is not asked for
    EXPECT_THAT(walk.asked, ElementsAre("N@2", "M@10"));
    walk.asked.clear();
    read("true + NaN");
    EXPECT_THAT(walk.asked, ElementsAre());
}

TEST_F(SymbolicWalker, NumbersOfHostArrays) {
    const auto complaint = [](const char* leaf) {
        return "\n" + expectedMessage(std::string("Quillane:SymbolicExpr:") + leaf, "N", "2*N", "   ^");
    };
    const auto integer = [](auto value) { return array(txCreateRow({value})); };
    struct Row {
        Array value;
        std::string result;
        std::string keepingClass; // empty: the same
    };
    const Row rows[] = {
        {array(txCreateDoubleScalar(4)), "4", "4.0"},
        {array(txCreateDoubleScalar(-4)), "-4", "-4.0"},
        {integer(4.0F), "4", "4.0"},
        {integer(std::int8_t{4}), "4", ""},
        {integer(std::uint8_t{4}), "4", ""},
        {integer(std::int16_t{4}), "4", ""},
        {integer(std::uint16_t{4}), "4", ""},
        {integer(std::int32_t{-4}), "-4", ""},
        {integer(std::uint32_t{4}), "4", ""},
        {integer(std::int64_t{4}), "4", ""},
        {integer(std::uint64_t{4}), "4", ""},
        {array(txCreateDoubleScalar(3e9)), "3e+09", ""},
        {integer(std::uint32_t{3000000000U}), "3e+09", ""},
        {integer(std::int64_t{9007199254740993}), "none" + complaint("UnsupportedValue"), ""},
        {integer(std::numeric_limits<std::int64_t>::min()), "-9223372036854775808.0", ""},
        {integer(std::numeric_limits<std::int64_t>::max()), "none" + complaint("UnsupportedValue"), ""},
        {integer(std::numeric_limits<std::uint64_t>::max()), "none" + complaint("UnsupportedValue"), ""},
        {integer(std::uint64_t{1} << 63), "9223372036854775808.0", ""},
        {array(txCreateDoubleScalar(2.5)), "2.5" + complaint("NonIntegerValue"), ""},
        {array(txCreateDoubleScalar(std::nan(""))), "nan" + complaint("NonIntegerValue"), ""},
        {array(txCreateDoubleScalar(INFINITY)), "inf" + complaint("NonIntegerValue"), ""},
        {array(txCreateLogicalScalar(true)), "true", ""},
        {array(txCreateRow({1.0, 2.0})), "none" + complaint("NonScalarValue"), ""},
        {array(txCreateNumericMatrix(0, 0, txClassDouble, false)), "none" + complaint("NonScalarValue"), ""},
        {array(txCreateRow({true, false})), "none" + complaint("NonScalarValue"), ""},
        {integer(std::complex<double>(1, 2)), "none" + complaint("ComplexValue"), ""},
        {array(txCreateString("4")), "none" + complaint("UnsupportedValue"), ""},
        {array(txCreateCellMatrix(1, 1)), "none" + complaint("UnsupportedValue"), ""},
        {nullptr, "none" + complaint("UnsupportedValue"), ""},
    };
    for (const Row& row : rows) {
        SCOPED_TRACE(row.result);
        walk.keepsClass = false;
        EXPECT_EQ(number(row.value), row.result);
        walk.keepsClass = true;
        EXPECT_EQ(number(row.value), row.keepingClass.empty() ? row.result : row.keepingClass);
    }
    walk.logicals = false;
    EXPECT_EQ(number(array(txCreateLogicalScalar(true))), "none" + complaint("LogicalValue"));
}

TEST_F(SymbolicWalker, AQuietCheckerDropsEverything) {
    walk.checker.setQuiet(true);
    const unsigned long before = table.getNumExprs();
    for (const char* text : {"s.x", "sqrt(3)", "abs()", "3i", "'text'", "\xC3\xA4", "3 +"})
        EXPECT_EQ(read(text), "none") << text;
    EXPECT_EQ(table.getNumExprs(), before); // not even the names of functions
    walk.enableDiagnostics();
    EXPECT_NE(read("3i"), "none");
}

TEST_F(SymbolicWalker, ReportingDiagnostics) {
    const auto made = [](const char* leaf) {
        return qlsvCreateDiagnosticFromMessageID(resource_core::BaseMsgID("category", leaf, 0));
    };
    auto& checker = walk.checker;
    checker.reportDiagnostic(nullptr);
    EXPECT_EQ(checker.pending(), nullptr);
    walk.reportDiagnostic(made("first"));
    checker.reportDiagnostic(made("second"));
    EXPECT_EQ(describe(checker.pending()), "category:first()\ncategory:second()");
    checker.reportDiagnostic(checker.pending());
    EXPECT_EQ(describe(checker.pending()), "category:first()\ncategory:second()");
    checker.setQuiet(true);
    checker.reportDiagnostic(made("third"));
    checker.reportDiagnostic(checker.pending()); // not discarded under the checker's hands
    EXPECT_EQ(describe(checker.pending()), "category:first()\ncategory:second()");
    qlsvDiagnosticImpl* taken = checker.takePending();
    EXPECT_EQ(checker.pending(), nullptr);
    qlsvDiscardDiagnostic(taken);
}

TEST_F(SymbolicWalker, WhatWasPendingIsClearedFirst) {
    walk.reportDiagnostic(qlsvCreateDiagnosticFromMessageID(resource_core::BaseMsgID("category", "leaf", 0)));
    EXPECT_EQ(read("N"), "N");
}

TEST_F(SymbolicWalker, DepthIsTheParsers) {
    const auto nested = [](int levels) {
        std::string text;
        for (int i = 0; i < levels; ++i)
            text += "abs(";
        return text + "N" + std::string(static_cast<std::size_t>(levels), ')');
    };
    const std::string deep = read(nested(parseTreeDepthLimit - 1));
    EXPECT_EQ(deep.substr(0, 8), "abs(abs(");
    EXPECT_NE(read(nested(parseTreeDepthLimit)).find("Quillane:Language:NestingTooDeep"), std::string::npos);
    std::string wide = "[N";
    for (int i = 0; i < 100000; ++i)
        wide += " N";
    EXPECT_EQ(table.get(walk((wide + "]").c_str()).first).getNumDimensions(), 100001U);
}

// The address sanitizer sees a tree or a diagnostic that is left behind.
TEST_F(SymbolicWalker, MemoryThatRunsOutLeavesNothingBehind) {
    walk.symbols = {{"L", {array(txCreateString("text")), "L"}}};
    for (unsigned long n = 1;; ++n) {
        SymbolicExprTable fresh(QL::SymbolDomain::Integers);
        Walker walker(fresh);
        walker.symbols = walk.symbols;
        const std::u16string text = u"[0.5*N, s.x + sqrt(M), L, abs(1, 2), 2i]";
        testsupport::failNewAt(n);
        qlsvDiagnosticImpl* diagnostic = nullptr;
        try {
            diagnostic = walker(text).second;
        } catch (const std::bad_alloc&) {
        }
        const bool wasReached = testsupport::failNewAt(0);
        qlsvDiscardDiagnostic(diagnostic);
        if (!wasReached) break;
    }
}

TEST(SymbolicValidator, SaysNothing) {
    QL::SymbolValidator validator;
    for (const QL::SymbolRecord& record :
         {validator.resolveSymbol("N", "2*N", 2), validator.resolveSymbol("N", "2*N", 2, nullptr)}) {
        EXPECT_EQ(record.value, nullptr);
        EXPECT_EQ(record.name, "");
    }
    qlsvDiagnosticImpl* diagnostic = nullptr;
    validator.reportLossOfSymbolicDimensions(diagnostic, 3);
    EXPECT_EQ(diagnostic, nullptr);
    EXPECT_EQ(validator.getParameterSymbolicExprTable(), nullptr);
    EXPECT_EQ(std::as_const(validator).getParameterSymbolicExprTable(), nullptr);
}

void expectConsecutive(const std::vector<std::size_t>& slots) {
    for (std::size_t i = 0; i < slots.size(); ++i)
        EXPECT_EQ(slots[i], i + 2) << "operation " << i + 1; // behind the two forms of the destructor
}

TEST(SymbolicWalkerInterface, Slots) {
    using Checker = QL::QLSymbolicExprErrorChecker;
    expectConsecutive({
        slotOf(&Checker::reportUnhandledExpr),
        slotOf(&Checker::reportUnsupportedFcn),
        slotOf(&Checker::reportNonScalarValue),
        slotOf(&Checker::reportInvalidNumArgs),
        slotOf(&Checker::reportComplexValue),
        slotOf(&Checker::reportDivisionExpr),
        slotOf(&Checker::reportUnsupportedValue),
        slotOf(&Checker::reportNonIntegerValue),
        slotOf(&Checker::reportInvalidLiteralValue),
        slotOf(&Checker::reportIntegerLiteralOverflow),
        slotOf(&Checker::reportLogicalValue),
        slotOf(&Checker::reportDiagnostic),
        slotOf(&Checker::createNonASCIIStringDiagnostic),
    });
    using QL::SymbolRecord;
    using Validator = QL::SymbolValidator;
    using Name = const std::string&;
    expectConsecutive({
        slotOf(static_cast<SymbolRecord (Validator::*)(Name, const char*, unsigned long)>(&Validator::resolveSymbol)),
        slotOf(static_cast<SymbolRecord (Validator::*)(Name, const char*, unsigned long, QL::SymbolRegistry*)>(
            &Validator::resolveSymbol)),
        slotOf(&Validator::reportLossOfSymbolicDimensions),
        slotOf(
            static_cast<const QL::SymbolRegistry* (Validator::*)() const>(&Validator::getParameterSymbolicExprTable)),
        slotOf(static_cast<QL::SymbolRegistry* (Validator::*)()>(&Validator::getParameterSymbolicExprTable)),
    });
    EXPECT_EQ(sizeof(Array), 2 * sizeof(void*)); // the record: two words, then the name
    EXPECT_EQ(testsupport::offsetOfMember(&SymbolRecord::value), 0U);
    EXPECT_EQ(testsupport::offsetOfMember(&SymbolRecord::name), 2 * sizeof(void*));
    using Base = QL::SymbolicExprFromTParseTree;
    expectConsecutive({
        slotOf(&Base::readsMatrixAsList),
        slotOf(&Base::shouldCreateIntValueNodeForIntegerValue),
        slotOf(&Base::supportLogicalValues),
        slotOf(&Base::acceptsNode),
        slotOf(&Base::resolveSymbol),
        slotOf(&Base::enableDiagnostics),
        slotOf(&Base::reportDiagnostic),
    });
}

} // namespace
