// Tables of names and values, as menus and enumerations of the engine are written.
//
//   constexpr EnumStr layoutRows[] = {{"RowMajor", 1}, {"ColumnMajor", 0}};
//   constexpr EnumStrs layouts = {2, layoutRows};
//   utEnumStrs_EnumValue_to_string(&layouts, 1); // "RowMajor"
#pragma once

#include <cstdint>

#include "qlplatform/Export.h"

/// One name with its value.
struct EnumStr {
    /// The name. Not owned.
    const char* name;
    /// The value.
    std::int32_t value;
    std::int32_t flag = 0; ///< 1: hidden, not offered in menus; look-ups find it all the same
};

/// A table of `count` entries, which stay where they are; 0 or less is an empty table.
struct EnumStrs {
    /// Number of entries.
    std::int32_t count;
    /// The first of `count` entries. Not owned.
    const EnumStr* entries;
};

/// The table under the name that the functions use.
using utEnumStrs = EnumStrs;

/// The name of the first entry with that value; the empty text when there is none.
QL_EXPORT const char* utEnumStrs_EnumValue_to_string(const utEnumStrs* table, int value);

/// The value of the first entry with that name, compared as a whole; -1 when there is none or `name` is null.
QL_EXPORT int utOldEnumStrs_string_to_EnumValue(const utEnumStrs* table, const char* name);
