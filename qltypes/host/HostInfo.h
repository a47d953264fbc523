// What the host's machine looks like: a 64-bit little-endian Linux.
#pragma once

#include "qlplatform/Export.h"

namespace FXPCORE {

/// Properties of the host. Widths are in bits.
class QL_EXPORT TORVEXHostInfo {
  public:
    TORVEXHostInfo() = delete;

    static int getBitsPerChar();
    static int getBitsPerShort();
    static int getBitsPerInt();
    static int getBitsPerLong();
    static int getBitsPerLongLong();
    static int getBitsPerPointer();
    /// The width of a pointer.
    static int getWordSize();
    static int getBitsPerDouble();
    static int getBitsPerFloat();
    static int getBitsPerHalf();
    static int getBitsPerSizeT();
    static int getBitsPerPtrDiffT();

    /// 1: long long is available.
    static int getLongLongMode();

    /// 1: little-endian.
    static int getEndianness();

    /// How signed division rounds, measured at each call: 0 toward zero, 1 toward minus infinity, 2 neither.
    static int getIntDivRndMode();

    /// Whether a right shift of a negative signed integer keeps its sign: true.
    static bool getShiftRightOnSignedInteger();
};

} // namespace FXPCORE
