// Small string services: lengths, comparison, encodings, identifier test.
#pragma once

#include <cstddef>
#include <string>
#include <string_view>

#include "qlplatform/Export.h"

/// Length of a NUL-terminated text in bytes; 0 for null.
QL_EXPORT std::size_t utStrlen(const char* text);

/// Whether a NUL-terminated text is null or has no characters.
QL_EXPORT bool utIsEmptyString(const char* text);

/// Compares two wide texts by code unit: below 0, 0 or above 0.
QL_EXPORT int qlsvStrcmp(const std::u16string& a, const std::u16string& b);

/// UTF-8 of a UTF-16 text; a lone surrogate becomes U+FFFD.
QL_EXPORT std::string qlsvUtf8FromUtf16(std::u16string_view text);

/// UTF-16 of a UTF-8 text; an ill-formed byte becomes U+FFFD.
QL_EXPORT std::u16string qlsvUtf16FromUtf8(std::string_view text);

/// Whether `name` is an identifier of C: a letter or an underscore, then letters, digits and underscores, all ASCII.
/// A keyword of C is one only when `allowKeywords` is true. Null and the empty text are none.
QL_EXPORT bool qlIsValidANSICIdentifier(const char* name, bool allowKeywords);

namespace scl::string {

/// UTF-16 of a narrow text; the same conversion as qlsvUtf16FromUtf8.
QL_EXPORT std::u16string cvt_string(std::string_view text);

} // namespace scl::string
