#include <cmath>
#include <limits>
#include <memory>
#include <random>
#include <set>
#include <string>
#include <vector>

#include <gtest/gtest.h>

#include "qlplatform/language/ParseTree.h"
#include "qlplatform/services/Diagnostics.h"
#include "qlplatform/services/MessageTexts.h"
#include "tests/platform/ParseTrees.h"
#include "tests/support/Raises.h"
#include "tests/support/Tsv.h"

namespace {

using Node = _T_parse_tree_T<char>;

struct TreeDeleter {
    void operator()(Node* tree) const { delete_parse_tree(tree); }
};
using Tree = std::unique_ptr<Node, TreeDeleter>;

struct DiagnosticDeleter {
    void operator()(qlsvDiagnosticImpl* diagnostic) const { qlsvDiscardDiagnostic(diagnostic); }
};

struct Parsed {
    Tree tree;
    std::unique_ptr<qlsvDiagnosticImpl, DiagnosticDeleter> refusal;
};

Parsed parsed(std::string_view text) {
    qlsvDiagnosticImpl* diagnostic = nullptr;
    Parsed result;
    result.tree.reset(generate_parse_tree(text, &diagnostic));
    result.refusal.reset(diagnostic);
    return result;
}

// The tree in prefix form, or the refusal's text.
std::string read(std::string_view text) {
    const Parsed result = parsed(text);
    return result.tree ? parsetrees::shown(*result.tree) : result.refusal->text();
}

long positionOf(const qlsvDiagnosticImpl& refusal) { return boost::get<long>(refusal.item(0).arguments.at(0)); }

// Everything that holds for every text: a sound tree or one message with a text and a position, never both.
void expectSound(std::string_view text) {
    const Parsed result = parsed(text);
    ASSERT_NE(result.tree == nullptr, result.refusal == nullptr);
    if (result.tree) {
        EXPECT_EQ(parsetrees::flaw(*result.tree), "");
        return;
    }
    ASSERT_EQ(result.refusal->numItems(), 1U);
    EXPECT_EQ(result.refusal->item(0).category, "Quillane:Language");
    EXPECT_NE(qlsvFindMessageText(result.refusal->item(0)), nullptr);
    EXPECT_GE(positionOf(*result.refusal), 0);
    EXPECT_LE(positionOf(*result.refusal), static_cast<long>(text.size()));
}

std::string repeated(const std::string& part, int count) {
    std::string text;
    for (int i = 0; i < count; ++i)
        text += part;
    return text;
}

TEST(Language, ExpressionsReadAsTheTableSays) {
    for (const testsupport::TsvRow& row : testsupport::readTsv(QLTYPES_TEST_DATA_DIR "/language_expressions.tsv")) {
        SCOPED_TRACE("line " + std::to_string(row.line) + ": " + row.columns.at(0));
        const std::string text = testsupport::unescaped(row.columns.at(0));
        const Parsed result = parsed(text);
        expectSound(text);
        if (row.columns.at(1) == "ok") {
            ASSERT_TRUE(result.tree) << result.refusal->text();
            EXPECT_EQ(parsetrees::shown(*result.tree), testsupport::unescaped(row.columns.at(2)));
            EXPECT_EQ(read(parsetrees::parenthesised(*result.tree)), parsetrees::shown(*result.tree));
        } else {
            ASSERT_TRUE(result.refusal) << parsetrees::shown(*result.tree);
            EXPECT_EQ(result.refusal->item(0).leaf, row.columns.at(1));
            EXPECT_EQ(std::to_string(positionOf(*result.refusal)), row.columns.at(2));
            const std::string shown = result.refusal->text();
            const std::string detail = testsupport::unescaped(row.columns.at(3));
            EXPECT_NE(shown.find(detail), std::string::npos) << shown;
        }
    }
}

TEST(Language, CodesThatOthersRelyOn) {
    EXPECT_EQ(static_cast<int>(ParseOperator::matrix), 27);
    EXPECT_EQ(static_cast<int>(ParseOperator::cell), 83);
    EXPECT_EQ(static_cast<int>(ParseOperator::row), 85);
    EXPECT_EQ(static_cast<int>(ParseOperator::division), 92);
    EXPECT_EQ(static_cast<int>(ParseToken::identifier), 40);
}

// Each node of a tree as its token's position, then its extent.
void addPlaces(const Node& node, std::string& places) {
    places += (places.empty() ? "" : " ") + std::to_string(node.position()) + "[" + std::to_string(node.begin()) + "," +
              std::to_string(node.end()) + ")";
    for (std::size_t i = 0; i < node.numChildren(); ++i)
        addPlaces(*node.child(i), places);
}

TEST(Language, PositionsAreByteOffsets) {
    constexpr struct {
        const char* text;
        const char* places; // goal, then depth first
    } cases[] = {
        {" a", "0[0,2) 1[1,2)"},
        {"(a+b)*c ", "0[0,8) 5[0,7) 2[1,4) 1[1,2) 3[3,4) 6[6,7)"},
        {"a*(b)", "0[0,5) 1[0,5) 0[0,1) 3[3,4)"},
        {"-(a)", "0[0,4) 0[0,4) 2[2,3)"},
        {"a'", "0[0,2) 1[0,2) 0[0,1)"},
        {"1:2:3", "0[0,5) 1[0,5) 0[0,1) 2[2,3) 4[4,5)"},
        {"f(x, :)", "0[0,7) 1[0,7) 0[0,1) 2[2,3) 5[5,6)"},
        {"s.ab", "0[0,4) 1[0,4) 0[0,1) 2[2,4)"},
        {"[a (b); 3]", "0[0,10) 0[0,10) 1[1,6) 1[1,6) 1[1,2) 4[4,5) 8[8,9) 8[8,9) 8[8,9)"},
        {"'\xC3\xA9'+x", "0[0,6) 4[0,6) 0[0,4) 5[5,6)"},
        {"... c\n a", "0[0,8) 7[7,8)"},
        {"@(x) x", "0[0,6) 0[0,6) 2[2,3) 5[5,6)"},
    };
    for (const auto& one : cases) {
        SCOPED_TRACE(one.text);
        const Parsed result = parsed(one.text);
        ASSERT_TRUE(result.tree) << result.refusal->text();
        std::string places;
        addPlaces(*result.tree, places);
        EXPECT_EQ(places, one.places);
    }
}

TEST(Language, RowsKeepTheirElementsInAList) {
    const Parsed result = parsed("[a b; c]");
    const Node& matrix = *result.tree->child(0);
    ASSERT_EQ(matrix.operatorCode(), ParseOperator::matrix);
    ASSERT_EQ(matrix.numChildren(), 2U);
    const Node& row = *matrix.child(0);
    EXPECT_EQ(row.operatorCode(), ParseOperator::row);
    ASSERT_EQ(row.numChildren(), 1U);
    EXPECT_EQ(row.child(0)->operatorCode(), ParseOperator::list);
    EXPECT_EQ(&row.elements(), row.child(0));
    EXPECT_EQ(row.elements().numChildren(), 2U);
    EXPECT_EQ(&matrix.elements(), &matrix);
}

TEST(Language, NumbersHaveTheirValues) {
    constexpr double infinity = std::numeric_limits<double>::infinity();
    constexpr struct {
        const char* text;
        ParseToken code;
        double value;
    } cases[] = {
        {"0", ParseToken::number, 0},
        {"12", ParseToken::number, 12},
        {"007", ParseToken::number, 7},
        {"1.5", ParseToken::number, 1.5},
        {"1.", ParseToken::number, 1},
        {".5", ParseToken::number, 0.5},
        {"0.1", ParseToken::number, 0.1},
        {"1e3", ParseToken::number, 1000},
        {"1E+3", ParseToken::number, 1000},
        {"25e-2", ParseToken::number, 0.25},
        {"1d3", ParseToken::number, 1000},
        {"1.5D-1", ParseToken::number, 0.15},
        {"1.e2", ParseToken::number, 100},
        {"1e999", ParseToken::number, infinity},
        {"1e-999", ParseToken::number, 0},
        {"9007199254740993", ParseToken::number, 9007199254740992.0},
        {"3i", ParseToken::imaginaryNumber, 3},
        {"2.5e1j", ParseToken::imaginaryNumber, 25},
        {"1d1i", ParseToken::imaginaryNumber, 10},
        {"0x1F", ParseToken::hexNumber, 31},
        {"0Xff", ParseToken::hexNumber, 255},
        {"0x1e3", ParseToken::hexNumber, 483},
        {"0x0000000000000000001", ParseToken::hexNumber, 1},
        {"0xFFu8", ParseToken::hexNumber, 255},
        {"0xFFs8", ParseToken::hexNumber, -1},
        {"0x7Fs8", ParseToken::hexNumber, 127},
        {"0xFFs16", ParseToken::hexNumber, 255},
        {"0x80000000s32", ParseToken::hexNumber, -2147483648.0},
        {"0xFFFFFFFFFFFFFFFF", ParseToken::hexNumber, 18446744073709551616.0},
        {"0xFFFFFFFFFFFFFFFFs64", ParseToken::hexNumber, -1},
        {"0b101", ParseToken::binaryNumber, 5},
        {"0B1u16", ParseToken::binaryNumber, 1},
        {"0b10000000s8", ParseToken::binaryNumber, -128},
    };
    for (const auto& one : cases) {
        SCOPED_TRACE(one.text);
        const Parsed result = parsed(one.text);
        ASSERT_TRUE(result.tree) << result.refusal->text();
        const Node& number = *result.tree->child(0);
        EXPECT_EQ(number.tokenCode(), one.code);
        EXPECT_EQ(number.text(), one.text);
        EXPECT_EQ(number.numberValue(), one.value);
    }
}

TEST(Language, TextsHaveTheirValues) {
    constexpr struct {
        const char* text;
        ParseToken code;
        const char* value;
    } cases[] = {
        {"''", ParseToken::charText, ""},
        {"'abc'", ParseToken::charText, "abc"},
        {"'it''s'", ParseToken::charText, "it's"},
        {"''''", ParseToken::charText, "'"},
        {"'say \"\"'", ParseToken::charText, "say \"\""},
        {"\"\"", ParseToken::stringText, ""},
        {"\"a\"\"b\"", ParseToken::stringText, "a\"b"},
        {"\"it's % no comment ... \"", ParseToken::stringText, "it's % no comment ... "},
        {"'\xC3\xA9\xFF'", ParseToken::charText, "\xC3\xA9\xFF"},
    };
    for (const auto& one : cases) {
        SCOPED_TRACE(one.text);
        const Parsed result = parsed(one.text);
        ASSERT_TRUE(result.tree) << result.refusal->text();
        EXPECT_EQ(result.tree->child(0)->tokenCode(), one.code);
        EXPECT_EQ(result.tree->child(0)->stringValue(), one.value);
    }
}

TEST(Language, SignsTellFormsOfOneOperatorApart) {
    constexpr struct {
        const char* text;
        ParseOperator code;
        ParseToken sign;
    } cases[] = {
        {"a/b", ParseOperator::division, ParseToken::slash},
        {"a./b", ParseOperator::division, ParseToken::elementSlash},
        {"a\\b", ParseOperator::division, ParseToken::backslash},
        {"a.\\b", ParseOperator::division, ParseToken::elementBackslash},
        {"a*b", ParseOperator::multiply, ParseToken::times},
        {"a.*b", ParseOperator::multiply, ParseToken::elementTimes},
        {"a^b", ParseOperator::power, ParseToken::caret},
        {"a.^b", ParseOperator::power, ParseToken::elementCaret},
        {"a'", ParseOperator::transpose, ParseToken::quote},
        {"a.'", ParseOperator::transpose, ParseToken::elementQuote},
        {"~a", ParseOperator::logicalNot, ParseToken::tilde},
        {"a(:)", ParseOperator::index, ParseToken::parenthesis},
        {"a{:}", ParseOperator::braceIndex, ParseToken::brace},
        {"[]", ParseOperator::matrix, ParseToken::bracket},
        {"{}", ParseOperator::cell, ParseToken::brace},
    };
    for (const auto& one : cases) {
        SCOPED_TRACE(one.text);
        const Parsed result = parsed(one.text);
        ASSERT_TRUE(result.tree) << result.refusal->text();
        EXPECT_EQ(result.tree->child(0)->operatorCode(), one.code);
        EXPECT_EQ(result.tree->child(0)->tokenCode(), one.sign);
    }
    const Parsed all = parsed("a(:, end)");
    EXPECT_EQ(all.tree->child(0)->child(1)->tokenCode(), ParseToken::wholeDimension);
    EXPECT_EQ(all.tree->child(0)->child(2)->tokenCode(), ParseToken::endOfDimension);
}

// Everything that is an identifier by its code may be a variable.
void addIdentifiers(const Node& node, std::string& names) {
    if (node.tokenCode() == ParseToken::identifier) names += (names.empty() ? "" : " ") + std::string(node.text());
    for (std::size_t i = 0; i < node.numChildren(); ++i)
        addIdentifiers(*node.child(i), names);
}

TEST(Language, NamesOfNoVariableAreNoIdentifiers) {
    constexpr struct {
        const char* text;
        const char* identifiers;
    } cases[] = {
        {"N + f(M)", "N f M"},
        {"s.x.y(k)", "s k"},
        {"s.(n)", "s n"},
        {"@sin", ""},
        {"@pkg.fcn", ""},
        {"@(x, y) x + N", "x N"},
        {"[a; b'] + c{d}", "a b c d"},
        {"A(end, :)", "A"},
        {"'a' + \"b\" + 1i", ""},
    };
    for (const auto& one : cases) {
        SCOPED_TRACE(one.text);
        std::string identifiers;
        addIdentifiers(*parsed(one.text).tree, identifiers);
        EXPECT_EQ(identifiers, one.identifiers);
    }
}

TEST(Language, MessagesCarryPositionExpectationAndFind) {
    EXPECT_EQ(testsupport::describe(parsed("f(a b)").refusal.get()),
              testsupport::expectedMessage("Quillane:Language:UnexpectedToken", 4,
                                           "an operator, ',' or ')' for the '(' at byte 1", "'b'"));
    EXPECT_EQ(parsed("f(a b)").refusal->text(),
              "at byte 4: expected an operator, ',' or ')' for the '(' at byte 1, found 'b'");
    EXPECT_EQ(testsupport::describe(parsed("2 + 0xG").refusal.get()),
              testsupport::expectedMessage("Quillane:Language:InvalidNumber", 4, "0xG",
                                           "expected hexadecimal digits behind 0x"));
    EXPECT_EQ(testsupport::describe(parsed("[1 'a]").refusal.get()),
              testsupport::expectedMessage("Quillane:Language:UnterminatedText", 3, "'"));
    EXPECT_EQ(testsupport::describe(parsed("%{\na").refusal.get()),
              testsupport::expectedMessage("Quillane:Language:UnterminatedComment", 0));
    EXPECT_EQ(testsupport::describe(parsed(repeated("(", 5000)).refusal.get()),
              testsupport::expectedMessage("Quillane:Language:NestingTooDeep", 500, 500));
}

TEST(Language, NestingIsBounded) {
    constexpr int limit = parseTreeDepthLimit;
    const struct {
        std::string name, begin, repeat, middle, close;
        int most; // repetitions that are accepted
    } cases[] = {
        {"parentheses", "", "(", "a", ")", limit - 1},    {"prefix signs", "", "-", "a", "", limit - 1},
        {"sums", "a", "+a", "", "", limit - 1},           {"ranges", "1", ":1:1", "", "", limit - 1},
        {"powers", "a", "^a", "", "", limit - 1},         {"powers to the right", "", "a^-", "a", "", limit / 2 - 1},
        {"transposes", "a", "'", "", "", limit - 1},      {"fields", "a", ".a", "", "", limit - 1},
        {"indexes", "", "a(", "a", ")", limit - 1},       {"indexes behind each other", "a", "(1)", "", "", limit - 1},
        {"matrices", "", "[", "a", "]", (limit - 1) / 3}, {"cells", "", "{", "a", "}", (limit - 1) / 3},
        {"functions", "", "@()", "a", "", limit - 1},
    };
    for (const auto& one : cases) {
        SCOPED_TRACE(one.name);
        const auto text = [&](int count) {
            return one.begin + repeated(one.repeat, count) + one.middle + repeated(one.close, count);
        };
        EXPECT_TRUE(parsed(text(one.most)).tree);
        expectSound(text(one.most));
        for (const int count : {one.most + 1, 100000}) {
            const Parsed tooDeep = parsed(text(count));
            ASSERT_TRUE(tooDeep.refusal);
            EXPECT_EQ(tooDeep.refusal->item(0).leaf, "NestingTooDeep");
        }
    }
    EXPECT_TRUE(parsed("[" + repeated("1 ", 100000) + "]").tree) << "width is not bounded";
}

TEST(Language, TreesOutliveTheText) {
    std::string text = "alpha + 'be''ta'";
    const Parsed result = parsed(text);
    text.assign(text.size(), '#');
    EXPECT_EQ(parsetrees::shown(*result.tree), "(+ alpha 'be''ta')");
}

TEST(Language, TheDiagnosticMayBeLeftOut) {
    EXPECT_EQ(generate_parse_tree("1 +"), nullptr);
    Tree tree(generate_parse_tree("1"));
    EXPECT_TRUE(tree);
    delete_parse_tree(nullptr);
}

// A slow reader of operators over one-token operands, which knows nothing but the table of precedences: it splits at
// the last sign of the weakest level.
namespace reference {

using Signs = std::vector<std::string>; // tokens

const std::vector<std::set<std::string>> levels = {{"||"},
                                                   {"&&"},
                                                   {"|"},
                                                   {"&"},
                                                   {"==", "~=", "<", "<=", ">", ">="},
                                                   {":"},
                                                   {"+", "-"},
                                                   {"*", ".*", "/", "./", "\\", ".\\"}};

bool isOperand(const std::string& token) { return std::isalnum(static_cast<unsigned char>(token[0])); }
bool isTranspose(const std::string& token) { return token == "'" || token == ".'"; }
bool isPower(const std::string& token) { return token == "^" || token == ".^"; }
bool isPrefix(const std::string& token) { return token == "+" || token == "-" || token == "~"; }

std::string shown(const Signs& tokens);

std::string shownPart(const Signs& tokens, std::size_t begin, std::size_t end) {
    return shown(Signs(tokens.begin() + static_cast<long>(begin), tokens.begin() + static_cast<long>(end)));
}

std::string shownRange(const Signs& tokens, const std::vector<std::size_t>& colons) {
    std::vector<std::string> parts;
    for (std::size_t i = 0; i <= colons.size(); ++i)
        parts.push_back(
            shownPart(tokens, i == 0 ? 0 : colons[i - 1] + 1, i == colons.size() ? tokens.size() : colons[i]));
    std::string range = parts[0];
    for (std::size_t i = 1; i < parts.size(); i += 2)
        range = "(: " + range + " " + parts[i] + (i + 1 < parts.size() ? " " + parts[i + 1] : "") + ")";
    return range;
}

std::string shown(const Signs& tokens) {
    const std::size_t size = tokens.size();
    for (const std::set<std::string>& level : levels) {
        std::vector<std::size_t> found;
        for (std::size_t i = 1; i < size; ++i)
            if (level.count(tokens[i]) && (isOperand(tokens[i - 1]) || isTranspose(tokens[i - 1]))) found.push_back(i);
        if (found.empty()) continue;
        if (level.count(":")) return shownRange(tokens, found);
        const std::size_t last = found.back();
        return "(" + tokens[last] + " " + shownPart(tokens, 0, last) + " " + shownPart(tokens, last + 1, size) + ")";
    }
    if (isPrefix(tokens[0])) {
        const char* name = tokens[0] == "+" ? "pos" : tokens[0] == "-" ? "neg" : "not";
        return std::string("(") + name + " " + shownPart(tokens, 1, size) + ")";
    }
    for (std::size_t i = 1; i + 1 < size; ++i)
        if (isPower(tokens[i]) && isPrefix(tokens[i + 1]))
            return "(" + tokens[i] + " " + shownPart(tokens, 0, i) + " " + shownPart(tokens, i + 1, size) + ")";
    if (size == 1) return tokens[0];
    if (isTranspose(tokens.back())) return "(" + tokens.back() + " " + shownPart(tokens, 0, size - 1) + ")";
    return "(" + tokens[size - 2] + " " + shownPart(tokens, 0, size - 2) + " " + tokens[size - 1] + ")";
}

} // namespace reference

TEST(Language, RandomChainsOfOperatorsReadAsTheReferenceDoes) {
    constexpr unsigned seed = 20250314;
    SCOPED_TRACE("seed " + std::to_string(seed));
    std::mt19937 random(seed);
    const auto below = [&](std::size_t n) { return random() % n; };
    std::vector<std::string> infix = {"^", ".^", "^", ".^"};
    for (const auto& level : reference::levels)
        infix.insert(infix.end(), level.begin(), level.end());
    const char* const prefixes[] = {"+", "-", "~"};
    const char* const blanks[] = {"", " ", "  ", "\t", " ... c\n"};

    for (int run = 0; run < 20000; ++run) {
        reference::Signs tokens;
        const std::size_t numOperands = 1 + below(8);
        for (std::size_t i = 0; i < numOperands; ++i) {
            if (i > 0) tokens.push_back(infix[below(infix.size())]);
            while (below(4) == 0)
                tokens.emplace_back(prefixes[below(3)]);
            tokens.emplace_back(1, static_cast<char>('a' + below(26)));
            while (below(5) == 0)
                tokens.emplace_back(below(2) ? "'" : ".'");
        }
        std::string text;
        for (const std::string& token : tokens)
            text += token + blanks[below(std::size(blanks))];
        SCOPED_TRACE(text);
        const std::string tree = read(text);
        ASSERT_EQ(tree, reference::shown(tokens));
        // The same inside a matrix and inside an index, where nothing may depend on blanks that are not there.
        std::string tight;
        for (const std::string& token : tokens)
            tight += token;
        ASSERT_EQ(read("[" + tight + "]"), "(matrix (row " + tree + "))");
        ASSERT_EQ(read("f(" + text + ")"), "(call f " + tree + ")");
    }
}

// Whatever stands in a text, reading it ends with a sound tree or a sound refusal.
TEST(Language, RandomTextsAreReadOrRefused) {
    constexpr unsigned seed = 20250315;
    SCOPED_TRACE("seed " + std::to_string(seed));
    std::mt19937 random(seed);
    const auto below = [&](std::size_t n) { return random() % n; };
    const std::vector<testsupport::TsvRow> rows =
        testsupport::readTsv(QLTYPES_TEST_DATA_DIR "/language_expressions.tsv");
    const char* const pieces[] = {"a", "1", ".5", "0x1", "1e", "'",  "\"", "(",   ")",   "[",      "]",      "{",   "}",
                                  "@", ".", ",",  ";",   "\n", " ",  "%",  "...", "end", "\n%{\n", "\n%}\n", "+",   "-",
                                  "~", ":", "*",  "/",   "^",  "==", "&&", "|",   ".'",  "if",     "$",      "\xC3"};
    int numRead = 0;
    for (int run = 0; run < 20000; ++run) {
        std::string text = testsupport::unescaped(rows[below(rows.size())].columns[0]);
        for (std::size_t change = below(4); change > 0; --change) {
            const std::size_t at = below(text.size() + 1);
            switch (below(4)) {
            case 0:
                text.insert(at, pieces[below(std::size(pieces))]);
                break;
            case 1:
                text.erase(at, below(4));
                break;
            case 2:
                text.insert(at, 1, static_cast<char>(below(256)));
                break;
            default:
                text += text.substr(at, below(8));
            }
        }
        SCOPED_TRACE(testing::PrintToString(text));
        expectSound(text);
        const Parsed result = parsed(text);
        if (result.tree) {
            ++numRead;
            ASSERT_EQ(read(parsetrees::parenthesised(*result.tree)), parsetrees::shown(*result.tree));
        }
    }
    EXPECT_GT(numRead, 2000);
    EXPECT_LT(numRead, 18000);
}

} // namespace
