// How pictures show the sorts of types.
#pragma once

#include "output/Layout.h"

namespace inspector {

struct KindStyle {
    TypeKind kind;
    const char* style; ///< the class in map.css and page.css
    const char* name;  ///< in legends
};

// clang-format off
inline constexpr KindStyle kindStyles[] = {
    {TypeKind::Float,       "float",       "floating point"},
    {TypeKind::Integer,     "integer",     "integer"},
    {TypeKind::Boolean,     "boolean",     "boolean"},
    {TypeKind::FixedPoint,  "fixed-point", "fixed point"},
    {TypeKind::Enumeration, "enumeration", "enumeration"},
    {TypeKind::Structure,   "structure",   "structure, not opened"},
    {TypeKind::Other,       "other",       "any other type"},
};
// clang-format on

inline const KindStyle& styleOf(TypeKind kind) { return kindStyles[static_cast<int>(kind)]; }

} // namespace inspector
