// What the two text readers share: the store of what was read, integer fields, the normalising rule.
#pragma once

#include <functional>
#include <string>
#include <string_view>

#include <boost/unordered_map.hpp>

#include "qltypes/fixed_point/FixPointDefs.h"

namespace FXP {

/// Hash of a text, the same for a string and a view of it.
struct TextHash {
    using is_transparent = void;
    std::size_t operator()(std::string_view text) const { return std::hash<std::string_view>()(text); }
};

/// What was read, by its exact text. Entries stay where they are for the life of the map.
template <class Value> using ReadTexts = boost::unordered_map<std::string, Value, TextHash, std::equal_to<>>;

/// The value kept for `text`; on the first call that of read(text), which keeps nothing when it throws.
template <class Value, class Read> const Value& readOnce(ReadTexts<Value>& texts, std::string_view text, Read read) {
    const auto found = texts.find(text);
    if (found != texts.end()) return found->second;
    std::string key(text);
    Value value = read(key);
    return texts.emplace(std::move(key), value).first->second;
}

/// The decimal integer that is the whole text, an optional sign before it, as boost::lexical_cast reads it under the
/// plain locale. Throws boost::bad_lexical_cast when the text is none or it does not fit 32 bits.
int lexicalInt(std::string_view text);

/// Makes the factor at least 1.0 and below 2.0 and keeps factor * 2^FixedExponent; a factor that is 0.0 or below or not
/// finite is left as it is. False, and nothing changed, when the exponent would not fit 32 bits.
[[nodiscard]] bool normalizeFactor(fxpDataTypeProp& prop);

} // namespace FXP
