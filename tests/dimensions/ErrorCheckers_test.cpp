// The checkers of dimensions and of parameters, row by row: an own message, the base's, or nothing.
#include <functional>
#include <map>
#include <sstream>

#include <gtest/gtest.h>

#include "qlplatform/language/ParseTree.h"
#include "qlplatform/services/Diagnostics.h"
#include "qlplatform/symbolic/SymbolicExprTable.h"
#include "qltypes/dimensions/QLParamExprErrorChecker.h"
#include "qltypes/dimensions/QLSymbolicDimsErrorChecker.h"
#include "tests/support/FailingNew.h"
#include "tests/support/Raises.h"

namespace {

using namespace QLTypeSys;
using testsupport::describe;
using testsupport::expectedMessage;
using Checker = QL::QLSymbolicExprErrorChecker;

constexpr const char* text = "2*N/3";
constexpr const char* marker = "   ^"; // for the byte at 2

// One call of every report, of the second term of `text` or of the whole.
class ErrorCheckers : public testing::Test {
  protected:
    ErrorCheckers() : tree(generate_parse_tree(text)) {}
    ~ErrorCheckers() override { delete_parse_tree(tree); }

    struct Row {
        const char* report;
        std::function<void(Checker&)> call;
        std::string base;
    };
    std::vector<Row> rows() {
        _T_parse_tree_T<char>* node = tree->child(0);
        const std::string c = "Quillane:SymbolicExpr:";
        const auto named = [&](const char* leaf) { return expectedMessage(c + leaf, "N", text, marker); };
        return {
            {"UnhandledExpr", [=](Checker& k) { k.reportUnhandledExpr(node, text); },
             expectedMessage(c + "UnhandledExpression", text, text, " ^")},
            {"UnsupportedFcn", [=, this](Checker& k) { k.reportUnsupportedFcn(function, node, text, table); },
             expectedMessage(c + "UnsupportedFunction", "abs", text, " ^")},
            {"NonScalarValue", [](Checker& k) { k.reportNonScalarValue("N", text, 2); }, named("NonScalarValue")},
            {"InvalidNumArgs", [=, this](Checker& k) { k.reportInvalidNumArgs(function, 3, 1, node, text, table); },
             expectedMessage(c + "InvalidNumArguments", "abs", 3, 1, text, " ^")},
            {"ComplexValue", [](Checker& k) { k.reportComplexValue("N", text, 2); }, named("ComplexValue")},
            {"DivisionExpr", [=](Checker& k) { k.reportDivisionExpr(node, text); },
             expectedMessage(c + "UnsupportedDivision", text, text, "    ^")},
            {"UnsupportedValue", [](Checker& k) { k.reportUnsupportedValue("N", text, 2); }, named("UnsupportedValue")},
            {"NonIntegerValue", [](Checker& k) { k.reportNonIntegerValue("N", text, 2); }, named("NonIntegerValue")},
            {"InvalidLiteralValue", [](Checker& k) { k.reportInvalidLiteralValue("N", text, 2); },
             named("InvalidLiteral")},
            {"IntegerLiteralOverflow", [](Checker& k) { k.reportIntegerLiteralOverflow("N", text, 2); },
             named("IntegerLiteralOverflow")},
            {"LogicalValue", [](Checker& k) { k.reportLogicalValue("N", text, 2); }, named("LogicalValue")},
            {"Diagnostic", [](Checker& k) { k.reportDiagnostic(made()); }, "category:leaf()"},
        };
    }

    static qlsvDiagnosticImpl* made() {
        return qlsvCreateDiagnosticFromMessageID(resource_core::BaseMsgID("category", "leaf", 0));
    }

    // `own` has what differs from the base; an empty text means that nothing is reported.
    template <class Tested> void expectRows(const std::map<std::string, std::string>& own) {
        std::size_t numOwn = 0;
        for (const Row& row : rows()) {
            SCOPED_TRACE(row.report);
            Tested checker;
            const auto found = own.find(row.report);
            if (found != own.end()) ++numOwn;
            const std::string& expected = found == own.end() ? row.base : found->second;
            row.call(checker);
            EXPECT_EQ(describe(checker.pending()), expected.empty() ? "no diagnostic" : expected);
            checker.clearPending();
            checker.setQuiet(true);
            row.call(checker);
            EXPECT_EQ(checker.pending(), nullptr);
            checker.reportDiagnostic(made());
            checker.setQuiet(false);
            checker.reportDiagnostic(made()); // with something pending, it stays as it was
            checker.setQuiet(true);
            row.call(checker);
            EXPECT_EQ(describe(checker.pending()), "category:leaf()");
        }
        EXPECT_EQ(numOwn, own.size());
    }

    QL::SymbolicExprTable table;
    unsigned long function = table.addSymbol("abs");
    _T_parse_tree_T<char>* tree;
};

TEST_F(ErrorCheckers, TheBaseRefusesEverything) {
    expectRows<Checker>({});
    Checker checker;
    qlsvDiagnosticImpl* diagnostic = checker.createNonASCIIStringDiagnostic(u"\u00e4");
    EXPECT_EQ(describe(diagnostic), expectedMessage("Quillane:SymbolicExpr:NonAsciiText", u"\u00e4"));
    EXPECT_EQ(checker.pending(), nullptr);
    qlsvDiscardDiagnostic(diagnostic);
}

TEST_F(ErrorCheckers, Dimensions) {
    const std::string c = "Quillane:SymbolicDims:";
    expectRows<QLSymbolicDimsErrorChecker>({
        {"NonScalarValue", expectedMessage(c + "NonScalarValue", "N", text, marker)},
        {"ComplexValue", expectedMessage(c + "ComplexValue", "N", text, marker)},
        {"NonIntegerValue", expectedMessage(c + "NonIntegerValue", "N", text, marker)},
        {"IntegerLiteralOverflow", ""},
        {"Diagnostic", "category:leaf()"},
    });
    QLSymbolicDimsErrorChecker checker;
    qlsvDiagnosticImpl* diagnostic = checker.createNonASCIIStringDiagnostic(u"\u00e4");
    EXPECT_EQ(describe(diagnostic), expectedMessage(c + "NonAsciiDimensionsString", u"\u00e4"));
    EXPECT_EQ(checker.pending(), nullptr); // it does not report
    qlsvDiscardDiagnostic(diagnostic);
}

TEST_F(ErrorCheckers, Parameters) {
    const std::string c = "Quillane:Data:";
    expectRows<QLParamExprErrorChecker>({
        {"UnhandledExpr", ""},
        {"NonScalarValue", expectedMessage(c + "Param_NonScalarValueInExpression", "N", text)},
        {"ComplexValue", expectedMessage(c + "Param_ComplexValueInExpression", "N", text)},
        {"DivisionExpr", expectedMessage(c + "Param_UnsupportedDivision", text)},
        {"UnsupportedValue", ""},
        {"NonIntegerValue", ""},
        {"InvalidLiteralValue", ""},
        {"IntegerLiteralOverflow", ""},
        {"LogicalValue", expectedMessage(c + "Param_UnsupportedLogicalValue", "N", text)},
        {"Diagnostic", "category:leaf()"},
    });
    EXPECT_EQ(QLParamExprErrorChecker().createNonASCIIStringDiagnostic(u"\u00e4"), nullptr);
}

TEST_F(ErrorCheckers, TheMarkerStandsUnderTheByte) {
    QLSymbolicDimsErrorChecker checker;
    checker.reportComplexValue("2", text, 0);
    EXPECT_EQ(boost::get<std::string>(checker.pending()->item(0).arguments[2]), " ^");
    checker.reportComplexValue("3", text, 4);
    EXPECT_EQ(checker.pending()->text(), "'2' in a dimension is complex:\n"
                                         "  2*N/3\n"
                                         "  ^\n"
                                         "'3' in a dimension is complex:\n"
                                         "  2*N/3\n"
                                         "      ^");
}

// The last two lines of what a message prints: the expression and the caret.
TEST_F(ErrorCheckers, EveryTextPrintsTheCaretUnderTheByte) {
    Checker base;
    QLSymbolicDimsErrorChecker dims;
    for (const Row& row : rows()) {
        for (Checker* checker : {&base, static_cast<Checker*>(&dims)}) {
            checker->clearPending();
            row.call(*checker);
            if (!checker->pending() || checker->pending()->item(0).arguments.empty()) continue;
            SCOPED_TRACE(checker->pending()->text());
            std::vector<std::string> lines;
            std::istringstream in(checker->pending()->text());
            for (std::string line; std::getline(in, line);)
                lines.push_back(line);
            ASSERT_EQ(lines.size(), 3u);
            EXPECT_EQ(lines[1], std::string("  ") + text);
            const auto& marked = boost::get<std::string>(checker->pending()->item(0).arguments.back());
            const std::size_t byte = marked == marker ? 2 : marked == " ^" ? 0 : 3;
            EXPECT_EQ(lines[2], std::string(2 + byte, ' ') + "^");
        }
    }
}

template <class Tested> void expectGathering() {
    Tested checker;
    checker.reportDiagnostic(nullptr);
    EXPECT_EQ(checker.pending(), nullptr);
    qlsvDiagnosticImpl* first = qlsvCreateDiagnosticFromMessageID(resource_core::BaseMsgID("c", "first", 0));
    checker.reportDiagnostic(first);
    EXPECT_EQ(checker.pending(), first); // taken over as it is
    checker.reportDiagnostic(first);
    EXPECT_EQ(describe(checker.pending()), "c:first()");
    checker.reportDiagnostic(qlsvCreateDiagnosticFromMessageID(resource_core::BaseMsgID("c", "second", 0)));
    EXPECT_EQ(describe(checker.pending()), "c:first()\nc:second()");
    checker.setQuiet(true);
    checker.reportDiagnostic(qlsvCreateDiagnosticFromMessageID(resource_core::BaseMsgID("c", "third", 0)));
    checker.reportDiagnostic(checker.pending());
    EXPECT_EQ(describe(checker.pending()), "c:first()\nc:second()");
}

TEST_F(ErrorCheckers, DiagnosticsGatherInOrder) {
    expectGathering<QLSymbolicDimsErrorChecker>();
    expectGathering<QLParamExprErrorChecker>();
}

// The address sanitizer sees a diagnostic that is left behind.
TEST_F(ErrorCheckers, MemoryThatRunsOutLeavesNothingBehind) {
    for (unsigned long n = 1;; ++n) {
        QLSymbolicDimsErrorChecker dims;
        QLParamExprErrorChecker params;
        testsupport::failNewAt(n);
        try {
            dims.reportComplexValue("N", text, 2);
            dims.reportNonScalarValue("N", text, 2);
            params.reportComplexValue("N", text, 2);
            params.reportNonScalarValue("N", text, 2);
        } catch (const std::bad_alloc&) {
        }
        if (!testsupport::failNewAt(0)) break;
    }
}

} // namespace
