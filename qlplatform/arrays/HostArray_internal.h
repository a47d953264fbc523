// The record behind a host array and the block of elements that shared copies have in common.
#pragma once

#include <cstdint>
#include <span>

#include "qlplatform/arrays/HostArray.h"

namespace hostarray {

/// Elements of one or more arrays: a header with its bytes right behind it. The bytes of a numeric, logical or
/// character block are its elements. Other blocks begin with the pointers of the arrays that they own, followed by
/// texts, each with its NUL: the field names of structures, the class name of objects.
struct Elements {
    unsigned long references;
    std::size_t numBytes;
    std::size_t numChildren;
    std::size_t numFields;

    char* bytes() { return reinterpret_cast<char*>(this + 1); }
    std::span<txArray_tag*> children() { return {reinterpret_cast<txArray_tag**>(bytes()), numChildren}; }
    char* texts() { return bytes() + numChildren * sizeof(txArray_tag*); }
};
static_assert(sizeof(Elements) % alignof(std::max_align_t) == 0);

// Bits of the flags word.
inline constexpr std::uint32_t temporary = 0x1;
inline constexpr std::uint32_t numeric = 0x80;
inline constexpr std::uint32_t hasImaginary = 0x800;
inline constexpr std::uint32_t complex = numeric | hasImaginary; ///< complex only with both

/// A zero-filled block with one reference; raises OutOfMemory.
Elements* makeElements(std::size_t count, std::size_t elementSize, std::size_t numChildren = 0,
                       std::size_t sizeOfTexts = 0);

/// A new array over `elements`, whose reference it takes over in any case; raises OutOfMemory.
txArray_tag* makeArray(int classNumber, std::uint32_t flags, std::size_t rows, std::size_t columns, Elements* elements);

/// Gives up one reference to the block and to what it owns.
void release(Elements* elements);

/// Makes the block of `array` its own, so that it can be written to; raises OutOfMemory.
Elements& writable(txArray_tag& array);

/// The name of a class other than objects; empty for numbers without a class.
const char* nameOfClass(txClassID classId);

/// Class numbers up to this one are the class itself.
inline constexpr int lastTrivialClassNumber = 16;

} // namespace hostarray

struct txArray_tag {
    unsigned long references;
    std::uint32_t flags;
    int classNumber; ///< up to 16 the class itself; above, asked through _get_class_id_non_trivial
    std::size_t rows;
    std::size_t columns;
    hostarray::Elements* elements; ///< one reference
    txArray_tag* nextDying;        ///< used while arrays are destroyed

    /// The class of an array whose number is above 16: all of them are objects.
    txClassID _get_class_id_non_trivial() const { return txClassObject; }

    txClassID classId() const {
        return classNumber > hostarray::lastTrivialClassNumber ? _get_class_id_non_trivial()
                                                               : static_cast<txClassID>(classNumber);
    }
};
