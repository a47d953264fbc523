#include "qltypes/conversion/Levels_internal.h"

#include <unistd.h>

namespace QLTypeSys::conversion {

constinit const Level* levelInUse = &portableLevel;
constinit std::size_t cachedBytes = std::size_t{32} << 20;

std::span<const Level* const> availableLevels() {
    static constexpr const Level* levels[] = {&portableLevel};
    return levels;
}

namespace {

// Both values are right before this runs, so that other initialisers may convert.
[[gnu::constructor]] void suitThisMachine() {
    levelInUse = availableLevels().back();
    if (const long told = sysconf(_SC_LEVEL3_CACHE_SIZE); told > 0) cachedBytes = static_cast<std::size_t>(told);
}

} // namespace

} // namespace QLTypeSys::conversion
