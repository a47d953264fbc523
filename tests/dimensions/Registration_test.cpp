// Dimensions from text: tokens, expressions of the host language, and their checks.
#include <complex>
#include <limits>
#include <map>
#include <stdexcept>

#include <boost/lexical_cast.hpp>
#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include "qlplatform/arrays/HostElements.h"
#include "qlplatform/services/Diagnostics.h"
#include "qlplatform/strings/Strings.h"
#include "qlplatform/symbolic/SymbolicExpr.h"
#include "qlplatform/symbolic/SymbolicExprPrinter.h"
#include "qltypes/dimensions/DummyValidator.h"
#include "qltypes/dimensions/NumericDims.h"
#include "qltypes/dimensions/SymbolicDimsFromTParseTree.h"
#include "qltypes/dimensions/SymbolicDimsServices.h"
#include "qltypes/dimensions/SymbolicDimsTable.h"
#include "tests/support/FailingNew.h"
#include "tests/support/Raises.h"

class QLBlock {};

namespace {

using namespace QLTypeSys;
using testing::ElementsAre;
using testing::IsEmpty;
using testsupport::describe;
using testsupport::expectedMessage;

constexpr unsigned long noExpr = QL::SymbolicExprTable::noExpr;

class Dims : public NumericDims {
  public:
    Dims(std::initializer_list<long> dims) : dims_(dims) {} // NOLINT: lists are dimensions
    std::size_t getNumDims() const override { return dims_.size(); }
    long getDim(std::size_t index) const override { return dims_[index]; }

  private:
    std::vector<long> dims_;
};

// Puts a message behind a diagnostic; leaves nothing behind when there is no memory for it.
void extend(qlsvDiagnosticImpl*& diagnostic, const char* category) {
    qlsvDiagnosticImpl* made = qlsvCreateDiagnosticFromMessageID(resource_core::BaseMsgID(category, "lost", 0));
    try {
        qlsvConcatenateDiagnosticsNoCheck(diagnostic, made, false);
    } catch (const std::bad_alloc&) {
        qlsvDiscardDiagnostic(made);
        throw;
    }
}

// Identifiers are symbols; some have values, some are nothing.
class Workspace : public QL::SymbolValidator {
  public:
    QL::SymbolRecord resolveSymbol(const std::string& name, const char* text, unsigned long position) override {
        asked.push_back(name);
        places.push_back(std::string(text) + "@" + std::to_string(position));
        const auto found = records.find(name);
        return found == records.end() ? QL::SymbolRecord{nullptr, name} : found->second;
    }
    using SymbolValidator::resolveSymbol;
    void reportLossOfSymbolicDimensions(qlsvDiagnosticImpl*& diagnostic, unsigned long exprId) override {
        lost.push_back(exprId);
        if (complains) extend(diagnostic, "test");
    }
    void set(const std::string& name, txArray_tag* value) { records[name] = {{value, txDestroyArray}, name}; }

    std::map<std::string, QL::SymbolRecord> records;
    std::vector<std::string> asked;
    std::vector<std::string> places;
    std::vector<unsigned long> lost;
    bool complains = false;
};

// A table that listens to its own hooks.
class Table : public SymbolicDimsTable {
  public:
    void reportLossOfSymbolicDimensions(qlsvDiagnosticImpl*& diagnostic, int id) override {
        lost.push_back(id);
        extend(diagnostic, "table");
    }
    bool isLossOfSymbolicDimsDiagEnabled() const override { return isEnabled; }
    using SymbolicDimsTable::symbolsRegistered;

    std::vector<int> lost;
    bool isEnabled = true;
};

std::string marker(std::size_t position) { return std::string(position + 1, ' ') + "^"; }

class Registration : public testing::Test {
  protected:
    std::string shown(unsigned long exprId) {
        return exprId == noExpr ? "none" : table.getSymbolicDimsAt(exprId).toString();
    }
    std::string withMessages(std::string text, qlsvDiagnosticImpl* diagnostic) {
        if (diagnostic) text += "\n" + describe(diagnostic);
        qlsvDiscardDiagnostic(diagnostic);
        return text;
    }

    // The registered expression and what is said of it, for a signal of known dimensions.
    std::string read(const std::string& text, const Dims& dims) {
        const auto [id, diagnostic] = table.registerSymbolicTExpr(text, dims, workspace);
        return withMessages(shown(id), diagnostic);
    }
    std::string read(const std::u16string& text) {
        const auto [id, diagnostic] = table.registerSymbolicTExpr(text, workspace, values);
        return withMessages(shown(id), diagnostic);
    }
    std::string token(const char* text) {
        const auto [id, diagnostic] = table.registerSymbolicDims(text, workspace);
        return withMessages(id == -2 ? "-2" : table.getSymbolicDims(id).toString(), diagnostic);
    }
    int number(int value) { return table.registerSymbolicDims(value); }
    unsigned long exprNumber(int value) { return table.getExprTable().addInt(value); }

    Table table;
    Workspace workspace;
    DummyValidator dummy;
    std::vector<double> values;
};

// ---- Validators ----

TEST_F(Registration, TheDummyLetsEveryIdentifierStandForItself) {
    const QL::SymbolRecord record = dummy.resolveSymbol("N", "2*N", 2);
    EXPECT_EQ(record.value, nullptr);
    EXPECT_EQ(record.name, "N");
    EXPECT_EQ(dummy.resolveSymbol("N", "2*N", 2, nullptr).name, ""); // that one is not its own
}

// ---- Tokens ----

TEST_F(Registration, TokensThatAreNumbers) {
    const std::pair<const char*, int> rows[] = {{"3", 3},    {"-3", -3},
                                                {"+3", 3},   {"0", 0},
                                                {"1", 1},    {"2147483647", 2147483647},
                                                {"017", 17}, {"-2147483648", std::numeric_limits<int>::min()}};
    for (const auto& [text, value] : rows) {
        SCOPED_TRACE(text);
        const auto [id, diagnostic] = table.registerSymbolicDims(text, workspace);
        EXPECT_EQ(id, number(value));
        EXPECT_EQ(diagnostic, nullptr);
    }
    EXPECT_FALSE(table.symbolsRegistered());
    EXPECT_THAT(workspace.asked, IsEmpty());
}

TEST_F(Registration, NumbersInOtherNotationsThrow) {
    for (const char* text : {"", "0x10", " 3", "\t3", "2147483648", "-2147483649", "99999999999999999999"}) {
        SCOPED_TRACE(text);
        const std::size_t before = table.getNumSymbolicDimss();
        EXPECT_THROW(table.registerSymbolicDims(text, workspace), boost::bad_lexical_cast);
        EXPECT_EQ(table.getNumSymbolicDimss(), before);
    }
}

TEST_F(Registration, EveryOtherTokenIsAName) {
    for (const char* text : {"K", "3 ", "3K", "08", "-", " ", "1e3", "K+1"}) {
        SCOPED_TRACE(text);
        const auto [id, diagnostic] = table.registerSymbolicDims(text, workspace);
        EXPECT_EQ(id, SymbolicDimsString(table, text).getId());
        EXPECT_EQ(diagnostic, nullptr);
    }
    EXPECT_TRUE(table.symbolsRegistered());
}

TEST_F(Registration, ATokenTakesItsValueFromTheValidator) {
    workspace.set("K", txCreateDoubleScalar(4));
    workspace.set("bad", txCreateRow({1.0, 2.0}));
    EXPECT_EQ(token("K"), "K");
    EXPECT_THAT(table.eval(SymbolicDimsString(table, "K").getId()), ElementsAre(4.0));
    EXPECT_THAT(workspace.places, ElementsAre("K@0"));
    EXPECT_EQ(token("K"), "K"); // a value that is there is not asked for again
    EXPECT_EQ(workspace.places.size(), 1U);
    EXPECT_EQ(token("bad"), "-2\n" + expectedMessage("Quillane:SymbolicDims:NonScalarValue", "bad", "bad", " ^"));
    QL::SymbolValidator silent; // knows nothing: the symbol stays without a value
    EXPECT_EQ(table.registerSymbolicDims("L", silent).first, SymbolicDimsString(table, "L").getId());
    EXPECT_EQ(token("INHERIT"), "INHERIT"); // no symbolic dimension, so it has no symbols
    EXPECT_EQ(workspace.asked.back(), "bad");
}

TEST_F(Registration, ValuesOfTheSymbolsOfAnExpression) {
    const auto [id, diagnostic] = table.registerSymbolicTExpr("a*b + c + d", Dims{1}, dummy);
    ASSERT_EQ(diagnostic, nullptr);
    const int sum = table.convertExprId2SymbDimsId(id);
    table.registerValue("b", 7);
    workspace.set("a", txCreateDoubleScalar(2));
    workspace.set("c", txCreateDoubleScalar(2.5));
    workspace.set("d", txCreateDoubleScalar(9));
    qlsvDiagnosticImpl* complaint = table.registerSymbolicIdValues(sum, workspace);
    EXPECT_EQ(describe(complaint), expectedMessage("Quillane:SymbolicDims:NonIntegerValue", "c", "c", " ^"));
    qlsvDiscardDiagnostic(complaint);
    EXPECT_THAT(workspace.asked, ElementsAre("a", "c"));                // b has a value, d comes behind the complaint
    EXPECT_EQ(table.registerSymbolicIdValues(sum, workspace), nullptr); // c has one now
    EXPECT_THAT(workspace.asked, ElementsAre("a", "c", "d"));
    EXPECT_THAT(table.eval(sum), ElementsAre(2 * 7 + 2.5 + 9));
    for (const int none : {-1, 0, -7, 100000})
        EXPECT_EQ(table.registerSymbolicIdValues(none, workspace), nullptr);
    EXPECT_EQ(workspace.asked.size(), 3U);
}

// ---- The engine's own syntax ----

TEST_F(Registration, ExpressionsInTheEnginesSyntax) {
    const auto read = [&](const char* text) {
        const auto [id, diagnostic] = table.registerSymbolicDimsExpr(text, workspace);
        return withMessages(id == -2 ? "-2" : table.getSymbolicDims(id).toString(), diagnostic);
    };
    workspace.set("N", txCreateDoubleScalar(4));
    workspace.set("bad", txCreateString("text"));
    EXPECT_FALSE(table.symbolsRegistered());
    EXPECT_EQ(read("3"), "3");
    EXPECT_TRUE(table.symbolsRegistered());
    EXPECT_EQ(read("(2*N + M)/2 % 3"), "(2*N + M)/2 % 3"); // C's form, with divisions, and not simplified
    EXPECT_EQ(read("[N M+1]"), "[N M + 1]");
    EXPECT_EQ(read("N != 3 && !(M == 2)"), "N != 3 && !(M == 2)");
    EXPECT_EQ(read("INHERIT"), "INHERIT");
    EXPECT_THAT(table.eval(SymbolicDimsString(table, "N").getId()), ElementsAre(4.0));
    EXPECT_THAT(workspace.asked, ElementsAre("N", "M", "M", "M")); // N has a value since
    EXPECT_EQ(read("N + bad"), "-2\n" + expectedMessage("Quillane:SymbolicExpr:UnsupportedValue", "bad", "bad", " ^"));
    EXPECT_EQ(read("N +").substr(0, 45), "-2\nQuillane:SymbolicExpr:UnexpectedToken(3, '");
    EXPECT_EQ(read("N ~= 3").substr(0, 4), "-2\nQ"); // not the host language's operators
}

// ---- Texts with numeric dimensions ----

TEST_F(Registration, TextsWithNumericDimensions) {
    struct Row {
        const char* text;
        Dims dims;
        const char* result;
    };
    const Row rows[] = {
        {"N", {5}, "N"},
        {"2*N + 1", {5}, "2*N + 1"},
        {"N", {5, 3}, "N"}, // no matrix: the numeric dimensions do not matter
        {"7", {7}, "none"},
        {"floor(7)", {7}, "none"}, // a function is no symbol
        {"min(N, 7)", {7}, "min(N, 7)"},
        {"true", {1}, "none"},
        {"'N'", {1}, "none"},
        {"[]", {1}, "none"},
        {"[;]", {1}, "none"},
        {"[3 4]", {3, 4}, "none"},
        {"[N]", {5}, "N"},
        {"[7]", {7}, "none"},
        {"[N M]", {3, 4}, "[N M]"},
        {"[N, M]", {3, 4}, "[N M]"},
        {"[N; M]", {3, 4}, "[N M]"},
        {"[N\nM]", {3, 4}, "[N M]"},
        {"[2*N+1 M]", {3, 4}, "[2*N + 1 M]"},
        {"[N 4]", {3, 4}, "[N 4]"},
        {"[N 4]", {3, 9}, "[N 9]"},         // an element without a symbol takes the numeric dimension
        {"[N max(2, 1)]", {3, 2}, "[N 2]"}, // however it is written
        {"[N M]", {1, 2, 3}, "none"},       // fewer than the numeric dimensions
        {"[N]", {1, 2}, "none"},
        {"[N M]", {3}, "N"}, // one numeric dimension takes the first
        {"[4 M]", {4}, "4"},
        {"[N; M]", {1, 2, 3}, "[N M INHERIT]"}, // rows are not counted, and extended
        {"[N; M]", {1}, "N"},
        {"[N 1; M 2]", {3, 4}, "[N M]"}, // the first of each row
        {"[1 N; 2 M]", {3, 4}, "none"},
        {"[3 N; M 4]", {3, 4}, "[3 M]"},
        {"[3 4 N]", {3, 4}, "[3 4]"}, // what makes it symbolic is lost, and it stays a list
        {"[N M]", {}, "[]"},
        {"N % comment", {5}, "N"},
    };
    for (const Row& row : rows) {
        SCOPED_TRACE(row.text);
        EXPECT_EQ(read(row.text, row.dims), row.result);
    }
}

TEST_F(Registration, TheFormInTheTableIsThatOfC) {
    EXPECT_EQ(read("rem(N, 2)", {1}), "N % 2");
    EXPECT_EQ(read("[rem(N, 2) mod(M, 3)]", {1, 1}), "[N % 2 mod(M, 3)]");
    EXPECT_EQ(read(u"rem(N, 2)"), "N % 2");
}

TEST_F(Registration, DimensionsBeyondTheNumericOnesAreLost) {
    EXPECT_EQ(read("[N M K]", {3, 4}), "[N M]");
    EXPECT_THAT(workspace.lost, ElementsAre(table.getExprTable().addSymbol("K")));
    workspace.lost.clear();
    workspace.complains = true;
    EXPECT_EQ(read("[N 4 1 K s.x]", {3, 4}),
              "[N 4]\n" +
                  expectedMessage("Quillane:SymbolicExpr:UnhandledExpression", "s.x", "[N 4 1 K s.x]", marker(9)) +
                  "\ntest:lost()\ntest:lost()\ntest:lost()");
    EXPECT_THAT(workspace.lost, ElementsAre(exprNumber(1), table.getExprTable().addSymbol("K"), noExpr));
    workspace.lost.clear();
    EXPECT_EQ(read("[N]", {3}), "N"); // one element has nothing beyond it
    EXPECT_THAT(workspace.lost, IsEmpty());
    EXPECT_EQ(read("[7 8 9]", {7}), "none"); // nor has what is not symbolic
    EXPECT_THAT(workspace.lost, IsEmpty());
}

TEST_F(Registration, WhatIsRefusedInDimensions) {
    const auto refusal = [](const char* leaf, const char* name, const std::string& text, std::size_t position) {
        return "\n" + expectedMessage(std::string("Quillane:SymbolicExpr:") + leaf, name, text, marker(position));
    };
    EXPECT_EQ(read("N/2", {3}), "none" + refusal("UnsupportedDivision", "N/2", "N/2", 1));
    EXPECT_EQ(read("1 + N ./ 2", {3}), "none" + refusal("UnsupportedDivision", "N ./ 2", "1 + N ./ 2", 6));
    EXPECT_EQ(read("2\\N", {3}), "none" + refusal("UnsupportedDivision", "2\\N", "2\\N", 1));
    EXPECT_EQ(read("2.\\N", {3}), "none" + refusal("UnsupportedDivision", "2.\\N", "2.\\N", 1));
    EXPECT_EQ(read("{N}", {3}), "none" + refusal("UnhandledExpression", "{N}", "{N}", 0));
    EXPECT_EQ(read("2*[N]", {3}), "none" + refusal("UnhandledExpression", "[N]", "2*[N]", 2));
    EXPECT_EQ(read("foo(3)", {3}), "none" + refusal("UnsupportedFunction", "foo", "foo(3)", 0));
    EXPECT_EQ(read("N*0.5", {3}), "N*0.5" + refusal("InvalidLiteral", "0.5", "N*0.5", 2));
    EXPECT_EQ(read("N + 2147483648", {3}), "N + 2147483648.0"); // passes
    // In a list the others are read all the same, and a refused one takes the numeric dimension.
    EXPECT_EQ(read("[N/2 M]", {3, 4}), "[3 M]" + refusal("UnsupportedDivision", "N/2", "[N/2 M]", 2));
    EXPECT_EQ(read("[N/2 4]", {3, 4}), "none" + refusal("UnsupportedDivision", "N/2", "[N/2 4]", 2));
    EXPECT_EQ(read("[M [N 2]]", {3, 4}), "[M 4]" + refusal("UnhandledExpression", "[N 2]", "[M [N 2]]", 3));
    EXPECT_EQ(read("[M {2}]", {3, 4}), "[M 4]" + refusal("UnhandledExpression", "{2}", "[M {2}]", 3));
    EXPECT_EQ(read("7/2", {3}), "none"); // no symbols, so nothing to refuse
}

TEST_F(Registration, TextsThatCannotBeRead) {
    const std::string message = expectedMessage("Quillane:SymbolicExpr:InvalidExpression", "N +", marker(3));
    EXPECT_EQ(read("N +", {3}).substr(0, 5 + message.size()), "none\n" + message);
    EXPECT_EQ(read("", {3}).substr(0, 6), "none\nQ");
    EXPECT_EQ(read("[N", {3, 4}).substr(0, 6), "none\nQ");
    EXPECT_EQ(read("N", {3}), "N"); // nothing is left over
}

TEST_F(Registration, ValuesThatAreRefused) {
    workspace.set("z", txCreateRow({std::complex<double>(1, 2)}));
    workspace.set("v", txCreateRow({1.0, 2.0}));
    workspace.set("h", txCreateDoubleScalar(2.5));
    workspace.set("s", txCreateString("text"));
    workspace.set("t", txCreateLogicalScalar(true));
    workspace.records["plain"] = {nullptr, ""};
    workspace.records["four"] = {{txCreateDoubleScalar(4), txDestroyArray}, ""};
    const std::string c = "Quillane:SymbolicDims:";
    EXPECT_EQ(read("[N z]", {3, 4}), "[N 4]\n" + expectedMessage(c + "ComplexValue", "z", "[N z]", marker(3)));
    EXPECT_EQ(read("[N v]", {3, 4}), "[N 4]\n" + expectedMessage(c + "NonScalarValue", "v", "[N v]", marker(3)));
    EXPECT_EQ(read("[N h]", {3, 4}), "[N h]\n" + expectedMessage(c + "NonIntegerValue", "h", "[N h]", marker(3)));
    EXPECT_EQ(read("N + 1i", {3}), "none\n" + expectedMessage(c + "ComplexValue", "1i", "N + 1i", marker(4)));
    EXPECT_EQ(read("[N s]", {3, 4}),
              "[N 4]\n" + expectedMessage("Quillane:SymbolicExpr:UnsupportedValue", "s", "[N s]", marker(3)));
    EXPECT_EQ(read("[N t]", {3, 4}), "[N t]"); // logical values are supported
    EXPECT_EQ(read("[N plain]", {3, 4}), "[N 4]");
    EXPECT_EQ(read("N + plain", {3}), "none");
    EXPECT_EQ(read("plain", {3}), "none");
    EXPECT_EQ(read("four", {3}), "none");
    EXPECT_EQ(read("N + four", {3}), "N + 4");
    EXPECT_EQ(read("z", {3}), "none"); // looked at quietly: no symbol
}

TEST_F(Registration, ASignalWithoutElementsKeepsNoSymbols) {
    EXPECT_EQ(read("[N M]", {0, 4}), "NOSYMBOLIC\ntable:lost()");
    EXPECT_THAT(table.lost, ElementsAre(SymbolicDimsND(table, {SymbolicDimsString(table, "N").getId(),
                                                               SymbolicDimsString(table, "M").getId()})
                                            .getId()));
    table.lost.clear();
    EXPECT_EQ(read("7", {0}), "NOSYMBOLIC\ntable:lost()");
    EXPECT_THAT(table.lost, ElementsAre(0));
    Table silent;
    silent.isEnabled = false;
    const std::size_t before = silent.getNumSymbolicDimss();
    const auto [id, diagnostic] = silent.registerSymbolicTExpr("[N M", Dims{0}, workspace);
    EXPECT_EQ(id, 1U);
    EXPECT_EQ(diagnostic, nullptr);
    EXPECT_EQ(silent.getNumSymbolicDimss(), before); // not even read
    EXPECT_THAT(silent.lost, IsEmpty());
}

// ---- Texts whose values are asked for ----

TEST_F(Registration, TextsAndTheirValues) {
    workspace.set("N", txCreateDoubleScalar(4));
    EXPECT_EQ(read(u"[N 2*N 3]"), "[N 2*N 3]");
    EXPECT_THAT(values, ElementsAre(4.0, 8.0, 3.0));
    EXPECT_EQ(read(u"N"), "N");
    EXPECT_THAT(values, ElementsAre(4.0));
    EXPECT_EQ(read(u"7"), "7"); // a number is an expression here
    EXPECT_THAT(values, ElementsAre(7.0));
    EXPECT_EQ(read(u"N/2").substr(0, 11), "NOSYMBOLIC\n");
    EXPECT_THAT(values, ElementsAre(7.0)); // as they were
    EXPECT_EQ(read(u"[N M; 1 2]").substr(0, 11), "NOSYMBOLIC\n");
    EXPECT_EQ(read(u"\u00e4"),
              "NOSYMBOLIC\n" + expectedMessage("Quillane:SymbolicDims:NonAsciiDimensionsString", u"\u00e4"));
    EXPECT_TRUE(table.symbolsRegistered());
    EXPECT_THAT(table.lost, IsEmpty());
}

TEST_F(Registration, OnesAtTheEndBeyondTheThirdAreLost) {
    workspace.set("one", txCreateDoubleScalar(1));
    workspace.set("half", txCreateDoubleScalar(0.5));
    const auto lost = [&](const std::u16string& text) {
        table.lost.clear();
        read(text);
        std::string names;
        for (const int id : table.lost)
            names += table.getSymbolicDims(id).toString() + " ";
        return names;
    };
    EXPECT_EQ(lost(u"[2 3 1]"), ""); // kept: three are no loss
    EXPECT_EQ(lost(u"[2 3 1 one]"), "one ");
    EXPECT_EQ(lost(u"[2 3 1 one 1]"), "1 one ");
    EXPECT_EQ(lost(u"[2 3 1 one 2 1]"), "1 ");
    EXPECT_EQ(lost(u"[2 3 1 2]"), "");
    EXPECT_EQ(lost(u"[2 3 1 N]"), "");         // without a value
    EXPECT_EQ(lost(u"[2 3 1 half]"), "half "); // halves round away from zero
    EXPECT_EQ(lost(u"[1 1 1 1]"), "1 ");
    EXPECT_EQ(read(u"[2 3 1 1]"), "[2 3 1 1]\ntable:lost()");
    values = {2, 3, 1, 1}; // values that were there count too, for what cannot be read
    table.lost.clear();
    EXPECT_EQ(read(u"[2").substr(0, 11), "NOSYMBOLIC\n");
    EXPECT_THAT(table.lost, ElementsAre(0));
    Table silent;
    silent.isEnabled = false;
    silent.registerSymbolicTExpr(u"[2 3 1 1]", workspace, values);
    EXPECT_THAT(silent.lost, IsEmpty());
}

// ---- Values of host arrays ----

TEST_F(Registration, NumbersOfHostArrays) {
    const auto of = [&](txArray_tag* made) {
        const txArrayPtr array(made);
        return table.getNumberFromTxArray(array.get(), "N", "2*N", 2);
    };
    EXPECT_EQ(of(txCreateDoubleScalar(4)), number(4));
    EXPECT_EQ(of(txCreateRow<std::int8_t>({4})), number(4));
    EXPECT_EQ(table.getSymbolicDims(of(txCreateDoubleScalar(2.5))).toString(), "2.5");
    EXPECT_EQ(table.getSymbolicDims(of(txCreateLogicalScalar(true))).toString(), "true");
    EXPECT_EQ(of(txCreateRow({1.0, 2.0})), 0);
    EXPECT_EQ(of(txCreateString("4")), 0);
    EXPECT_EQ(table.getNumberFromTxArray(nullptr, "N", "2*N", 2), 0);
    EXPECT_TRUE(table.symbolsRegistered());
}

// ---- Checks ----

class Checks : public Registration {
  protected:
    std::string generated(const std::u16string& text) {
        QL::SymbolicExprTable exprs(QL::SymbolDomain::Integers);
        const auto checked = table.generateExprIdFromExpr(text, exprs);
        std::string result = checked.ok ? "ok " : "refused ";
        if (checked.exprId == noExpr)
            result += "none";
        else
            result += QL::SymbolicExprPrinter(exprs, QL::SymbolicExprPrinter::Predicate::instance(), false, false,
                                              false, {})(exprs.get(checked.exprId));
        return withMessages(result, checked.diagnostic);
    }
    std::string validated(const std::u16string& text, int minDims) {
        const auto checked = table.validateSymbolicDimsTExpr(text, minDims);
        return withMessages((checked.ok ? "ok " : "refused ") + qlsvUtf8FromUtf16(checked.text), checked.diagnostic);
    }
};

TEST_F(Checks, GeneratedExpressions) {
    const std::pair<const char16_t*, const char*> rows[] = {
        {u"N", "ok N"},
        {u"N + N", "ok 2*N"},
        {u"3", "ok 3"},
        {u"[N M]", "ok [N M]"},
        {u"[N 1]", "ok [N 1]"},
        {u"[N 1 1]", "ok [N 1]"},
        {u"[1 1 1 1]", "ok [1 1]"},
        {u"[N M 1 K 1 1]", "ok [N M 1 K]"},
        {u"[N M 2 - 1 N - N + 1]", "ok [N M]"},
        {u"[N]", "ok N"},
        {u"[]", "refused none\nQuillane:SymbolicExpr:UnhandledExpression('[]', '[]', ' ^')"},
        {u"N/2", "refused none\nQuillane:SymbolicExpr:UnsupportedDivision('N/2', 'N/2', '  ^')"},
        {u"N*0.5", "ok 0.5*N\nQuillane:SymbolicExpr:InvalidLiteral('0.5', 'N*0.5', '   ^')"},
    };
    for (const auto& [text, result] : rows) {
        SCOPED_TRACE(result);
        EXPECT_EQ(generated(text), result);
    }
}

TEST_F(Checks, DimensionsBelowOne) {
    const auto refusal = [](const std::string& simple, const char* nth, const std::u16string& text) {
        return "refused " + simple + "\n" + expectedMessage("Quillane:SymbolicDims:DimensionLessThanOne", nth, text);
    };
    EXPECT_EQ(generated(u"0"), refusal("0", "1st", u"0"));
    EXPECT_EQ(generated(u"-3"), refusal("-3", "1st", u"-3"));
    EXPECT_EQ(generated(u"N - N"), refusal("0", "1st", u"N - N"));
    EXPECT_EQ(generated(u"[N 0]"), refusal("[N 0]", "2nd", u"[N 0]"));
    EXPECT_EQ(generated(u"[0 -1]"), refusal("[0 -1]", "1st", u"[0 -1]")); // the first one counts
    EXPECT_EQ(generated(u"[N M 2 - 3]"), refusal("[N M -1]", "3rd", u"[N M 2 - 3]"));
    EXPECT_EQ(generated(u"[N*0.5 0]"), refusal("[0.5*N 0]", "2nd", u"[N*0.5 0]")); // in place of what was said before
    const std::pair<std::size_t, const char*> rows[] = {
        {4, "4th"},     {9, "9th"},     {10, "10th"},   {11, "11th"},   {12, "12th"},     {13, "13th"},
        {19, "19th"},   {20, "20th"},   {21, "21st"},   {22, "22nd"},   {23, "23rd"},     {24, "24th"},
        {100, "100th"}, {101, "101st"}, {102, "102nd"}, {103, "103rd"}, {111, "111th"},   {112, "112th"},
        {113, "113th"}, {120, "120th"}, {121, "121st"}, {211, "211th"}, {1001, "1001st"},
    };
    for (const auto& [place, nth] : rows) {
        std::u16string text = u"[";
        for (std::size_t i = 1; i < place; ++i)
            text += u"2 ";
        text += u"0]";
        const std::string result = generated(text);
        EXPECT_NE(result.find("LessThanOne('" + std::string(nth) + "'"), std::string::npos) << nth;
    }
}

TEST_F(Checks, Validating) {
    const std::size_t before = table.getNumSymbolicDimss();
    const auto tooFew = [](const std::u16string& text, int minDims) {
        return "refused \n" + expectedMessage("Quillane:SymbolicDims:InsufficientNumDimensions", text, minDims);
    };
    EXPECT_EQ(validated(u"N", 0), "ok N");
    EXPECT_EQ(validated(u"N", 1), "ok N");
    EXPECT_EQ(validated(u"N", -1), "ok N");
    EXPECT_EQ(validated(u"N", 2), tooFew(u"N", 2));
    EXPECT_EQ(validated(u"[N]", 2), tooFew(u"[N]", 2));
    EXPECT_EQ(validated(u"[N M]", 2), "ok [N M]");
    EXPECT_EQ(validated(u"[N M]", 3), tooFew(u"[N M]", 3));
    EXPECT_EQ(validated(u"[N M 1]", 3), tooFew(u"[N M 1]", 3)); // the ones at the end are gone
    EXPECT_EQ(validated(u"[rem(N, 3) N^5 N ~= M]", 2), "ok [rem(N, 3) N^5 N ~= M]");
    EXPECT_EQ(validated(u"fix(N*0.5)", 1),
              "ok fix(0.5*N)\nQuillane:SymbolicExpr:InvalidLiteral('0.5', 'fix(N*0.5)', '       ^')");
    EXPECT_EQ(validated(u"[N 0]", 1),
              "refused \n" + expectedMessage("Quillane:SymbolicDims:DimensionLessThanOne", "2nd", u"[N 0]"));
    EXPECT_EQ(validated(u"N/2", 1),
              "refused \n" + expectedMessage("Quillane:SymbolicExpr:UnsupportedDivision", "N/2", "N/2", "  ^"));
    EXPECT_EQ(validated(u"\u00e4", 1),
              "refused \n" + expectedMessage("Quillane:SymbolicDims:NonAsciiDimensionsString", u"\u00e4"));
    EXPECT_EQ(table.getNumSymbolicDimss(), before);
    EXPECT_FALSE(table.symbolsRegistered());
}

TEST_F(Checks, SymbolsOfATextAreReadInTheTableItself) {
    std::vector<std::string> names{"left over"};
    table.getSymbolicDimensionsFromExpr(u"[N M]", names); // expression 2 of its own table: false here
    EXPECT_THAT(names, IsEmpty());
    names = {"left over"};
    table.getSymbolicDimensionsFromExpr(u"[N", names);
    EXPECT_THAT(names, IsEmpty());
    // What is expression 6 there is the first symbol of a client here.
    SymbolicDimsString(table, "mine");
    ASSERT_EQ(table.getSymbolicDimsAt(6).toString(), "mine");
    table.getSymbolicDimensionsFromExpr(u"[A B C D E F]", names);
    EXPECT_THAT(names, ElementsAre("mine"));
}

// ---- A constant's output ----

TEST_F(Registration, OutputOfAConstant) {
    const int k = SymbolicDimsString(table, "K").getId();
    const int l = SymbolicDimsString(table, "L").getId();
    const int one = number(1);
    const auto list = [&](std::vector<int> ids) { return SymbolicDimsND(table, ids).getId(); };
    const auto output = [&](int id, bool flag) {
        int result = -77;
        SymbolicDimsServices::Const::ComputeOutput(&table, u"first", u"second", id, result, flag);
        return result;
    };
    for (const int none : {-1, 0, -5, 100000}) {
        EXPECT_EQ(output(none, true), -77);
        EXPECT_EQ(output(none, false), -77);
    }
    EXPECT_EQ(output(k, true), k);
    EXPECT_EQ(output(list({k}), true), list({k}));
    EXPECT_EQ(output(list({k, l}), false), list({k, l}));
    EXPECT_EQ(output(list({one, l}), true), l);
    EXPECT_EQ(output(list({k, one}), true), k);
    EXPECT_EQ(output(list({one, one}), true), one);
    const std::string refusal = "Quillane:SymbolicDims:MatrixInterpretedAs1D";
    EXPECT_RAISES(output(list({k, l}), true), refusal, u"first", u"second", "[K L]", "[K 1]", "[1 L]");
    EXPECT_RAISES(output(list({k, l, one}), true), refusal, u"first", u"second", "[K L 1]", "[K 1]", "[1 L]");
    EXPECT_RAISES(output(list({one, one, one}), true), refusal, u"first", u"second", "[1 1 1]", "[1 1]", "[1 1]");
}

// ---- The walker ----

TEST_F(Registration, TheThreeAnswersAndTheCheckerOfTheWalker) {
    QL::SymbolicDimsFromTParseTree walker(table.getExprTable(), dummy);
    EXPECT_TRUE(walker.readsMatrixAsList());
    EXPECT_FALSE(walker.shouldCreateIntValueNodeForIntegerValue());
    EXPECT_TRUE(walker.supportLogicalValues());
    walker.getErrorChecker().setQuiet(true);
    walker.reportDiagnostic(qlsvCreateDiagnosticFromMessageID(resource_core::BaseMsgID("c", "dropped", 0)));
    EXPECT_EQ(walker("N + s.x", Dims{1}).second, nullptr);
    EXPECT_TRUE(walker.getErrorChecker().isQuiet()); // as it was before the quiet look for symbols
    walker.enableDiagnostics();
    EXPECT_FALSE(walker.getErrorChecker().isQuiet());
    walker.reportDiagnostic(qlsvCreateDiagnosticFromMessageID(resource_core::BaseMsgID("c", "kept", 0)));
    EXPECT_EQ(describe(walker.getErrorChecker().pending()), "c:kept()");
    EXPECT_EQ(walker("N", Dims{1}).second, nullptr); // what was pending is cleared first
}

// A validator that throws, in the quiet look and later.
TEST_F(Registration, WhatAValidatorThrowsPasses) {
    class Throwing : public QL::SymbolValidator {
      public:
        QL::SymbolRecord resolveSymbol(const std::string& name, const char*, unsigned long) override {
            if (callsLeft-- == 0) throw std::runtime_error("no workspace");
            return {nullptr, name};
        }
        using SymbolValidator::resolveSymbol;
        int callsLeft;
    };
    for (int n = 0; n < 4; ++n) {
        Throwing validator;
        validator.callsLeft = n;
        QL::SymbolicDimsFromTParseTree walker(table.getExprTable(), validator);
        EXPECT_THROW(walker("[0.5 N M]", Dims{1, 2, 3}), std::runtime_error);
        EXPECT_FALSE(walker.getErrorChecker().isQuiet());
    }
}

// The address sanitizer sees what is left behind.
TEST_F(Registration, MemoryThatRunsOutLeavesNothingBehind) {
    const auto work = [](SymbolicDimsTable& fresh, Workspace& symbols, std::vector<qlsvDiagnosticImpl*>& received) {
        std::vector<double> numbers;
        received.push_back(fresh.registerSymbolicTExpr("[N/2 0.5*M K L]", Dims{3, 4}, symbols).second);
        received.push_back(fresh.registerSymbolicTExpr("[N/2 M]", Dims{0}, symbols).second);
        received.push_back(fresh.registerSymbolicTExpr(u"[N 2 3 1 0.5]", symbols, numbers).second);
        received.push_back(fresh.registerSymbolicDims("N", symbols).second);
        received.push_back(fresh.validateSymbolicDimsTExpr(u"[N*0.5 0]", 1).diagnostic);
        received.push_back(fresh.validateSymbolicDimsTExpr(u"N*0.5", 2).diagnostic);
    };
    for (unsigned long n = 1;; n += 1 + n / 64) {
        Table fresh;
        Workspace symbols;
        symbols.complains = true;
        symbols.set("N", txCreateDoubleScalar(2.5));
        std::vector<qlsvDiagnosticImpl*> received;
        received.reserve(16);
        testsupport::failNewAt(n);
        try {
            work(fresh, symbols, received);
        } catch (const std::bad_alloc&) {
        }
        const bool wasReached = testsupport::failNewAt(0);
        for (qlsvDiagnosticImpl* diagnostic : received)
            qlsvDiscardDiagnostic(diagnostic);
        if (!wasReached) break;
    }
}

} // namespace
