// Runs a piece of work with its 1st, 2nd, 3rd ... allocation failing, each time on a subject of its own, until it gets
// through: what fails says that memory ran out and leaves the subject as it was, and the same work then succeeds.
//
//   struct Subject { DataTypeTable table; std::vector<std::string> state(); };
//   EXPECT_GT(testsupport::failEach<Subject>([](Subject& s) { s.table.registerDataType("T", source, nullptr); }), 1u);
//
// Memory of the language and that of the host (utCalloc, utMalloc) run out in turn. A test that uses this compiles
// FailingNew.cpp into its program.
#pragma once

#include <algorithm>
#include <new>
#include <string>
#include <vector>

#include <gtest/gtest.h>

#include "qlplatform/memory/Memory.h"
#include "qlplatform/services/Diagnostics.h"
#include "tests/support/FailingNew.h"
#include "tests/support/Raises.h"

namespace testsupport {

inline const std::string outOfMemory = "memory ran out";

enum class Memory { OfTheLanguage, OfTheHost };

/// Runs `work` with the n-th allocation from now on failing; 0 is none. What came of it: nothing, outOfMemory or the
/// diagnostic of a refusal. `reached` receives whether there was such an allocation.
template <class Work> std::string outcomeOf(Work&& work, Memory memory, unsigned long n, bool& reached) {
    std::string outcome;
    outcome.reserve(1000);
    memory == Memory::OfTheLanguage ? void(failNewAt(n)) : void(utFailAllocationAt(n));
    try {
        work();
    } catch (const std::bad_alloc&) {
        outcome = outOfMemory;
    } catch (const foundation::core::except::IException& e) {
        failNewAt(0);
        outcome = e.diagnostic()->isOutOfMemory() ? outOfMemory : describe(e.diagnostic());
    }
    reached = memory == Memory::OfTheLanguage ? failNewAt(0) : utFailAllocationAt(0) >= n;
    return outcome;
}

/// What may stay behind when memory runs out, until the same work is done again.
enum class Leaves { Nothing, Parts };

/// Expects the same lines, and shows the first that differs.
inline void expectSame(const std::vector<std::string>& lines, const std::vector<std::string>& expected) {
    EXPECT_EQ(lines.size(), expected.size());
    for (std::size_t i = 0; i < std::min(lines.size(), expected.size()); ++i)
        if (lines[i] != expected[i]) {
            ADD_FAILURE() << "line " << i << " is\n" << lines[i] << "\nin place of\n" << expected[i];
            return;
        }
}

/// Returns how many allocations the work makes. A subject is made, and tells its state(), without failures.
template <class Subject, class Work> unsigned long failEach(Work work, Leaves leaves = Leaves::Nothing) {
    const auto untilDone = [&](Subject& subject) {
        bool reached;
        return outcomeOf([&] { work(subject); }, Memory::OfTheLanguage, 0, reached);
    };
    Subject done;
    const std::string expected = untilDone(done);
    const std::vector<std::string> stateAfter = done.state();
    Subject asked; // telling the state may fill caches
    const std::vector<std::string> stateBefore = asked.state();
    if (leaves == Leaves::Nothing) untilDone(asked);
    const std::vector<std::string> stateAfterBoth = leaves == Leaves::Nothing ? asked.state() : stateAfter;
    unsigned long numAllocations = 0;
    for (const Memory memory : {Memory::OfTheLanguage, Memory::OfTheHost}) {
        for (unsigned long n = 1;; ++n) {
            SCOPED_TRACE((memory == Memory::OfTheHost ? "host allocation " : "allocation ") + std::to_string(n));
            Subject subject;
            bool reached;
            const std::string outcome = outcomeOf([&] { work(subject); }, memory, n, reached);
            if (outcome != outOfMemory) { // not reached, or not needed
                EXPECT_EQ(outcome, expected);
                expectSame(subject.state(), stateAfter);
            } else {
                if (leaves == Leaves::Nothing) expectSame(subject.state(), stateBefore);
                EXPECT_EQ(untilDone(subject), expected);
                expectSame(subject.state(), stateAfterBoth);
            }
            if (!reached || testing::Test::HasFailure()) break;
            ++numAllocations;
        }
    }
    return numAllocations;
}

} // namespace testsupport
