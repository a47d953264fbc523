// Every allocation of a statement, a question and a listing fails once: the fact is not stated, what was known before
// stays, and the next attempt succeeds.
#include <algorithm>
#include <climits>
#include <functional>
#include <new>

#include <gtest/gtest.h>

#include "qlplatform/services/IException.h"
#include "qltypes/dimensions/SymbolicDimsTable.h"
#include "tests/support/FailingNew.h"

class QLBlock {};

namespace {

using namespace QLTypeSys;
using testsupport::failNewAt;

struct Known {
    Known() {
        for (const char* name : {"A", "B", "C", "D", "E", "F", "G", "H"})
            ids.push_back(SymbolicDimsString(table, name).getId());
        ids.push_back(SymbolicDimsND(table, {ids[0], ids[1]}).getId());
        ids.push_back(SymbolicDimsQLSizeValue(table, 4).getId());
        ids.push_back(SymbolicDimsND(table, {ids[6], ids[7]}).getId());
        const int a = ids[0], b = ids[1], c = ids[2], d = ids[3], e = ids[4], f = ids[5];
        store.addRange(b, 3, 20, &blocks[0], omitLowerBound);
        store.addEqual(c, d, &blocks[0]);
        store.addEqual(d, e, nullptr);
        store.addEqual(b, c, &blocks[0]); // D and E follow
        store.addGreaterThan(a, b, &blocks[0]);
        store.addGreaterThan(f, e, &blocks[0]);
        store.addGreaterThanValue(e, 4, &blocks[0]);
        for (const int id : ids) // an empty range is all that a statement may leave
            EXPECT_THROW(store.addGreaterThanValue(id, INT_MAX, nullptr), foundation::core::except::IException);
        everything();
    }

    /// All answers and listings.
    std::vector<std::string> everything() {
        std::vector<std::string> texts;
        for (const int a : ids)
            for (const int b : ids)
                texts.push_back(std::to_string(store.isEqual(a, b)) + std::to_string(store.isGreaterThan(a, b)));
        for (const int a : ids) {
            const SymbDimsRange range = store.getRange(a);
            texts.push_back(std::to_string(range.min) + " " + std::to_string(range.max) + " " +
                            std::to_string(range.flags));
        }
        const auto text = [this](int id) { return table.getSymbolicDims(id).toString() + " "; };
        const auto numberOf = [this](const std::vector<const QLBlock*>& list) {
            std::string numbers;
            for (const QLBlock* block : list)
                numbers += std::to_string(block - blocks);
            return numbers;
        };
        std::vector<std::string> facts;
        std::vector<SymbolicDimsConstraint> constraints;
        store.getSymbolicDimsConstraints(constraints);
        for (const SymbolicDimsConstraint& constraint : constraints)
            facts.push_back(text(constraint.id) + numberOf(constraint.blocks));
        std::sort(facts.begin(), facts.end()); // they come in the order of hashed maps
        texts.insert(texts.end(), facts.begin(), facts.end());
        for (const QLBlock& block : blocks) {
            std::vector<int> stated;
            store.getSymbolicDimsConstraints(&block, stated);
            facts.clear();
            for (const int id : stated)
                facts.push_back(text(id));
            std::sort(facts.begin(), facts.end()); // the order of ids depends on attempts before
            texts.insert(texts.end(), facts.begin(), facts.end());
        }
        for (const auto listing :
             {&SymbolicDimsConstraints::getEquivalentSymbolicDims, &SymbolicDimsConstraints::getGreaterThanSymbolicDims,
              &SymbolicDimsConstraints::getLessThanSymbolicDims}) {
            std::vector<SymbolicDimsCGConstraint> pairs;
            (store.*listing)(pairs);
            facts.clear();
            for (const SymbolicDimsCGConstraint& pair : pairs)
                facts.push_back(text(pair.first) + text(pair.second) + numberOf(pair.blocks));
            std::sort(facts.begin(), facts.end());
            texts.insert(texts.end(), facts.begin(), facts.end());
        }
        int visited = 0; // a block without a statement is not in the store
        std::vector<int> stated;
        const auto count = [&](const QLBlock* block) { return ++visited, block; };
        store.getSymbolicDimsConstraints(nullptr, count, stated);
        texts.push_back(std::to_string(visited) + " blocks");
        return texts;
    }

    SymbolicDimsTable table;
    SymbolicDimsConstraints store{&table};
    std::vector<int> ids;
    QLBlock blocks[2];
};

using Work = std::function<void(Known&)>;

/// What the work threw: nothing, std::bad_alloc, or a refusal.
enum class Outcome { Done, OutOfMemory, Refused };
Outcome outcomeOf(const Work& work, Known& known, unsigned long failing) {
    failNewAt(failing);
    Outcome outcome = Outcome::Done;
    try {
        work(known);
    } catch (const std::bad_alloc&) {
        outcome = Outcome::OutOfMemory;
    } catch (const foundation::core::except::IException&) {
        outcome = Outcome::Refused;
    }
    failNewAt(0);
    return outcome;
}

// Fails the first allocation, then the second and so on, until the work gets through.
void failEach(const Work& work, bool leavesParts) {
    Known before;
    const std::vector<std::string> stateBefore = before.everything();
    Known after;
    const Outcome expected = outcomeOf(work, after, 0);
    const std::vector<std::string> stateAfter = after.everything();
    unsigned long n = 1;
    for (;; ++n) {
        ASSERT_LT(n, 2000u);
        SCOPED_TRACE("allocation " + std::to_string(n));
        Known known;
        const Outcome outcome = outcomeOf(work, known, n);
        if (outcome != Outcome::OutOfMemory) {
            EXPECT_EQ(outcome, expected);
            EXPECT_EQ(known.everything(), stateAfter);
            break;
        }
        if (!leavesParts) {
            EXPECT_EQ(known.everything(), stateBefore);
        }
        EXPECT_EQ(outcomeOf(work, known, 0), expected);
        EXPECT_EQ(known.everything(), stateAfter);
    }
}

struct Row {
    const char* name;
    Work work;
    bool leavesParts = false;
};

TEST(ConstraintsMemory, EachAllocationOfAStatementFails) {
    const auto stating = [](auto statement) {
        return [statement](Known& known) { statement(known.store, known.ids, &known.blocks[1]); };
    };
    using Store = SymbolicDimsConstraints;
    using Ids = std::vector<int>;
    const Row rows[] = {
        {"two new symbols are equal",
         stating([](Store& s, const Ids& i, const QLBlock* b) { s.addEqual(i[6], i[7], b); })},
        {"by nobody", stating([](Store& s, const Ids& i, const QLBlock*) { s.addEqual(i[6], i[7], nullptr); })},
        {"a class is joined", stating([](Store& s, const Ids& i, const QLBlock* b) { s.addEqual(i[1], i[6], b); })},
        {"a class gets a new root",
         stating([](Store& s, const Ids& i, const QLBlock* b) { s.addEqual(i[0], i[2], b); })},
        {"part of a class changes over",
         stating([](Store& s, const Ids& i, const QLBlock* b) { s.addEqual(i[0], i[4], b); })},
        {"again", stating([](Store& s, const Ids& i, const QLBlock* b) { s.addEqual(i[2], i[3], b); })},
        {"shapes are equal", stating([](Store& s, const Ids& i, const QLBlock* b) { s.addEqual(i[8], i[10], b); }),
         true}, // dimension by dimension
        {"greater", stating([](Store& s, const Ids& i, const QLBlock* b) { s.addGreaterThan(i[6], i[7], b); })},
        {"greater, against the order",
         stating([](Store& s, const Ids& i, const QLBlock* b) { s.addGreaterThan(i[4], i[0], b); })},
        {"greater, again", stating([](Store& s, const Ids& i, const QLBlock* b) { s.addGreaterThan(i[0], i[1], b); })},
        {"greater than a number",
         stating([](Store& s, const Ids& i, const QLBlock* b) { s.addGreaterThan(i[3], i[9], b); })},
        {"less than a number",
         stating([](Store& s, const Ids& i, const QLBlock* b) { s.addLessThanValue(i[3], 9, b); })},
        {"above a number",
         stating([](Store& s, const Ids& i, const QLBlock* b) { s.addGreaterThanValue(i[6], 9, b); })},
        {"a value", stating([](Store& s, const Ids& i, const QLBlock* b) { s.addEqualValue(i[6], 9, b); })},
        {"a range",
         stating([](Store& s, const Ids& i, const QLBlock* b) { s.addRange(i[3], 6, 9, b, generateBothBounds); })},
        {"refused", stating([](Store& s, const Ids& i, const QLBlock* b) { s.addGreaterThan(i[1], i[0], b); })},
        {"a refused bound", stating([](Store& s, const Ids& i, const QLBlock* b) { s.addEqualValue(i[1], 99, b); })},
    };
    for (const Row& row : rows) {
        SCOPED_TRACE(row.name);
        failEach(row.work, row.leavesParts);
        if (HasFailure()) break;
    }
}

TEST(ConstraintsMemory, EachAllocationOfAQuestionFails) {
    const auto asking = [](auto question) {
        return [question](Known& known) {
            known.store.addGreaterThanValue(known.ids[4], 6, nullptr); // so that there is something to find out
            question(known.store, known.ids);
        };
    };
    using Store = SymbolicDimsConstraints;
    using Ids = std::vector<int>;
    const Row rows[] = {
        {"equal", asking([](const Store& s, const Ids& i) { s.isEqual(i[0], i[8]); })},
        {"greater", asking([](const Store& s, const Ids& i) { s.isGreaterThan(i[0], i[1]); })},
        {"range", asking([](const Store& s, const Ids& i) { s.getRange(i[5]); })},
        {"facts", asking([](const Store& s, const Ids&) {
             std::vector<SymbolicDimsConstraint> list;
             s.getSymbolicDimsConstraints(list);
         })},
        {"pairs", asking([](const Store& s, const Ids&) {
             std::vector<SymbolicDimsCGConstraint> list;
             s.getEquivalentSymbolicDims(list);
         })},
    };
    for (const Row& row : rows) {
        SCOPED_TRACE(row.name);
        failEach(row.work, true); // the statement in front holds already
        if (HasFailure()) break;
    }
}

} // namespace
