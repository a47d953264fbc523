#include "tests/dynamic_matrix/FailingNew.h"

#include <new>

namespace {

unsigned long callsLeft = 0; // until the one that fails; 0: none will

} // namespace

void testsupport::failNewAt(unsigned long n) { callsLeft = n; }

void* operator new[](std::size_t size, const std::nothrow_t&) noexcept {
    constexpr std::size_t terabyte = std::size_t{1} << 40;
    if (size > terabyte || (callsLeft != 0 && --callsLeft == 0)) return nullptr;
    try {
        return ::operator new[](size);
    } catch (const std::bad_alloc&) {
        return nullptr;
    }
}
