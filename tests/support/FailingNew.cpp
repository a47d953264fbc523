#include "tests/support/FailingNew.h"

#include <cstdlib>
#include <new>

namespace {

unsigned long callsLeft = 0; // until the one that fails; 0: none will
bool wasReached = false;
unsigned long nothrowCallsLeft = 0;

} // namespace

bool testsupport::failNewAt(unsigned long n) {
    const bool reached = wasReached;
    callsLeft = n;
    wasReached = false;
    return reached;
}

void testsupport::failNothrowNewAt(unsigned long n) { nothrowCallsLeft = n; }

void* operator new(std::size_t size) {
    if (callsLeft != 0 && --callsLeft == 0) {
        wasReached = true;
        throw std::bad_alloc();
    }
    void* const memory = std::malloc(size != 0 ? size : 1);
    if (!memory) throw std::bad_alloc();
    return memory;
}

void* operator new[](std::size_t size) { return ::operator new(size); }

// Here because memory of this kind is given back through the functions below.
void* operator new(std::size_t size, const std::nothrow_t&) noexcept { return std::malloc(size != 0 ? size : 1); }

void* operator new[](std::size_t size, const std::nothrow_t&) noexcept {
    constexpr std::size_t terabyte = std::size_t{1} << 40;
    if (size > terabyte || (nothrowCallsLeft != 0 && --nothrowCallsLeft == 0)) return nullptr;
    return std::malloc(size != 0 ? size : 1);
}

void operator delete(void* memory) noexcept { std::free(memory); }
void operator delete(void* memory, std::size_t) noexcept { std::free(memory); }
void operator delete[](void* memory) noexcept { std::free(memory); }
void operator delete[](void* memory, std::size_t) noexcept { std::free(memory); }
