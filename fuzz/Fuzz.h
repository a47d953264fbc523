// What a fuzz target defines and uses.
//
// Each source beside this file is one target: it defines LLVMFuzzerTestOneInput, which reads one input and stops the
// process when a claim about the result does not hold. Inputs that once mattered lie in corpus/<target>/.
#pragma once

#include <cstddef>
#include <cstdint>
#include <cstdio>
#include <cstdlib>

extern "C" int LLVMFuzzerTestOneInput(const std::uint8_t* data, std::size_t size);

namespace fuzz {

/// Stops the process when `holds` is false.
inline void claim(bool holds, const char* what) {
    if (holds) return;
    std::fprintf(stderr, "claim does not hold: %s\n", what);
    std::abort();
}

} // namespace fuzz
