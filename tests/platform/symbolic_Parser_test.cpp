#include <cmath>
#include <limits>
#include <memory>

#include <gtest/gtest.h>

#include "qlplatform/services/Diagnostics.h"
#include "qlplatform/services/MessageTexts.h"
#include "qlplatform/symbolic/SymbolicExprParser.h"
#include "tests/platform/symbolic_support.h"
#include "tests/support/Raises.h"
#include "tests/support/Tsv.h"

namespace {

using namespace symbolic_test;

struct DiagnosticDeleter {
    void operator()(qlsvDiagnosticImpl* diagnostic) const { qlsvDiscardDiagnostic(diagnostic); }
};

struct Parsed {
    unsigned long id;
    std::unique_ptr<qlsvDiagnosticImpl, DiagnosticDeleter> refusal;
};

Parsed parsed(QL::SymbolicExprTable& table, const std::string& text, bool host = false, bool lists = true) {
    const auto [id, refusal] = QL::SymbolicExprParser(table, host, lists)(text.c_str());
    return {id, std::unique_ptr<qlsvDiagnosticImpl, DiagnosticDeleter>(refusal)};
}

// What a text is refused with.
std::string refusalOf(const std::string& text, bool host = false, bool lists = true) {
    QL::SymbolicExprTable table;
    return testsupport::describe(parsed(table, text, host, lists).refusal.get());
}

std::string repeated(const std::string& part, int count) {
    std::string result;
    for (int i = 0; i < count; ++i)
        result += part;
    return result;
}

TEST(SymbolicParser, TextsReadAsTheTableSays) {
    for (const testsupport::TsvRow& row : testsupport::readTsv(QLTYPES_TEST_DATA_DIR "/engine_expressions.tsv")) {
        SCOPED_TRACE("line " + std::to_string(row.line) + ": " + row.columns.at(1));
        const bool host = row.columns.at(0) == "host";
        const std::string source = testsupport::unescaped(row.columns.at(1));
        QL::SymbolicExprTable table;
        const Parsed result = parsed(table, source, host);
        if (row.columns.at(2) == "ok") {
            ASSERT_FALSE(result.refusal) << result.refusal->text();
            const std::string printed = text({&table, result.id}, host);
            EXPECT_EQ(printed, testsupport::unescaped(row.columns.at(3)));
            EXPECT_EQ(parsed(table, printed, host).id, result.id);
        } else {
            ASSERT_TRUE(result.refusal) << text({&table, result.id}, host);
            EXPECT_EQ(result.id, QL::SymbolicExprTable::noExpr);
            EXPECT_EQ(table.getNumExprs(), 0U) << "a refused text leaves nothing";
            ASSERT_EQ(result.refusal->numItems(), 1U);
            const resource_core::BaseMsgID& message = result.refusal->item(0);
            EXPECT_EQ(message.category, "Quillane:SymbolicExpr");
            EXPECT_EQ(message.leaf, row.columns.at(2));
            EXPECT_EQ(std::to_string(boost::get<long>(message.arguments.at(0))), row.columns.at(3));
            EXPECT_NE(result.refusal->text().find(testsupport::unescaped(row.columns.at(4))), std::string::npos)
                << result.refusal->text();
        }
    }
}

TEST(SymbolicParser, MakesTheEntriesThatTheNodeClassesMake) {
    QL::SymbolicExprTable table;
    const E k = symbol(table, "K"), l = symbol(table, "L"), m = symbol(table, "M");
    const auto n = [&](int value) { return number(table, value); };
    const struct {
        const char* text;
        E expr;
    } rows[] = {
        {"(K*L + 2*K)/2 % M", (k * l + n(2) * k) / n(2) % m},
        {"K - L - M", k - l - m},
        {"K - (L - M)", k - (l - m)},
        {"-3", n(-3)},
        {"-(3)", -n(3)},
        {"2147483648", number(table, 2147483648.0)},
        {"1.0", number(table, 1.0)},
        {"true", {&table, table.addBool(true)}},
        {"K + L < M && !K", make(SymbolicOp::And, make(SymbolicOp::LessThan, k + l, m), make(SymbolicOp::Not, k))},
        {"trunc(pow(K, 2))", make(SymbolicOp::Fix, make(SymbolicOp::Power, k, n(2)))},
        {"rem(K, L)", make(SymbolicOp::Rem, k, l)},
        {"[K L -3]", list(table, {k, l, n(-3)})},
        {"[]", list(table, {})},
    };
    const unsigned long numExprs = table.getNumExprs();
    for (const auto& row : rows)
        EXPECT_EQ(parsed(table, row.text).id, row.expr.id) << row.text;
    EXPECT_EQ(table.getNumExprs(), numExprs) << "what exists is found, and nothing else is made";
}

TEST(SymbolicParser, ListsAreReadOnRequest) {
    EXPECT_EQ(refusalOf("[K L]", false, true), "no diagnostic");
    EXPECT_EQ(refusalOf("[K L]", false, false),
              testsupport::expectedMessage("Quillane:SymbolicExpr:UnexpectedToken", 0,
                                           "an operand, for a list of dimensions stands alone", "'['"));
}

TEST(SymbolicParser, PrintedExpressionsReadBack) {
    RandomKind kind;
    kind.withDoubles = true;
    for (int op = static_cast<int>(SymbolicOp::UnaryMinus); op < QL::numSymbolicOps; ++op)
        if (op != static_cast<int>(SymbolicOp::BoolSymbol) && op != static_cast<int>(SymbolicOp::ND))
            kind.operators.push_back(static_cast<SymbolicOp>(op));
    QL::SymbolicExprTable table;
    const std::vector<E> terminals = {symbol(table, "K"),
                                      symbol(table, "rate.L"),
                                      symbol(table, "min"),
                                      {&table, table.addBool(true)},
                                      number(table, std::numeric_limits<int>::min()),
                                      number(table, -std::numeric_limits<double>::infinity()),
                                      number(table, std::nan("")),
                                      number(table, 1e300)};
    for (unsigned seed = 8'000'000; seed < 8'020'000; ++seed) {
        std::mt19937 random(seed);
        std::vector<E> parts;
        for (std::size_t i = random() % 4; i-- > 0;)
            parts.push_back(randomExpression(random, terminals, kind));
        const E expr = parts.size() == 1 ? parts[0] : list(table, parts);
        const std::string printed = text(expr);
        const Parsed back = parsed(table, printed);
        ASSERT_FALSE(back.refusal) << "seed " << seed << ": " << printed << ": " << back.refusal->text();
        ASSERT_EQ(back.id, expr.id) << "seed " << seed << ": " << printed;
    }
}

// In the form of the host language, where whole doubles look like integers and a % b like rem(a, b).
TEST(SymbolicParser, HostLanguageReadsBack) {
    RandomKind kind;
    for (int op = static_cast<int>(SymbolicOp::UnaryMinus); op < QL::numSymbolicOps; ++op)
        if (op != static_cast<int>(SymbolicOp::BoolSymbol) && op != static_cast<int>(SymbolicOp::ND) &&
            op != static_cast<int>(SymbolicOp::Modulo))
            kind.operators.push_back(static_cast<SymbolicOp>(op));
    QL::SymbolicExprTable table;
    const std::vector<E> terminals = {symbol(table, "K"), symbol(table, "L"), number(table, -0.5),
                                      number(table, std::numeric_limits<double>::infinity())};
    for (unsigned seed = 9'000'000; seed < 9'010'000; ++seed) {
        std::mt19937 random(seed);
        const E expr = randomExpression(random, terminals, kind);
        const std::string printed = text(expr, true);
        const Parsed back = parsed(table, printed, true);
        ASSERT_FALSE(back.refusal) << "seed " << seed << ": " << printed << ": " << back.refusal->text();
        ASSERT_EQ(back.id, expr.id) << "seed " << seed << ": " << printed;
    }
}

TEST(SymbolicParser, DepthCostsNoStack) {
    constexpr int depth = 100'000;
    QL::SymbolicExprTable table;
    E left = symbol(table, "K");
    E right = left;
    E sign = left;
    for (int i = 0; i < depth; ++i) {
        left = left - symbol(table, "L");
        right = symbol(table, "L") - right;
        sign = -sign;
    }
    for (const E& expr : {left, right, sign})
        EXPECT_EQ(parsed(table, text(expr)).id, expr.id);
    EXPECT_EQ(parsed(table, repeated("-", depth) + "K").id, sign.id);
    EXPECT_EQ(refusalOf(repeated("abs(", depth) + "K" + repeated(")", depth)), "no diagnostic");
}

TEST(SymbolicParser, LimitsHaveMessages) {
    constexpr int limit = QL::SymbolicExprParser::nestingLimit;
    EXPECT_EQ(refusalOf(repeated("(", limit) + "K" + repeated(")", limit)), "no diagnostic");
    EXPECT_EQ(refusalOf(repeated("(", limit + 1)),
              testsupport::expectedMessage("Quillane:SymbolicExpr:NestingTooDeep", limit, limit));
    EXPECT_EQ(refusalOf("K+abs" + repeated("(", limit + 1)),
              testsupport::expectedMessage("Quillane:SymbolicExpr:NestingTooDeep", limit + 5, limit));
    constexpr int longest = (1 << 23) - 1;
    EXPECT_EQ(refusalOf("[" + repeated("1 ", longest) + "]"), "no diagnostic");
    EXPECT_EQ(refusalOf(" [" + repeated("1 ", longest + 1) + "]"),
              testsupport::expectedMessage("Quillane:SymbolicExpr:ListTooLong", 1));
}

// Every text that differs from a good one in a byte is read or refused in the same sound way.
TEST(SymbolicParser, DamagedTextsAreReadOrRefused) {
    const std::string good = "[(K*L + 2*K)/2 % M -3.5 pow(K, -1) !a.b && min(1e3, inf)]";
    for (std::size_t i = 0; i < good.size(); ++i) {
        for (int byte = 1; byte < 256; ++byte) {
            std::string damaged = good;
            damaged[i] = static_cast<char>(byte);
            QL::SymbolicExprTable table;
            const Parsed result = parsed(table, damaged);
            if (!result.refusal) {
                EXPECT_EQ(parsed(table, text({&table, result.id})).id, result.id) << damaged;
                continue;
            }
            const long position = boost::get<long>(result.refusal->item(0).arguments.at(0));
            EXPECT_TRUE(position >= 0 && position <= static_cast<long>(damaged.size())) << damaged;
            EXPECT_NE(qlsvFindMessageText(result.refusal->item(0)), nullptr);
        }
    }
}

} // namespace
