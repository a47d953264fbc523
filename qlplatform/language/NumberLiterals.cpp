#include "qlplatform/language/NumberLiterals_internal.h"

#include <algorithm>
#include <cstdint>
#include <string>

#include "qlplatform/language/Tokens_internal.h"
#include "qlplatform/services/NumberText.h"

namespace language {

namespace {

std::size_t skipDigits(std::string_view text, std::size_t i) {
    while (isDigit(byteAt(text, i)))
        ++i;
    return i;
}

[[noreturn]] void refuse(std::string_view text, std::size_t begin, std::size_t end, std::string reason) {
    while (isWordPart(byteAt(text, end)))
        ++end;
    raiseInvalidNumber(begin, text.substr(begin, end - begin), std::move(reason));
}

// The parts of 0xFFs8: base and digits, then the suffix, which may be absent.
struct BasedParts {
    unsigned base;
    std::string_view digits;
    bool isSigned;
    std::string_view bits; // empty without a suffix
};

unsigned digitValue(char c) {
    if (isDigit(c)) return static_cast<unsigned>(c - '0');
    if (c >= 'a' && c <= 'f') return static_cast<unsigned>(c - 'a') + 10;
    if (c >= 'A' && c <= 'F') return static_cast<unsigned>(c - 'A') + 10;
    return 16;
}

BasedParts basedParts(std::string_view literal) {
    BasedParts parts{(literal[1] | 0x20) == 'x' ? 16U : 2U, {}, false, {}};
    std::size_t i = 2;
    while (i < literal.size() && digitValue(literal[i]) < parts.base)
        ++i;
    parts.digits = literal.substr(2, i - 2);
    if (i < literal.size()) {
        parts.isSigned = literal[i] == 's';
        parts.bits = literal.substr(i + 1);
    }
    return parts;
}

// The digits without their leading zeros. A digit of base 16 has four bits.
unsigned numBits(const BasedParts& parts) {
    const std::string_view digits =
        parts.digits.substr(std::min(parts.digits.find_first_not_of('0'), parts.digits.size()));
    if (digits.empty()) return 0;
    unsigned firstBits = 0;
    for (unsigned first = digitValue(digits.front()); first != 0; first /= 2)
        ++firstBits;
    const std::size_t rest = (digits.size() - 1) * (parts.base == 16 ? 4 : 1);
    return firstBits + static_cast<unsigned>(std::min<std::size_t>(rest, 1000));
}

unsigned widthOf(std::string_view bits) {
    if (bits == "8") return 8;
    if (bits == "16") return 16;
    if (bits == "32") return 32;
    return bits.empty() || bits == "64" ? 64 : 0;
}

NumberLiteral readBased(std::string_view text, std::size_t begin) {
    std::size_t end = begin + 2;
    while (isWordPart(byteAt(text, end)))
        ++end;
    const std::string_view literal = text.substr(begin, end - begin);
    const BasedParts parts = basedParts(literal);
    const bool isHex = parts.base == 16;
    if (parts.digits.empty())
        refuse(text, begin, end, isHex ? "expected hexadecimal digits behind 0x" : "expected binary digits behind 0b");
    const std::size_t behindDigits = 2 + parts.digits.size();
    const char suffix = behindDigits < literal.size() ? literal[behindDigits] : 'u';
    const unsigned width = widthOf(parts.bits);
    if ((suffix != 'u' && suffix != 's') || width == 0 || (behindDigits < literal.size() && parts.bits.empty()))
        refuse(text, begin, end,
               std::string("expected ") + (isHex ? "hexadecimal" : "binary") +
                   " digits and then nothing or one of u8, u16, u32, u64, s8, s16, s32, s64");
    if (numBits(parts) > width)
        refuse(text, begin, end, "expected a value of at most " + std::to_string(width) + " bits");
    return {isHex ? ParseToken::hexNumber : ParseToken::binaryNumber, end};
}

// A point belongs to a number unless it begins an operator or a continuation.
bool isDecimalPoint(std::string_view text, std::size_t i) {
    if (byteAt(text, i) != '.') return false;
    const char next = byteAt(text, i + 1);
    if (next == '.') return byteAt(text, i + 2) != '.';
    return next == '\0' || std::string_view("*/\\^'").find(next) == std::string_view::npos;
}

} // namespace

NumberLiteral readNumber(std::string_view text, std::size_t begin) {
    const char second = static_cast<char>(byteAt(text, begin + 1) | 0x20);
    if (text[begin] == '0' && (second == 'x' || second == 'b')) return readBased(text, begin);

    std::size_t i = skipDigits(text, begin);
    if (isDecimalPoint(text, i)) i = skipDigits(text, i + 1);
    const char letter = static_cast<char>(byteAt(text, i) | 0x20);
    if (letter == 'e' || letter == 'd') {
        std::size_t digits = i + 1;
        if (byteAt(text, digits) == '+' || byteAt(text, digits) == '-') ++digits;
        i = skipDigits(text, digits);
        if (i == digits) refuse(text, begin, i, "expected the digits of its exponent");
    }
    ParseToken code = ParseToken::number;
    if (byteAt(text, i) == 'i' || byteAt(text, i) == 'j') {
        code = ParseToken::imaginaryNumber;
        ++i;
    }
    if (isWordPart(byteAt(text, i)))
        refuse(text, begin, i, std::string("expected an operator before '") + text[i] + "'");
    return {code, i};
}

double numberValue(ParseToken code, std::string_view literal) {
    if (code == ParseToken::hexNumber || code == ParseToken::binaryNumber) {
        const BasedParts parts = basedParts(literal);
        std::uint64_t value = 0;
        for (const char digit : parts.digits)
            value = value * parts.base + digitValue(digit);
        const unsigned unused = 64 - widthOf(parts.bits);
        if (parts.isSigned) return static_cast<double>(static_cast<std::int64_t>(value << unused) >> unused);
        return static_cast<double>(value);
    }
    std::string decimal(literal);
    for (char& c : decimal)
        if ((c | 0x20) == 'd') c = 'e';
    return ut_strtod(utGetFpcContext(), decimal.c_str(), nullptr, nullptr); // stops before the imaginary unit
}

} // namespace language
