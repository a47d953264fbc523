// What the host's machine looks like: a 64-bit little-endian Linux.
#pragma once

#include "qlplatform/Export.h"

namespace FXPCORE {

/// Properties of the host. Widths are in bits.
class QL_EXPORT TORVEXHostInfo {
  public:
    TORVEXHostInfo() = delete;

    /// Bits of char.
    static int getBitsPerChar();
    /// Bits of short.
    static int getBitsPerShort();
    /// Bits of int.
    static int getBitsPerInt();
    /// Bits of long.
    static int getBitsPerLong();
    /// Bits of long long.
    static int getBitsPerLongLong();
    /// Bits of a pointer.
    static int getBitsPerPointer();
    /// The width of a pointer.
    static int getWordSize();
    /// Bits of double.
    static int getBitsPerDouble();
    /// Bits of float.
    static int getBitsPerFloat();
    /// Bits of half.
    static int getBitsPerHalf();
    /// Bits of size_t.
    static int getBitsPerSizeT();
    /// Bits of ptrdiff_t.
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
