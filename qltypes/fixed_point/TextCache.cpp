#include "qltypes/fixed_point/TextCache_internal.h"

#include <cmath>
#include <compare>
#include <cstdint>
#include <map>

#include <boost/unordered_map.hpp>

namespace FXP {

namespace {

/// Mixes a word into the hash; one-to-one in the word for a given hash.
void mixIn(std::uint64_t& hash, std::uint64_t word) {
    constexpr std::uint64_t multiplier = 0xc6a4a7935bd1e995;
    word *= multiplier;
    word ^= word >> 47;
    word *= multiplier;
    hash ^= word;
    hash *= multiplier;
    hash += 0xe6546b64;
}

/// The order of doubles, 0.0 and -0.0 equal, with all NaNs as one value behind the others.
std::weak_ordering orderOf(double a, double b) {
    if (a < b) return std::weak_ordering::less;
    if (a > b) return std::weak_ordering::greater;
    return std::isnan(a) <=> std::isnan(b);
}

std::weak_ordering orderOf(const fxpDataTypeProp& a, const fxpDataTypeProp& b) {
    if (const auto order = a.DataTypeMode <=> b.DataTypeMode; order != 0) return order;
    const bool isFixedFloat =
        a.DataTypeMode == FXP_DT_DOUBLE || a.DataTypeMode == FXP_DT_SINGLE || a.DataTypeMode == FXP_DT_BOOLEAN;
    if (!isFixedFloat) { // kept: in those three modes the other fields do not count
        if (const auto order = a.FixedExponent <=> b.FixedExponent; order != 0) return order;
        if (const auto order = orderOf(a.SlopeAdjustmentFactor, b.SlopeAdjustmentFactor); order != 0) return order;
        if (const auto order = orderOf(a.Bias, b.Bias); order != 0) return order;
        if (const auto order = unsigned(a.WordLength) <=> unsigned(b.WordLength); order != 0) return order;
        if (const auto order = a.Signedness <=> b.Signedness; order != 0) return order;
        if (a.DataTypeMode == FXP_DT_CUSTOM_FLOAT)
            if (const auto order = a.ExponentLength <=> b.ExponentLength; order != 0) return order;
    }
    return a.DataTypeOverrideOff <=> b.DataTypeOverrideOff;
}

} // namespace

std::size_t UnitScaledHash::operator()(const fxpDataTypeProp& prop) const {
    std::uint64_t hash = 0;
    mixIn(hash, prop.DataTypeMode);
    mixIn(hash, prop.Signedness);
    mixIn(hash, prop.WordLength);
    mixIn(hash, prop.FixedExponent);
    mixIn(hash, prop.DataTypeOverrideOff);
    return hash;
}

// kept: ExponentLength counts here and not in the hash. DataTypeOverrideOff is compared in place of the hashes: mixing
// is one-to-one in its last word, so of records that are equal otherwise the hashes differ exactly when it does.
bool UnitScaledEqual::operator()(const fxpDataTypeProp& a, const fxpDataTypeProp& b) const {
    return a.DataTypeMode == b.DataTypeMode && a.Signedness == b.Signedness && a.WordLength == b.WordLength &&
           a.ExponentLength == b.ExponentLength && a.FixedExponent == b.FixedExponent &&
           a.SlopeAdjustmentFactor == b.SlopeAdjustmentFactor && a.Bias == b.Bias &&
           a.DataTypeOverrideOff == b.DataTypeOverrideOff;
}

bool ScaledOrder::operator()(const fxpDataTypeProp& a, const fxpDataTypeProp& b) const { return orderOf(a, b) < 0; }

fxpTextCacheEntry& textCacheEntry(const fxpDataTypeProp& prop) {
    // Never destroyed: clients may hold references to the texts until the process ends.
    static auto& unitScaled =
        *new boost::unordered_map<fxpDataTypeProp, fxpTextCacheEntry, UnitScaledHash, UnitScaledEqual>;
    static auto& scaled = *new std::map<fxpDataTypeProp, fxpTextCacheEntry, ScaledOrder>;
    if (prop.SlopeAdjustmentFactor == 1.0 && prop.Bias == 0.0) return unitScaled[prop];
    return scaled[prop];
}

} // namespace FXP
