// Simplified expressions mean what the raw ones mean, and the simplified form is one form.
//
// Every test runs a fixed sequence; a failure names the seed of its expression.
#include <gtest/gtest.h>

#include "qlplatform/symbolic/SymbolicExprCopy.h"
#include "qlplatform/symbolic/SymbolicExprFactorDivision.h"
#include "tests/platform/symbolic_support.h"
#include "tests/support/Rounds.h"

namespace {

using namespace symbolic_test;

const std::vector<SymbolicOp> arithmetic = {SymbolicOp::UnaryMinus, SymbolicOp::Plus,  SymbolicOp::Plus,
                                            SymbolicOp::Minus,      SymbolicOp::Minus, SymbolicOp::Multiply,
                                            SymbolicOp::Multiply,   SymbolicOp::Divide};

std::vector<SymbolicOp> allOperators() {
    std::vector<SymbolicOp> all = arithmetic;
    for (int op = 0; op < QL::numSymbolicOps; ++op) {
        switch (static_cast<SymbolicOp>(op)) {
        case SymbolicOp::StringSymbol:
        case SymbolicOp::IntValue:
        case SymbolicOp::DoubleValue:
        case SymbolicOp::BoolSymbol:
        case SymbolicOp::ND:
            break;
        default:
            all.push_back(static_cast<SymbolicOp>(op));
        }
    }
    return all;
}

class Soundness : public testing::Test {
  protected:
    void setUp(QL::SymbolDomain domain) {
        table = std::make_unique<QL::SymbolicExprTable>(domain);
        symbols.clear();
        for (const char* name : {"K", "L", "M", "N"})
            symbols.push_back(symbol(*table, name));
    }

    std::map<unsigned long, Rational> randomBindings(std::mt19937& random) {
        std::map<unsigned long, Rational> bindings;
        for (const E& s : symbols) {
            const long above = static_cast<long>(random() % 19) - 9;
            const bool isWhole = table->getDomain() == QL::SymbolDomain::Integers || random() % 2 == 0;
            bindings[s.id] = Rational(above, isWhole ? 1 : 1 + random() % 5);
        }
        return bindings;
    }

    // Simplifies one random expression a seed and compares values under some bindings.
    void check(unsigned firstSeed, unsigned numExpressions, const RandomKind& kind, QL::SymbolDomain domain) {
        numExpressions = testsupport::rounds(numExpressions);
        unsigned numCompared = 0;
        for (unsigned seed = firstSeed; seed < firstSeed + numExpressions; ++seed) {
            if (seed % 1000 == firstSeed % 1000) setUp(domain); // some see a full table, some a new one
            std::mt19937 random(seed);
            const E raw = randomExpression(random, symbols, kind);
            const E simple = simplified(raw);
            ASSERT_EQ(simplified(simple).id, simple.id) << "seed " << seed << ": " << text(raw);
            for (int round = 0; round < 2; ++round) {
                const auto bindings = randomBindings(random);
                const auto expected = exactValue(raw, bindings);
                if (!expected) continue;
                const auto found = exactValue(simple, bindings);
                ASSERT_TRUE(found.has_value()) << "seed " << seed << ": " << text(raw) << " -> " << text(simple);
                ASSERT_EQ(*found, *expected) << "seed " << seed << ": " << text(raw) << " -> " << text(simple) << ": "
                                             << expected->text() << " became " << found->text();
                ++numCompared;
            }
        }
        EXPECT_GT(numCompared, numExpressions / 2);
    }

    std::unique_ptr<QL::SymbolicExprTable> table;
    std::vector<E> symbols;
};

TEST_F(Soundness, ArithmeticOverRationals) {
    RandomKind kind{arithmetic};
    kind.operators.push_back(SymbolicOp::Power);
    check(1'000'000, 40'000, kind, QL::SymbolDomain::Numbers);
}

TEST_F(Soundness, AllOperatorsOverIntegers) { check(2'000'000, 30'000, {allOperators()}, QL::SymbolDomain::Integers); }

TEST_F(Soundness, AllOperatorsOverRationals) { check(3'000'000, 20'000, {allOperators()}, QL::SymbolDomain::Numbers); }

TEST_F(Soundness, LargeNumbers) { check(4'000'000, 5'000, {arithmetic, 5, 2'000'000'000}, QL::SymbolDomain::Numbers); }

// Doubles are exact where nothing is divided: their products here stay short.
TEST_F(Soundness, Doubles) {
    RandomKind kind{{SymbolicOp::UnaryMinus, SymbolicOp::Plus, SymbolicOp::Minus, SymbolicOp::Multiply, SymbolicOp::Min,
                     SymbolicOp::Max, SymbolicOp::Floor, SymbolicOp::Modulo, SymbolicOp::Abs, SymbolicOp::LessThan,
                     SymbolicOp::Round}};
    kind.maxDepth = 4;
    kind.withDoubles = true;
    check(5'000'000, 10'000, kind, QL::SymbolDomain::Integers);
}

} // namespace
