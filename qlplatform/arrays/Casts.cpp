#include "qlplatform/arrays/Casts_internal.h"

#include <cmath>
#include <cstring>
#include <limits>
#include <type_traits>
#include <utility>

#include "qlplatform/arrays/HostArray_internal.h"
#include "qlplatform/arrays/HostElements.h"
#include "qlplatform/classes/Objects.h"
#include "qlplatform/services/MessageTexts.h"
#include "qlplatform/services/Raise_internal.h"

namespace {

constexpr const char* category = "Quillane:Arrays";
constexpr MessageText texts[] = {
    {category, "CannotCast", "a value of class '{0}' cannot become '{1}'"},
};
const MessageTextTable registeredTexts(texts, std::size(texts));

[[noreturn]] void raiseCannotCast(const std::string& what, const char* to) {
    hostservices::raise(category, "CannotCast", what, std::string(to));
}

// Calls visit with a value of the element type; false when the class has none.
template <class Visit> bool withElementType(txClassID classId, Visit visit) {
    // clang-format off
    switch (classId) {
    case txClassDouble:  visit(double());        return true;
    case txClassSingle:  visit(float());         return true;
    case txClassInt8:    visit(std::int8_t());   return true;
    case txClassUint8:   visit(std::uint8_t());  return true;
    case txClassInt16:   visit(std::int16_t());  return true;
    case txClassUint16:  visit(std::uint16_t()); return true;
    case txClassInt32:   visit(std::int32_t());  return true;
    case txClassUint32:  visit(std::uint32_t()); return true;
    case txClassInt64:   visit(std::int64_t());  return true;
    case txClassUint64:  visit(std::uint64_t()); return true;
    case txClassLogical: visit(bool());          return true;
    case txClassChar:    visit(char16_t());      return true;
    default:             return false;
    }
    // clang-format on
}

template <class To, class From> To integerFromFloating(From value) {
    using Limits = std::numeric_limits<To>;
    if (std::isnan(value)) return 0;
    const double rounded = std::round(static_cast<double>(value));
    // The upper limit of 64-bit classes rounds up to a power of two, which is out of range as well.
    if (rounded >= static_cast<double>(Limits::max())) return Limits::max();
    if (rounded <= static_cast<double>(Limits::min())) return Limits::min();
    return static_cast<To>(rounded);
}

template <class To, class From> To integerFromInteger(From value) {
    using Limits = std::numeric_limits<To>;
    if (std::cmp_less(value, Limits::min())) return Limits::min();
    if (std::cmp_greater(value, Limits::max())) return Limits::max();
    return static_cast<To>(value);
}

template <class To, class From> To converted(From value) {
    if constexpr (std::is_same_v<To, bool>) {
        if constexpr (std::is_floating_point_v<From>)
            if (std::isnan(value)) raiseCannotCast("NaN", "logical");
        return value != From(0);
    } else if constexpr (std::is_floating_point_v<To>)
        return static_cast<To>(value);
    else if constexpr (std::is_floating_point_v<From>)
        return integerFromFloating<To>(value);
    else if constexpr (std::is_same_v<From, bool>)
        return value ? 1 : 0;
    else if constexpr (std::is_same_v<From, char16_t>)
        return integerFromInteger<To>(static_cast<std::uint16_t>(value));
    else
        return integerFromInteger<To>(value);
}

// The array whose elements are cast: that behind objects.
const txArray_tag& castable(const txArray_tag* array, const char* to) {
    const txArray_tag* underlying = omGetUnderlyingArray(array);
    if (txGetElementSize(underlying) == 0) raiseCannotCast(array ? txGetClassName(array) : "nothing", to);
    return *underlying;
}

} // namespace

txArrayPtr hostarray::cast(const txArray_tag* array, txClassID to) {
    const txArray_tag& source = castable(array, nameOfClass(to));
    if (txGetClassID(&source) == to) return TxArrayUtil::SafeCreateSharedCopy(&source);
    const bool isComplex = txIsComplex(&source);
    if (isComplex && to == txClassLogical)
        raiseCannotCast("complex " + std::string(txGetClassName(&source)), "logical");
    txArrayPtr result(txCreateNumericMatrix(txGetNumRows(&source), txGetNumColumns(&source), to, isComplex));
    const std::size_t count = txGetNumberOfElements(&source) * (isComplex ? 2 : 1);
    withElementType(txGetClassID(&source), [&]<class From>(From) {
        withElementType(to, [&]<class To>(To) {
            if constexpr (!std::is_same_v<To, char16_t>) {
                const auto* from = static_cast<const From*>(txGetData(&source));
                std::transform(from, from + count, static_cast<To*>(txGetWritableData(result.get())),
                               [](From value) { return converted<To>(value); });
            }
        });
    });
    return result;
}

txArrayPtr hostarray::withImaginaryPart(const txArray_tag* array) {
    const txArray_tag& source = castable(array, "complex");
    if (txIsComplex(&source)) return TxArrayUtil::SafeCreateSharedCopy(&source);
    const txClassID classId = txGetClassID(&source);
    if (classId == txClassLogical || classId == txClassChar)
        return withImaginaryPart(cast(&source, txClassDouble).get());
    txArrayPtr result(txCreateNumericMatrix(txGetNumRows(&source), txGetNumColumns(&source), classId, true));
    const std::size_t size = txGetElementSize(&source);
    const auto* from = static_cast<const char*>(txGetData(&source));
    auto* to = static_cast<char*>(txGetWritableData(result.get()));
    for (std::size_t i = 0; i < txGetNumberOfElements(&source); ++i)
        std::memcpy(to + 2 * i * size, from + i * size, size);
    return result;
}

txArrayPtr hostarray::realPart(const txArray_tag* array) {
    const txArray_tag& source = castable(array, "real");
    if (!txIsComplex(&source)) return TxArrayUtil::SafeCreateSharedCopy(&source);
    txArrayPtr result(
        txCreateNumericMatrix(txGetNumRows(&source), txGetNumColumns(&source), txGetClassID(&source), false));
    const std::size_t size = txGetElementSize(result.get());
    const auto* from = static_cast<const char*>(txGetData(&source));
    auto* to = static_cast<char*>(txGetWritableData(result.get()));
    for (std::size_t i = 0; i < txGetNumberOfElements(&source); ++i)
        std::memcpy(to + i * size, from + 2 * i * size, size);
    return result;
}
