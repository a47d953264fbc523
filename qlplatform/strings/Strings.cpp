#include "qlplatform/strings/Strings.h"

#include <algorithm>
#include <array>
#include <cstdint>
#include <cstring>

#include <boost/locale/encoding_utf.hpp>

namespace {

// Sorted, for the binary search below.
constexpr std::array<std::string_view, 44> cKeywords = {
    "_Alignas",  "_Alignof",       "_Atomic",       "_Bool",   "_Complex", "_Generic", "_Imaginary",
    "_Noreturn", "_Static_assert", "_Thread_local", "auto",    "break",    "case",     "char",
    "const",     "continue",       "default",       "do",      "double",   "else",     "enum",
    "extern",    "float",          "for",           "goto",    "if",       "inline",   "int",
    "long",      "register",       "restrict",      "return",  "short",    "signed",   "sizeof",
    "static",    "struct",         "switch",        "typedef", "union",    "unsigned", "void",
    "volatile",  "while"};

// What may stand in an identifier: 1 anywhere, 2 behind the first character.
constexpr auto identifierClass = [] {
    std::array<std::uint8_t, 256> table{};
    for (int c = 0; c < 256; ++c) {
        const bool isLetter = (c >= 'a' && c <= 'z') || (c >= 'A' && c <= 'Z') || c == '_';
        table[static_cast<std::size_t>(c)] = isLetter ? 1 : c >= '0' && c <= '9' ? 2 : 0;
    }
    return table;
}();

std::uint8_t classOf(char c) { return identifierClass[static_cast<unsigned char>(c)]; }

template <class To, class From> std::basic_string<To> converted(std::basic_string_view<From> text) {
    namespace utf = boost::locale::utf;
    constexpr utf::code_point replacement = 0xFFFD;
    const From* const end = text.data() + text.size();
    // Most texts are ASCII alone, which all encodings have unit for unit.
    const From* at = std::find_if(text.data(), end, [](From c) { return c < 0 || c > 0x7f; });
    std::basic_string<To> result(text.data(), at);
    if (at == end) return result;
    result.reserve(text.size());
    while (at != end) {
        const From* const start = at;
        utf::code_point c = utf::utf_traits<From>::decode(at, end);
        if (!utf::is_valid_codepoint(c)) {
            c = replacement;
            at = start + 1; // one replacement an ill-formed unit
        }
        utf::utf_traits<To>::encode(c, std::back_inserter(result));
    }
    return result;
}

} // namespace

std::size_t utStrlen(const char* text) { return text ? std::strlen(text) : 0; }
bool utIsEmptyString(const char* text) { return utStrlen(text) == 0; }

int qlsvStrcmp(const std::u16string& a, const std::u16string& b) { return a.compare(b); }

std::string qlsvUtf8FromUtf16(std::u16string_view text) { return converted<char>(text); }
std::u16string qlsvUtf16FromUtf8(std::string_view text) { return converted<char16_t>(text); }
std::u16string scl::string::cvt_string(std::string_view text) { return qlsvUtf16FromUtf8(text); }

bool qlIsValidANSICIdentifier(const char* name, bool allowKeywords) {
    if (!name || classOf(*name) != 1) return false;
    const char* end = name;
    while (classOf(*end) != 0)
        ++end;
    if (*end) return false;
    return allowKeywords || !std::binary_search(cKeywords.begin(), cKeywords.end(),
                                                std::string_view(name, static_cast<std::size_t>(end - name)));
}
