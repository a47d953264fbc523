// Typed elements of host arrays: double, float, the eight integers, std::complex of each, bool, char16_t.
//
//   txArrayPtr speeds(txCreateRow<std::int16_t>({10, 20, 30}));
//   for (std::int16_t speed : txGetElements<std::int16_t>(speeds.get())) ...
//   txGetWritableElements<std::int16_t>(speeds.get())[0] = 15;
#pragma once

#include <algorithm>
#include <complex>
#include <cstdint>
#include <initializer_list>
#include <span>

#include "qlplatform/arrays/HostArray.h"

/// The class number of arrays whose elements are of type T.
template <class T> inline constexpr txClassID txClassOf = txClassNone;
template <> inline constexpr txClassID txClassOf<bool> = txClassLogical;
template <> inline constexpr txClassID txClassOf<char16_t> = txClassChar;
template <> inline constexpr txClassID txClassOf<double> = txClassDouble;
template <> inline constexpr txClassID txClassOf<float> = txClassSingle;
template <> inline constexpr txClassID txClassOf<std::int8_t> = txClassInt8;
template <> inline constexpr txClassID txClassOf<std::uint8_t> = txClassUint8;
template <> inline constexpr txClassID txClassOf<std::int16_t> = txClassInt16;
template <> inline constexpr txClassID txClassOf<std::uint16_t> = txClassUint16;
template <> inline constexpr txClassID txClassOf<std::int32_t> = txClassInt32;
template <> inline constexpr txClassID txClassOf<std::uint32_t> = txClassUint32;
template <> inline constexpr txClassID txClassOf<std::int64_t> = txClassInt64;
template <> inline constexpr txClassID txClassOf<std::uint64_t> = txClassUint64;
template <class T> inline constexpr txClassID txClassOf<std::complex<T>> = txClassOf<T>;

/// Whether arrays with elements of type T are complex.
template <class T> inline constexpr bool txIsComplexElement = false;
template <class T> inline constexpr bool txIsComplexElement<std::complex<T>> = true;

/// Whether the elements of `array` are of type T; false for null.
template <class T> bool txHasElements(const txArray_tag* array) {
    static_assert(txClassOf<T> != txClassNone, "no array has elements of this type");
    return array && txGetClassID(array) == txClassOf<T> && txIsComplex(array) == txIsComplexElement<T>;
}

/// The elements in column order; none when they are of another type. Good until the array is written to.
template <class T> std::span<const T> txGetElements(const txArray_tag* array) {
    if (!txHasElements<T>(array)) return {};
    return {static_cast<const T*>(txGetData(array)), txGetNumberOfElements(array)};
}

/// The same for writing: ends the sharing with copies first.
template <class T> std::span<T> txGetWritableElements(txArray_tag* array) {
    if (!txHasElements<T>(array)) return {};
    return {static_cast<T*>(txGetWritableData(array)), txGetNumberOfElements(array)};
}

/// A row with these elements. The caller owns it.
template <class T> txArray_tag* txCreateRow(std::span<const T> values) {
    txArray_tag* row = txCreateNumericMatrix(1, values.size(), txClassOf<T>, txIsComplexElement<T>);
    std::copy(values.begin(), values.end(), txGetWritableElements<T>(row).begin());
    return row;
}
/// The same from a list in braces.
template <class T> txArray_tag* txCreateRow(std::initializer_list<T> values) {
    return txCreateRow(std::span<const T>(values.begin(), values.size()));
}
