#include <random>

#include <gtest/gtest.h>

#include "qltypes/fixed_point/IdentifierGrammar_internal.h"
#include "tests/fixed_point/TextCases.h"

namespace {

using namespace std::literals;

/// Both patterns say what the regular expressions say.
void expectSameMatch(const std::string& text) {
    SCOPED_TRACE(shown(text));
    FXP::IdentifierPieces pieces;
    EXPECT_EQ(FXP::splitIdentifier(text, pieces), reference::matchesFixptPattern(text));
    EXPECT_EQ(FXP::matchesIntegerPattern(text), reference::matchesIntegerPattern(text));
}

TEST(IdentifierGrammar, CasesMatchAsTheExpressionDoes) {
    for (const TextCase& one : textCases("identifier_strings.tsv"))
        expectSameMatch(one.text);
}

TEST(IdentifierGrammar, RandomTextsMatchAsTheExpressionDoes) {
    constexpr unsigned long long seed = 20240611;
    SCOPED_TRACE(seed);
    std::mt19937_64 random(seed);
    int numMatches = 0;
    for (int i = 0; i < 100000 && !testing::Test::HasFailure(); ++i) {
        const std::string text = randomIdentifier(random);
        expectSameMatch(text);
        numMatches += reference::matchesFixptPattern(text);
    }
    EXPECT_GT(numMatches, 10000); // both answers are tried
    EXPECT_LT(numMatches, 90000);
}

TEST(IdentifierGrammar, ShortTextsOverTheAlphabetMatchAsTheExpressionDoes) {
    // All texts of up to three letters behind each of some beginnings, every letter of the grammar and one beside it.
    constexpr std::string_view alphabet = "suFSEBnpe_0159.";
    for (const char* begin :
         {"sfix8", "ufix8_", "flts8_F1p", "fltu8_S", "sfix8_B", "sfix8_En", "sfix8_S1", "int", "u"}) {
        std::vector<std::string> texts = {begin};
        for (std::size_t first = 0, length = 1; length <= 3; ++length) {
            const std::size_t last = texts.size();
            for (; first < last; ++first)
                for (const char c : alphabet)
                    texts.push_back(texts[first] + c);
        }
        for (const std::string& text : texts)
            expectSameMatch(text);
        if (testing::Test::HasFailure()) return;
    }
}

struct PiecesRow {
    std::string_view text;
    bool isScaledDouble, isSigned;
    std::string_view factor, exponent, slope, bias;
};

constexpr PiecesRow piecesRows[] = {
    {"sfix16", false, true, "", "", "", ""},
    {"ufix16_En7", false, false, "", "n7", "", ""},
    {"flts16_F1p5_E12", true, true, "1p5", "12", "", ""},
    {"fltu16_S3p2en4_Bn1p5e6", true, false, "", "", "3p2en4", "n1p5e6"},
    {"sfix16_E1_Bp25", false, true, "", "1", "", "p25"},
};

TEST(IdentifierGrammar, PiecesAreWhatStandsBehindTheirLetters) {
    for (const PiecesRow& row : piecesRows) {
        SCOPED_TRACE(row.text);
        FXP::IdentifierPieces pieces;
        ASSERT_TRUE(FXP::splitIdentifier(row.text, pieces));
        EXPECT_EQ(pieces.isScaledDouble, row.isScaledDouble);
        EXPECT_EQ(pieces.isSigned, row.isSigned);
        EXPECT_EQ(pieces.factor, row.factor);
        EXPECT_EQ(pieces.exponent, row.exponent);
        EXPECT_EQ(pieces.slope, row.slope);
        EXPECT_EQ(pieces.bias, row.bias);
    }
}

struct NumberRow {
    const char* decimal;
    const char* encoded;
};

constexpr NumberRow numberRows[] = {
    {"1.5", "1p5"},
    {"0.25", "p25"},
    {"-0.25", "np25"},
    {"2", "2"},
    {"2.0", "2"},
    {"-2.0", "n2"},
    {"1e+16", "1e16"},
    {"1e-5", "1en5"},
    {"1.0e5", "1e5"},
    {"1.0E+5", "1e5"},
    {"1.25E-7", "1p25en7"},
    {"-1.25E-7", "n1p25en7"},
    {"10.05", "10p05"},
    {"100", "100"},
    {"0", "0"},
    {"-0", "n0"},
    {"0.0", "0"},
    {"0.5e-3", "p5en3"},
    {"-0.5e-3", "np5en3"},
    {"inf", "inf"},
    {"-inf", "ninf"},
    {"nan", "nan"},
    {"1e-05", "1en05"},
    {"20.10", "20p10"},
};

TEST(IdentifierGrammar, NumbersAreEncodedFromAnyDecimalForm) {
    for (const NumberRow& row : numberRows) {
        SCOPED_TRACE(row.decimal);
        EXPECT_EQ(FXP::encodedNumber(row.decimal), row.encoded);
    }
}

TEST(IdentifierGrammar, NumbersAreDecoded) {
    EXPECT_EQ(FXP::decodedNumber("1p5en3"), "1.5e-3");
    EXPECT_EQ(FXP::decodedNumber("np25"), "-.25");
    EXPECT_EQ(FXP::decodedNumber("12"), "12");
    EXPECT_EQ(FXP::decodedNumber(""), "");
}

} // namespace
