// The two patterns of type names, matched by hand in one pass, and numbers as identifiers hold them.
#pragma once

#include <string>
#include <string_view>

namespace FXP {

/// Whether the whole text is u?int[1-9][0-9]*.
bool matchesIntegerPattern(std::string_view text);

/// The pieces of a text that matches the fixed-point pattern. A piece that is absent is empty; one that is present is
/// what stands behind its letter, with p and n as written: "n7" of _En7, "1p5" of _F1p5.
struct IdentifierPieces {
    bool isScaledDouble = false;
    bool isSigned = false;
    std::string_view factor;   // _F
    std::string_view exponent; // _E
    std::string_view slope;    // _S
    std::string_view bias;     // _B
};

/// Splits the text into its pieces; false when the whole text does not match the fixed-point pattern.
bool splitIdentifier(std::string_view text, IdentifierPieces& pieces);

/// A number of an identifier as a decimal text: "1p5en3" becomes "1.5e-3".
std::string decodedNumber(std::string_view piece);

/// A decimal text as an identifier holds it: "1.5e-3" becomes "1p5en3". Any usual form of decimal texts may come in: a
/// plus sign, a capital E, a trailing ".0" and a leading "0." go.
std::string encodedNumber(std::string decimal);

} // namespace FXP
