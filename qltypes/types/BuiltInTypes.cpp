#include "qltypes/types/BuiltInTypes_internal.h"

#include <array>
#include <cstddef>
#include <cstdint>
#include <type_traits>

#include "qltypes/conversion/CheckedConversion.h"
#include "qltypes/host/Assert_internal.h"

namespace QLTypeSys {

namespace {

// Tag of the built-in boolean, one byte a value.
enum class Boolean : std::uint8_t {};

// Runs `claim` on each element and stores its answer as one byte.
template <class T, class Claim> int forEach(int count, const void* data, void* result, Claim claim) {
    const auto* values = static_cast<const T*>(data);
    auto* answers = static_cast<std::uint8_t*>(result);
    for (int i = 0; i < count; ++i)
        answers[i] = claim(values[i]);
    return 1;
}

template <class T, class Claim>
int forEachPair(int count, const void* left, const void* right, void* result, Claim claim) {
    const auto* l = static_cast<const T*>(left);
    const auto* r = static_cast<const T*>(right);
    auto* answers = static_cast<std::uint8_t*>(result);
    for (int i = 0; i < count; ++i)
        answers[i] = claim(l[i], r[i]);
    return 1;
}

// The comparison functions of one element type; aux and caller are ignored, and with NaN every answer is 0.
template <class T> struct Comparison {
    static int isPositive(_qlDataTypeAccess_tag*, const char*, int, int count, const void* data, const void*,
                          void* result) {
        return forEach<T>(count, data, result, [](T v) { return v > T{}; });
    }
    static int isNegative(_qlDataTypeAccess_tag*, const char*, int, int count, const void* data, const void*,
                          void* result) {
        return forEach<T>(count, data, result, [](T v) { return v < T{}; });
    }
    static int greaterThan(_qlDataTypeAccess_tag*, const char*, int, int count, const void* left, const void* right,
                           const void*, void* result) {
        return forEachPair<T>(count, left, right, result, [](T l, T r) { return l > r; });
    }
    static int greaterEqual(_qlDataTypeAccess_tag*, const char*, int, int count, const void* left, const void* right,
                            const void*, void* result) {
        return forEachPair<T>(count, left, right, result, [](T l, T r) { return l >= r; });
    }
};

template <class T> constexpr FixedType builtIn(const char* name, BuiltInDTypeId id, bool isAtomic) {
    using C = Comparison<T>;
    constexpr bool isSigned = !std::is_same_v<T, Boolean> && !std::is_unsigned_v<T>;
    return {name,
            id,
            sizeof(T),
            isAtomic,
            false,
            isSigned,
            dtSourceBuiltIn,
            DATA_TYPE_ID_INVALID,
            qlBuiltInConvertBetween,
            C::isPositive,
            C::isNegative,
            C::greaterThan,
            C::greaterEqual};
}

constexpr FixedType autoType() {
    FixedType row = builtIn<double>("auto", DATA_TYPE_ID_DOUBLE, false); // behaves as a double
    row.id = DATA_TYPE_ID_AUTO;
    row.idAliasedTo = DATA_TYPE_ID_AUTO;
    row.groundHasNonZeroStoredValue = true;
    return row;
}

constexpr FixedType predefined(const char* name, int id, int size) {
    return {name, id, size, false, true, true, dtSourcePredefined, id, nullptr, nullptr, nullptr, nullptr, nullptr};
}

constexpr std::array<FixedType, numFixedTypes> rows = {
    autoType(),
    builtIn<double>("double", DATA_TYPE_ID_DOUBLE, false),
    builtIn<float>("single", DATA_TYPE_ID_SINGLE, false),
    builtIn<std::int8_t>("int8", DATA_TYPE_ID_INT8, true),
    builtIn<std::uint8_t>("uint8", DATA_TYPE_ID_UINT8, true),
    builtIn<std::int16_t>("int16", DATA_TYPE_ID_INT16, false),
    builtIn<std::uint16_t>("uint16", DATA_TYPE_ID_UINT16, false),
    builtIn<std::int32_t>("int32", DATA_TYPE_ID_INT32, false),
    builtIn<std::uint32_t>("uint32", DATA_TYPE_ID_UINT32, false),
    builtIn<Boolean>("boolean", DATA_TYPE_ID_BOOLEAN, true),
    predefined("fcn_call", 9, 0),
    predefined("integer", 10, 4),
    predefined("pointer", 11, 8),
    predefined("action", 12, 8),
    predefined("timer_uint32_pair", 13, 8),
};

} // namespace

std::span<const FixedType> fixedTypes() { return rows; }

const FixedType& fixedType(int id) {
    QLTYPES_ASSERT(id >= DATA_TYPE_ID_AUTO && id < numFixedTypes - 1);
    return rows[static_cast<std::size_t>(id + 1)];
}

} // namespace QLTypeSys
