// The tables of docs/guide/conversion.md are what the library does.
//
// QLTYPES_UPDATE_GUIDE=1 in the environment writes them anew.
#include <cmath>
#include <cstdint>
#include <cstdlib>
#include <fstream>
#include <iterator>
#include <limits>
#include <sstream>
#include <string>

#include <gtest/gtest.h>

#include "qlplatform/services/NumberText.h"
#include "qltypes/conversion/CheckedConversion.h"
#include "qltypes/types/TypeIds.h"

namespace {

constexpr double belowHalf = 0.49999999999999994; // the double in front of 0.5
constexpr double inf = std::numeric_limits<double>::infinity();
constexpr double nan = std::numeric_limits<double>::quiet_NaN();

struct Rounding {
    const char* name;
    fxpModeRounding_tag mode;
};
constexpr Rounding roundings[] = {
    {"`ZERO`, `AS_ZERO`", FXP_ROUND_ZERO}, {"`FLOOR`", FXP_ROUND_FLOOR},         {"`CEILING`", FXP_ROUND_CEILING},
    {"`HALF_UP`", FXP_ROUND_HALF_UP},      {"`HALF_AWAY`", FXP_ROUND_HALF_AWAY}, {"`HALF_EVEN`", FXP_ROUND_HALF_EVEN},
};

template <class T>
std::string converted(double value, int id, fxpModeOverflow_tag overflow, fxpModeRounding_tag rounding) {
    T result;
    qlConvertBuiltInDTypeVectWithCheck(&value, 1, DATA_TYPE_ID_DOUBLE, false, &result, 1, id, false, overflow, rounding,
                                       false);
    return std::to_string(result);
}

std::string row(const std::string& head, const auto& values, auto&& cell) {
    std::string text = "| " + head + " |";
    for (const double value : values)
        text += " " + std::string(cell(value)) + " |";
    return text + "\n";
}

std::string head(const std::string& corner, const auto& values) {
    return row(corner, values, [](double value) { return qlsv_dtoa(value, false); }) +
           row("---", values, [](double) { return "---:"; });
}

std::string roundingTable() {
    constexpr double values[] = {-2.5, -1.5, -1.4, -0.6, -0.5, -0.4, belowHalf, 0.5, 0.6, 1.4, 1.5, 2.5};
    std::string text = head("Rounding", values);
    for (const Rounding& rounding : roundings)
        text += row(rounding.name, values, [&](double value) {
            return converted<std::int8_t>(value, DATA_TYPE_ID_INT8, FXP_OVERFLOW_SATURATE, rounding.mode);
        });
    return text;
}

std::string overflowTable() {
    constexpr double values[] = {127.4, 127.5, 128, 255.5, 300, -0.5, -128.5, -129, 1e300, inf, -inf, nan};
    std::string text = head("To, overflow", values);
    for (const bool saturates : {false, true})
        text += row(saturates ? "int8, `SATURATE`" : "int8, `WRAP`", values, [&](double value) {
            return converted<std::int8_t>(value, DATA_TYPE_ID_INT8,
                                          saturates ? FXP_OVERFLOW_SATURATE : FXP_OVERFLOW_WRAP, FXP_ROUND_HALF_EVEN);
        });
    for (const bool saturates : {false, true})
        text += row(saturates ? "uint8, `SATURATE`" : "uint8, `WRAP`", values, [&](double value) {
            return converted<std::uint8_t>(value, DATA_TYPE_ID_UINT8,
                                           saturates ? FXP_OVERFLOW_SATURATE : FXP_OVERFLOW_WRAP, FXP_ROUND_HALF_EVEN);
        });
    text += row("boolean", values, [](double value) {
        return converted<bool>(value, DATA_TYPE_ID_BOOLEAN, FXP_OVERFLOW_WRAP, FXP_ROUND_ZERO);
    });
    return text;
}

/// What stands between the marks of a table, by reference to the place in `page`.
void expectTable(std::string& page, const std::string& name, const std::string& table) {
    const std::string begin = "<!-- " + name + ": written by test_conversion, QLTYPES_UPDATE_GUIDE=1 -->\n";
    const std::string end = "<!-- end -->\n";
    const std::size_t from = page.find(begin);
    ASSERT_NE(from, std::string::npos) << "the guide has no mark for the table " << name;
    const std::size_t start = from + begin.size();
    const std::size_t stop = page.find(end, start);
    ASSERT_NE(stop, std::string::npos);
    if (!std::getenv("QLTYPES_UPDATE_GUIDE")) {
        EXPECT_EQ(page.substr(start, stop - start), table);
    }
    page.replace(start, stop - start, table);
}

TEST(GuideTable, IsWhatTheLibraryDoes) {
    const std::string path = QLTYPES_TEST_DATA_DIR "/../../docs/guide/conversion.md";
    std::ifstream in(path);
    ASSERT_TRUE(in) << path;
    std::string page{std::istreambuf_iterator<char>(in), {}};
    expectTable(page, "rounding", roundingTable());
    expectTable(page, "overflow", overflowTable());
    if (std::getenv("QLTYPES_UPDATE_GUIDE")) std::ofstream(path) << page;
}

} // namespace
