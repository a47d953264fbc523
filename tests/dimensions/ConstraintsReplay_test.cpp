// Random statements, questions and listings, each held against the literal store.
#include <algorithm>
#include <cstdio>
#include <map>
#include <new>
#include <optional>
#include <random>
#include <set>

#include <gtest/gtest.h>

#include "qlplatform/symbolic/SymbolicExpr.h"
#include "tests/dimensions/LiteralConstraints.h"
#include "tests/support/FailingNew.h"
#include "tests/support/FlagState.h"
#include "tests/support/Raises.h"
#include "tests/support/Rounds.h"

class QLBlock {};

namespace {

using namespace QLTypeSys;
using dimensionstest::LiteralConstraints;
using QL::SymbolicOp;

// What came of a statement, as testsupport::raisedBy puts it.
std::string outcomeOf(const std::function<void()>& statement) {
    try {
        statement();
    } catch (const LiteralConstraints::Refusal& refusal) {
        std::string text = "QuillaneTypes:Dimensions:" + refusal.leaf + "(";
        for (const std::string& argument : refusal.arguments)
            text += (text.back() == '(' ? "'" : ", '") + argument + "'";
        return text + ")";
    }
    return "nothing thrown";
}

using Facts = LiteralConstraints::Facts;
using Pairs = LiteralConstraints::Pairs;

bool isSame(const SymbolicDimsConstraint& a, const SymbolicDimsConstraint& b) {
    return a.id == b.id && a.blocks == b.blocks;
}
bool isSame(const SymbolicDimsCGConstraint& a, const SymbolicDimsCGConstraint& b) {
    return a.first == b.first && a.second == b.second && a.blocks == b.blocks;
}
bool isSame(const SymbDimsRange& a, const SymbDimsRange& b) {
    return a.min == b.min && a.max == b.max && a.flags == b.flags;
}

class Replay {
  public:
    explicit Replay(unsigned seed, bool inShortMemory = false)
        : random(seed), store(&table), literal(table), memoryFails(inShortMemory) {
        const int numSymbols = 4 + below(7);
        std::vector<int> symbols;
        for (int i = 0; i < numSymbols; ++i)
            symbols.push_back(SymbolicDimsString(table, std::string(1, static_cast<char>('A' + i))).getId());
        const auto any = [&](const std::vector<int>& from) {
            return from[static_cast<std::size_t>(below(static_cast<int>(from.size())))];
        };
        std::vector<int> dimensions = symbols;
        for (int i = 0; i < 4; ++i)
            dimensions.push_back(number(below(7) - 1));
        const SymbolicOp ops[] = {SymbolicOp::Plus, SymbolicOp::Multiply, SymbolicOp::Divide, SymbolicOp::Divide,
                                  SymbolicOp::Modulo};
        for (int i = 0; i < 6; ++i)
            dimensions.push_back(expr(ops[below(5)], any(dimensions), any(dimensions)));
        pool = dimensions;
        dimensions.push_back(number(1));
        dimensions.push_back(number(1));
        for (int i = 0; i < 4; ++i) {
            std::vector<int> list;
            for (int n = 1 + below(4); n > 0; --n)
                list.push_back(any(dimensions));
            pool.push_back(SymbolicDimsND(table, list).getId());
        }
        pool.insert(pool.end(), symbols.begin(), symbols.end()); // the rest is half of the pool at most
        std::shuffle(pool.begin(), pool.end(), random);
        for (int& weight : weights)
            weight = 1 + below(below(3) == 0 ? 12 : 3);
    }

    void run() {
        testsupport::FlagState maxInCode(QlFeature::find("SymbolicDimsMaxConstraintInCode"), below(4) != 0);
        testsupport::FlagState defaultMin(QlFeature::find("SymbolicDimensionDefaultMinimum"), below(4) - 1);
        for (int i = 5 + below(36); i > 0 && !testing::Test::HasFailure(); --i) {
            state();
            for (int questions = below(4); questions > 0; --questions)
                ask(any(), any());
            if (below(30) == 0) list();
        }
        for (const int a : pool)
            for (const int b : pool)
                ask(a, b);
        list();
    }

    int numRefused = 0;
    int numStated = 0;
    int numOutOfMemory = 0;

  private:
    int below(int limit) { return static_cast<int>(random() % static_cast<unsigned>(limit)); }
    int any() { return pool[static_cast<std::size_t>(below(static_cast<int>(pool.size())))]; }
    int number(long value) { return SymbolicDimsQLSizeValue(table, value).getId(); }
    int anyValue() {
        const int extremes[] = {std::numeric_limits<int>::min(), std::numeric_limits<int>::max(),
                                std::numeric_limits<int>::min() + 1, std::numeric_limits<int>::max() - 1};
        return below(12) == 0 ? extremes[below(4)] : below(11) - 2;
    }
    int expr(SymbolicOp op, int a, int b) {
        return static_cast<int>(
                   table.getExprTable().add(op, static_cast<unsigned long>(a + 1), static_cast<unsigned long>(b + 1))) -
               1;
    }
    std::string text(int id) { return SymbolicDims(&table, id).toString(); }

    // Does the same on both, and compares what came of it.
    template <class Statement> void both(const std::string& what, const Statement& statement) {
        history += what + "\n";
        compare(testsupport::raisedBy([&] { statement(store); }), statement);
    }
    template <class Statement> void compare(const std::string& outcome, const Statement& statement) {
        const std::string expected = outcomeOf([&] { statement(literal); });
        EXPECT_EQ(outcome, expected) << history;
        ++(expected == "nothing thrown" ? numStated : numRefused);
    }

    // What comes of it on the store when some allocation fails, unless none that failed was needed.
    template <class Work> std::optional<std::string> outcomeInShortMemory(const Work& work) {
        std::optional<std::string> outcome;
        testsupport::failNewAt(1 + random() % 24);
        try {
            outcome = testsupport::raisedBy([&] { work(store); });
        } catch (const std::bad_alloc&) {
            ++numOutOfMemory;
        }
        testsupport::failNewAt(0);
        return outcome;
    }

    // Mostly as both. In short memory a statement may be stated on none instead: nothing is changed then but that the
    // ranges of its sizes may be there, which is why they are made on both beforehand. Not so statements on shapes, of
    // which the dimensions in front of the failure stay stated.
    template <class Statement>
    void bothOrNone(const std::string& what, const std::vector<int>& ids, const Statement& statement) {
        const bool isOfShapes = std::any_of(ids.begin(), ids.end(), [this](int id) {
            return table.getSymbolicExpr(static_cast<unsigned long>(id + 1)).getNumDimensions() != 0;
        });
        if (!memoryFails || isOfShapes || below(3) != 0) return both(what, statement);
        for (const int id : ids)
            both("a range of " + text(id),
                 [&](auto& s) { s.addGreaterThanValue(id, std::numeric_limits<int>::max(), nullptr); });
        history += what + " (in short memory)\n";
        const std::optional<std::string> outcome = outcomeInShortMemory(statement);
        if (outcome) compare(*outcome, statement);
    }

    void state() {
        const int a = any(), b = any();
        const int value = anyValue();
        const QLBlock* const block = below(4) == 0 ? nullptr : &blocks[below(3)];
        const std::string of = text(a);
        std::discrete_distribution<int> kind(std::begin(weights), std::end(weights));
        switch (kind(random)) {
        case 0:
            return bothOrNone(of + " == " + text(b), {a, b}, [&](auto& s) { s.addEqual(a, b, block); });
        case 1:
            return bothOrNone(of + " is " + std::to_string(value), {a},
                              [&](auto& s) { s.addEqualValue(a, value, block); });
        case 2:
            return bothOrNone(of + " > " + text(b), {a, b}, [&](auto& s) { s.addGreaterThan(a, b, block); });
        case 3:
            return bothOrNone(of + " above " + std::to_string(value), {a},
                              [&](auto& s) { s.addGreaterThanValue(a, value, block); });
        case 4:
            return bothOrNone(of + " below " + std::to_string(value), {a},
                              [&](auto& s) { s.addLessThanValue(a, value, block); });
        default:
            const int max = below(8) == 0 ? anyValue() : std::max(value, anyValue());
            const auto flags = static_cast<GenerateCodeFlags>(below(8));
            bothOrNone(of + " in " + std::to_string(value) + " to " + std::to_string(max), {a},
                       [&](auto& s) { s.addRange(a, value, max, block, flags); });
        }
    }

    void ask(int a, int b) {
        if (memoryFails && below(2) == 0)
            outcomeInShortMemory([&](const SymbolicDimsConstraints& s) {
                s.getRange(a);
                s.isEqual(a, b);
                s.isGreaterThan(a, b);
            });
        EXPECT_EQ(store.isEqual(a, b), literal.isEqual(a, b)) << history << text(a) << " == " << text(b) << '?';
        EXPECT_EQ(store.isGreaterThan(a, b), literal.isGreaterThan(a, b))
            << history << text(a) << " > " << text(b) << '?';
        const SymbDimsRange range = store.getRange(a), expected = literal.getRange(a);
        EXPECT_TRUE(isSame(range, expected)) << history << "range of " << text(a) << ": " << range.min << " to "
                                             << range.max << " and not " << expected.min << " to " << expected.max;
    }

    int keyOf(int exprId) {
        return static_cast<int>(table.getSymbolicExpr(static_cast<unsigned long>(exprId + 1)).getLeft()) - 1;
    }

    // The groups must follow each other; inside a group, keys may come in any order, but together.
    void expectFacts(Facts facts, const std::vector<Facts>& groups) {
        std::size_t begin = 0;
        for (const Facts& group : groups) {
            ASSERT_LE(begin + group.size(), facts.size()) << history;
            const auto first = facts.begin() + static_cast<std::ptrdiff_t>(begin);
            const auto last = first + static_cast<std::ptrdiff_t>(group.size());
            std::set<int> closed;
            for (auto i = first; i != last; ++i)
                if (i != first && keyOf(i->id) != keyOf((i - 1)->id)) {
                    EXPECT_FALSE(closed.contains(keyOf(i->id))) << history;
                    closed.insert(keyOf((i - 1)->id));
                }
            std::stable_sort(first, last, [this](const auto& x, const auto& y) { return keyOf(x.id) < keyOf(y.id); });
            for (std::size_t i = 0; i < group.size(); ++i)
                EXPECT_TRUE(isSame(*(first + static_cast<std::ptrdiff_t>(i)), group[i]))
                    << history << text(group[i].id) << " is listed differently";
            begin += group.size();
        }
        EXPECT_EQ(begin, facts.size()) << history;
    }

    void expectPairs(const Pairs& pairs, const Pairs& expected) {
        ASSERT_EQ(pairs.size(), expected.size()) << history;
        for (std::size_t i = 0; i < pairs.size(); ++i)
            EXPECT_TRUE(isSame(pairs[i], expected[i]))
                << history << text(pairs[i].first) << ", " << text(pairs[i].second) << " and not "
                << text(expected[i].first) << ", " << text(expected[i].second);
    }

    void list() {
        const Pairs stale(3);
        Facts facts(2);
        store.getSymbolicDimsConstraints(facts);
        expectFacts(facts, literal.facts(false));

        std::vector<int> ids(2);
        store.getSymbolicDimsConstraints(ids);
        Facts withoutBlocks;
        for (const int id : ids)
            withoutBlocks.push_back({id, {}});
        std::vector<Facts> expected = literal.facts(true);
        for (Facts& group : expected)
            for (SymbolicDimsConstraint& fact : group)
                fact.blocks.clear();
        expectFacts(withoutBlocks, expected);

        for (const QLBlock& block : blocks) {
            store.getSymbolicDimsConstraints(&block, ids);
            EXPECT_EQ(ids, literal.statedBy([&](const QLBlock* b) { return b == &block; })) << history;
        }
        const QLBlock* const merged = &blocks[1];
        const auto mapper = [&](const QLBlock* b) { return b == &blocks[0] ? merged : b; };
        store.getSymbolicDimsConstraints(merged, mapper, ids);
        EXPECT_EQ(ids, literal.statedBy([&](const QLBlock* b) { return mapper(b) == merged; })) << history;

        Pairs pairs = stale;
        store.getEquivalentSymbolicDims(pairs);
        expectPairs(pairs, literal.equivalent());
        pairs = stale;
        store.getGreaterThanSymbolicDims(pairs);
        expectPairs(pairs, literal.greaterThan());
        pairs = stale;
        store.getLessThanSymbolicDims(pairs);
        expectPairs(pairs, literal.lessThan());
    }

    std::mt19937 random;
    SymbolicDimsTable table;
    SymbolicDimsConstraints store;
    LiteralConstraints literal;
    const bool memoryFails;
    std::vector<int> pool;
    int weights[6];
    QLBlock blocks[3];
    std::string history = "after\n";
};

TEST(ConstraintsReplay, AsTheLiteralStoreDoes) {
    const int numSeeds = testsupport::rounds(10'000);
    int numStated = 0, numRefused = 0;
    for (int seed = 1; seed <= numSeeds; ++seed) {
        SCOPED_TRACE("seed " + std::to_string(seed));
        Replay replay(static_cast<unsigned>(seed));
        replay.run();
        numStated += replay.numStated;
        numRefused += replay.numRefused;
        if (HasFailure()) break;
    }
    // The sequences are worth something only when both happen often.
    EXPECT_GT(numStated, 5 * numSeeds);
    EXPECT_GT(numRefused, 2 * numSeeds);
    std::printf("%d statements held, %d were refused\n", numStated, numRefused);
}

TEST(ConstraintsReplay, AlsoWhenMemoryFails) {
    const int numSeeds = testsupport::rounds(1000);
    int numOutOfMemory = 0;
    for (int seed = 1; seed <= numSeeds; ++seed) {
        SCOPED_TRACE("seed " + std::to_string(seed));
        Replay replay(static_cast<unsigned>(seed), true);
        replay.run();
        numOutOfMemory += replay.numOutOfMemory;
        if (HasFailure()) break;
    }
    EXPECT_GT(numOutOfMemory, numSeeds);
}

} // namespace
