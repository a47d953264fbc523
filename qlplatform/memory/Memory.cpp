#include "qlplatform/memory/Memory.h"

#include <cstdlib>

namespace {

unsigned long callsSeen = 0;
unsigned long failingCall = 0; // 0: none

bool thisCallFails() { return ++callsSeen == failingCall; }

} // namespace

void* utCalloc(std::size_t count, std::size_t size) { return thisCallFails() ? nullptr : std::calloc(count, size); }
void* utMalloc(std::size_t size) { return thisCallFails() ? nullptr : std::malloc(size); }
void utFree(void* memory) { std::free(memory); }

unsigned long utFailAllocationAt(unsigned long n) {
    const unsigned long seen = callsSeen;
    callsSeen = 0;
    failingCall = n;
    return seen;
}
