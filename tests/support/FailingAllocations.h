// Runs a piece of work with its 1st, 2nd, 3rd ... host allocation failing, until it passes untouched.
//
//   EXPECT_GT(testsupport::failEachAllocation([&] { txArrayPtr text(txCreateString("x")); }), 0u);
#pragma once

#include <functional>

#include <gtest/gtest.h>

#include "qlplatform/arrays/HostArray.h"
#include "qlplatform/memory/Memory.h"
#include "tests/support/Raises.h"

namespace testsupport {

/// Each failing run must raise OutOfMemory, or pass where `mayPass` says that the work hides failures; no run may leave
/// host arrays behind. Returns how many allocations the work makes.
inline unsigned long failEachAllocation(const std::function<void()>& work, bool mayPass = false) {
    for (unsigned long n = 1;; ++n) {
        SCOPED_TRACE("failing allocation " + std::to_string(n));
        const std::size_t arraysBefore = txGetNumLiveArrays();
        utFailAllocationAt(n);
        const std::string raised = raisedBy(work);
        const unsigned long numAllocations = utFailAllocationAt(0);
        EXPECT_EQ(txGetNumLiveArrays(), arraysBefore);
        if (numAllocations < n) {
            EXPECT_EQ(raised, "nothing thrown");
            return numAllocations;
        }
        if (!mayPass || raised != "nothing thrown") {
            EXPECT_EQ(raised, "Quillane:Services:OutOfMemory()");
        }
    }
}

} // namespace testsupport
