#include "qltypes/fixed_point/IdentifierGrammar_internal.h"

#include <algorithm>

#include <boost/algorithm/string/replace.hpp>

namespace FXP {

namespace {

bool isDigit(char c) { return c >= '0' && c <= '9'; }

/// Reads a text from left to right. Each member takes what its pattern says when the rest begins with it, and says
/// whether it did; what may follow a pattern never begins like its continuation, so nothing is taken back.
class Scanner {
  public:
    explicit Scanner(std::string_view text) : rest_(text) {}

    bool atEnd() const { return rest_.empty(); }

    bool take(std::string_view literal) {
        if (!rest_.starts_with(literal)) return false;
        rest_.remove_prefix(literal.size());
        return true;
    }

    /// [1-9][0-9]*
    bool takeNatural() {
        if (rest_.empty() || rest_[0] == '0' || !isDigit(rest_[0])) return false;
        takeDigits();
        return true;
    }

    /// p[0-9]*[1-9]
    bool takeFraction() {
        if (!take("p")) return false;
        const std::string_view digits = takeDigits();
        return !digits.empty() && digits.back() != '0';
    }

    /// [1-9][0-9]*(p[0-9]*[1-9])?|p[0-9]*[1-9], then (en?[1-9][0-9]*)?
    bool takeNumber() {
        if (takeNatural()) {
            if (rest_.starts_with('p') && !takeFraction()) return false;
        } else if (!takeFraction()) {
            return false;
        }
        return !take("e") || takeWhole();
    }

    /// n?[1-9][0-9]*
    bool takeWhole() {
        take("n");
        return takeNatural();
    }

    /// Takes a piece by `takeBody`, which reads on from here, and keeps its text.
    template <class Body> bool takePiece(std::string_view& piece, Body takeBody) {
        const std::string_view before = rest_;
        if (!takeBody()) return false;
        piece = before.substr(0, before.size() - rest_.size());
        return true;
    }

  private:
    std::string_view takeDigits() {
        std::size_t count = 0;
        while (count < rest_.size() && isDigit(rest_[count]))
            ++count;
        const std::string_view digits = rest_.substr(0, count);
        rest_.remove_prefix(count);
        return digits;
    }

    std::string_view rest_;
};

} // namespace

bool matchesIntegerPattern(std::string_view text) {
    Scanner scanner(text);
    scanner.take("u");
    return scanner.take("int") && scanner.takeNatural() && scanner.atEnd();
}

bool splitIdentifier(std::string_view text, IdentifierPieces& pieces) {
    Scanner scanner(text);
    pieces = {};
    if (scanner.take("sfix") || scanner.take("flts"))
        pieces.isSigned = true;
    else if (!scanner.take("ufix") && !scanner.take("fltu"))
        return false;
    pieces.isScaledDouble = text[0] == 'f';
    if (!scanner.takeNatural()) return false;

    const auto takeFactor = [&] { return scanner.take("1") && scanner.takeFraction(); };
    const auto takeExponent = [&] { return scanner.takeWhole(); };
    const auto takeSlope = [&] { return scanner.takeNumber(); };
    const auto takeBias = [&] { return scanner.take("n"), scanner.takeNumber(); };

    if (scanner.take("_F")) {
        if (!scanner.takePiece(pieces.factor, takeFactor)) return false;
        if (!scanner.take("_E") || !scanner.takePiece(pieces.exponent, takeExponent)) return false;
    } else if (scanner.take("_E")) {
        if (!scanner.takePiece(pieces.exponent, takeExponent)) return false;
    } else if (scanner.take("_S")) {
        if (!scanner.takePiece(pieces.slope, takeSlope)) return false;
    }
    if (scanner.take("_B") && !scanner.takePiece(pieces.bias, takeBias)) return false;
    return scanner.atEnd();
}

std::string decodedNumber(std::string_view piece) {
    std::string text(piece);
    std::replace(text.begin(), text.end(), 'p', '.');
    std::replace(text.begin(), text.end(), 'n', '-');
    return text;
}

std::string encodedNumber(std::string decimal) {
    std::replace(decimal.begin(), decimal.end(), '.', 'p');
    std::erase(decimal, '+');
    std::replace(decimal.begin(), decimal.end(), '-', 'n');
    std::replace(decimal.begin(), decimal.end(), 'E', 'e');
    boost::replace_all(decimal, "p0e", "e");
    if (decimal.ends_with("p0")) decimal.resize(decimal.size() - 2);
    if (decimal.starts_with("0p")) decimal.erase(0, 1);
    if (decimal.starts_with("n0p")) decimal.erase(1, 1);
    return decimal;
}

} // namespace FXP
