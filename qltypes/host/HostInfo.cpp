#include "qltypes/host/HostInfo.h"

#include <algorithm>

#include "qltypes/host/HostInfo_internal.h"

namespace FXPCORE {

// clang-format off
int TORVEXHostInfo::getBitsPerChar()     { return 8; }
int TORVEXHostInfo::getBitsPerShort()    { return 16; }
int TORVEXHostInfo::getBitsPerInt()      { return 32; }
int TORVEXHostInfo::getBitsPerLong()     { return 64; }
int TORVEXHostInfo::getBitsPerLongLong() { return 64; }
int TORVEXHostInfo::getBitsPerPointer()  { return 8 * getBitsPerChar(); }
int TORVEXHostInfo::getWordSize()        { return getBitsPerPointer(); }
int TORVEXHostInfo::getBitsPerDouble()   { return 64; }
int TORVEXHostInfo::getBitsPerFloat()    { return 32; }
int TORVEXHostInfo::getBitsPerHalf()     { return 16; }
int TORVEXHostInfo::getBitsPerSizeT()    { return getBitsPerPointer(); }
int TORVEXHostInfo::getBitsPerPtrDiffT() { return getBitsPerPointer(); }
int TORVEXHostInfo::getLongLongMode()    { return 1; }
int TORVEXHostInfo::getEndianness()      { return 1; }
bool TORVEXHostInfo::getShiftRightOnSignedInteger() { return true; }
// clang-format on

int TORVEXHostInfo::getIntDivRndMode() {
    struct Division {
        int dividend;
        int divisor;
    };
    static constexpr Division divisions[] = {{-7, 4}, {-6, 4},  {-5, 4},  {7, -4}, {6, -4},
                                             {5, -4}, {-7, -4}, {-6, -4}, {-5, -4}};
    std::array<int, 9> quotients;
    std::transform(std::begin(divisions), std::end(divisions), quotients.begin(), [](const Division& division) {
        const volatile int dividend = division.dividend; // volatile: the machine divides, not the compiler
        const volatile int divisor = division.divisor;
        return dividend / divisor;
    });
    return roundingFromQuotients(quotients);
}

int roundingFromQuotients(const std::array<int, 9>& quotients) {
    const auto differentSigns = quotients.begin() + 6;
    const auto quotientsAre = [&](int ofDifferentSigns) {
        return std::all_of(quotients.begin(), differentSigns, [&](int q) { return q == ofDifferentSigns; }) &&
               std::all_of(differentSigns, quotients.end(), [](int q) { return q == 1; });
    };
    if (quotientsAre(-2)) return 1;
    if (quotientsAre(-1)) return 0;
    return 2;
}

} // namespace FXPCORE
