#include "tests/fixed_point/TextCases.h"

#include <bit>
#include <cmath>
#include <cstdint>
#include <cstdio>
#include <map>
#include <stdexcept>

#include "tests/support/Tsv.h"

namespace {

using reference::Ending;

const std::map<std::string, Ending> endings = {
    {"ok", Ending::read}, {"invalid", Ending::invalid}, {"badcast", Ending::badCast}};

const std::map<std::string, fxpModeDataType> modes = {{"fixpt", FXP_DT_FIXPT},     {"scaled", FXP_DT_SCALED_DOUBLE},
                                                      {"double", FXP_DT_DOUBLE},   {"single", FXP_DT_SINGLE},
                                                      {"boolean", FXP_DT_BOOLEAN}, {"float", FXP_DT_CUSTOM_FLOAT}};

fxpDataTypeProp propOf(const std::vector<std::string>& columns) {
    return {modes.at(columns[2]),
            unsigned(std::stoul(columns[3])),
            std::stoi(columns[4]),
            unsigned(std::stoul(columns[5])),
            std::stoi(columns[6]),
            std::strtod(columns[7].c_str(), nullptr),
            std::strtod(columns[8].c_str(), nullptr),
            std::stoi(columns[9])};
}

template <std::size_t count> std::string oneOf(std::mt19937_64& random, const std::string_view (&choices)[count]) {
    return std::string(choices[random() % count]);
}

} // namespace

std::vector<TextCase> textCases(const std::string& fileName) {
    std::vector<TextCase> cases;
    for (const testsupport::TsvRow& row : testsupport::readTsv(QLTYPES_TEST_DATA_DIR "/" + fileName)) {
        const Ending ending = endings.at(row.columns.at(1));
        const bool isRead = ending == Ending::read;
        if (row.columns.size() != (isRead ? 11 : 2))
            throw std::runtime_error(fileName + ": columns in line " + std::to_string(row.line));
        TextCase& one = cases.emplace_back();
        one.line = row.line;
        one.text = testsupport::unescaped(row.columns[0]);
        one.reading.ending = ending;
        if (isRead) {
            one.reading.prop = propOf(row.columns);
            one.lastColumn = row.columns[10];
        }
    }
    return cases;
}

std::string shown(std::string_view text) {
    std::string out = "'";
    for (const char c : text.substr(0, 200)) {
        char buffer[8];
        std::snprintf(buffer, sizeof buffer, c >= ' ' && c <= '~' ? "%c" : "\\x%02x", static_cast<unsigned char>(c));
        out += buffer;
    }
    return out + (text.size() > 200 ? "'..." : "'");
}

double randomDouble(std::mt19937_64& random) {
    switch (random() % 4) {
    case 0:
        return static_cast<double>(static_cast<int>(random() % 2000) - 1000);
    case 1:
        return static_cast<double>(static_cast<int>(random() % 2000000) - 1000000) / 1000;
    case 2:
        return std::ldexp(static_cast<double>(random() >> 11), static_cast<int>(random() % 200) - 150);
    default:
        return std::bit_cast<double>(random());
    }
}

fxpDataTypeProp randomProp(std::mt19937_64& random) {
    fxpDataTypeProp prop{FXP_DT_FIXPT, 0, 1, 0, 0, 1.0, 0.0, 0};
    if (random() % 2) prop.DataTypeMode = FXP_DT_SCALED_DOUBLE;
    prop.Signedness = random() % 2;
    const int widths[] = {8, 16, 32, 64, 1, static_cast<int>(random() % 200 + 1), static_cast<int>(random() >> 34) + 1};
    prop.WordLength = widths[random() % std::size(widths)];
    const int exponents[] = {0, static_cast<int>(random() % 40) - 20, static_cast<int>(random() % 4000) - 2000,
                             static_cast<int>(random() >> 33), -static_cast<int>(random() >> 33)};
    prop.FixedExponent = exponents[random() % std::size(exponents)];
    int ignored;
    if (random() % 2) {
        const double factor = 2 * std::frexp(std::fabs(randomDouble(random)), &ignored);
        if (factor >= 1.0 && factor < 2.0) prop.SlopeAdjustmentFactor = factor;
    }
    if (random() % 2) {
        const double bias = randomDouble(random);
        if (std::isfinite(bias) && bias != 0.0) prop.Bias = bias;
    }
    return prop;
}

std::string randomIdentifier(std::mt19937_64& random) {
    static constexpr std::string_view prefixes[] = {"sfix", "ufix", "flts", "fltu", "int", "uint", "fix", "flt", ""};
    static constexpr std::string_view pieces[] = {"_F1p5", "_F1p", "_F", "_E", "_En", "_S",  "_B",  "_Bn",       "_",
                                                  "n",     "p",    "e",  "en", "1",   "2",   "9",   "0",         "00",
                                                  "10",    "16",   "05", "50", "3p2", "p25", "1e3", "s",         "u",
                                                  "f",     "x",    "F1", ".",  "-",   " ",   "E3",  "2147483648"};
    std::string text = oneOf(random, prefixes);
    if (random() % 4) text += std::to_string(random() % 300);
    // Half of the texts are well formed up to one change.
    if (random() % 2) {
        static constexpr std::string_view scalings[] = {"",          "_E3",      "_En12",         "_S3",
                                                        "_S3p25",    "_Sp5",     "_S1p5e7",       "_S1en3",
                                                        "_S2p5en30", "_F1p5_E3", "_F1p03_En2000", "_F1p999_E1024"};
        static constexpr std::string_view biases[] = {"", "_B1", "_Bn1p5", "_Bp5", "_B1e3", "_Bn2p5en9"};
        text += oneOf(random, scalings) + oneOf(random, biases);
        if (random() % 2) {
            const std::size_t at = random() % (text.size() + 1);
            const std::string piece = oneOf(random, pieces);
            text.replace(at, random() % 2, piece);
        }
        return text;
    }
    for (std::size_t count = random() % 6; count > 0; --count)
        text += oneOf(random, pieces);
    return text;
}

std::string randomConstructor(std::mt19937_64& random) {
    static constexpr std::string_view names[] = {"fixdt", "numerictype", "FixDt", "fixd", ""};
    static constexpr std::string_view words[] = {"1",
                                                 "0",
                                                 "[]",
                                                 "16",
                                                 "8",
                                                 "-3",
                                                 "7",
                                                 "1.5",
                                                 "3",
                                                 "1e3",
                                                 "-2.5",
                                                 "+4",
                                                 "",
                                                 "",
                                                 "x",
                                                 " 1",
                                                 "1 ",
                                                 "'half'",
                                                 "'double'",
                                                 "'boolean",
                                                 "'a'",
                                                 "2147483647",
                                                 "-2147483648",
                                                 "1e-5",
                                                 "nan",
                                                 "-inf",
                                                 "0x1f",
                                                 "1.99999999999999999999",
                                                 "'DataType','ScaledDouble'",
                                                 "'datatype'",
                                                 "'scaleddouble'",
                                                 "'DataTypeOverride','Off'",
                                                 "'datatypeoverride'",
                                                 "'off'",
                                                 "\xff",
                                                 "(",
                                                 ")"};
    std::string text = random() % 8 ? "fixdt" : oneOf(random, names);
    text += random() % 16 ? "(" : "";
    if (random() % 8) text += std::to_string(random() % 2) + ',';
    if (random() % 8) text += std::to_string(random() % 64) + ',';
    for (std::size_t count = random() % 6; count > 0; --count)
        text += oneOf(random, words) + ',';
    if (random() % 4) text.back() = ')';
    if (random() % 16 == 0) text[random() % text.size()] = static_cast<char>(random());
    return text;
}
