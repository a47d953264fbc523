// The store of texts that were written: one entry a record, shared by identifier and constructor texts.
//
// Process-wide and unlocked. Entries are never removed, so references to their texts stay good for ever.
#pragma once

#include <array>
#include <cstddef>
#include <string>

#include "qltypes/fixed_point/FixPointDefs.h"

/// The texts of one record: 0 the identifier text, 1 to 6 the constructor texts. Empty means not written yet.
struct fxpTextCacheEntry {
    std::array<std::string, 7> texts;
};

namespace FXP {

/// Hash and equality of the records without factor and bias (factor 1.0, bias 0.0).
struct UnitScaledHash {
    std::size_t operator()(const fxpDataTypeProp& prop) const;
};
struct UnitScaledEqual {
    bool operator()(const fxpDataTypeProp& a, const fxpDataTypeProp& b) const;
};

/// Strict order of the other records; two of which neither comes first share an entry.
struct ScaledOrder {
    bool operator()(const fxpDataTypeProp& a, const fxpDataTypeProp& b) const;
};

/// The entry of the record, made when there is none.
fxpTextCacheEntry& textCacheEntry(const fxpDataTypeProp& prop);

} // namespace FXP
