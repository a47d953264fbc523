// How many rounds a long test takes: all of them, or a share where every step is slow.
#pragma once

#include <algorithm>
#include <cstdlib>

namespace testsupport {

/// `count`, divided by the number in the environment variable QLTYPES_TEST_SHORTER where it is set; at least 1.
template <class Count> Count rounds(Count count) {
    const char* const shorter = std::getenv("QLTYPES_TEST_SHORTER");
    const int divisor = shorter ? std::max(std::atoi(shorter), 1) : 1;
    return std::max<Count>(count / static_cast<Count>(divisor), 1);
}

} // namespace testsupport
