#include "qltypes/conversion/Levels_internal.h"

#include <unistd.h>

namespace QLTypeSys::conversion {

constinit const Level* levelInUse = &portableLevel;
constinit std::size_t cachedBytes = std::size_t{16} << 20;

std::span<const Level* const> availableLevels() {
#ifdef __x86_64__
    static constexpr const Level* levels[] = {&portableLevel, &avx2Level, &avx512Level};
    const auto supported = [] {
        __builtin_cpu_init();
        if (!__builtin_cpu_supports("avx2") || !__builtin_cpu_supports("fma")) return 1;
        const bool all512 = __builtin_cpu_supports("avx512f") && __builtin_cpu_supports("avx512bw") &&
                            __builtin_cpu_supports("avx512dq") && __builtin_cpu_supports("avx512vl");
        return all512 ? 3 : 2;
    };
    return std::span(levels).first(static_cast<std::size_t>(supported()));
#else
    static constexpr const Level* levels[] = {&portableLevel};
    return levels;
#endif
}

namespace {

// Both values are right before this runs, so that other initialisers may convert.
[[gnu::constructor]] void suitThisMachine() {
    levelInUse = availableLevels().back();
    if (const long told = sysconf(_SC_LEVEL3_CACHE_SIZE); told > 0) cachedBytes = static_cast<std::size_t>(told) / 2;
}

} // namespace

} // namespace QLTypeSys::conversion
