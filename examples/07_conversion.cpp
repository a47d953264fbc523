// Conversion among the built-in types: rounding, overflow, what is lost, and whether a vector would overflow.
#include <cmath>
#include <cstdint>
#include <cstdio>
#include <iterator>

#include "qltypes/conversion/CheckedConversion.h"
#include "qltypes/types/DataType.h"
#include "qltypes/types/TypeIds.h"

int main() {
    const double values[] = {-2.5, -1.5, -0.5, 0.5, 1.5, 2.5};
    const struct {
        const char* name;
        fxpModeRounding_tag mode;
    } roundings[] = {{"toward zero", FXP_ROUND_ZERO},    {"ceiling", FXP_ROUND_CEILING},
                     {"floor", FXP_ROUND_FLOOR},         {"half up", FXP_ROUND_HALF_UP},
                     {"half away", FXP_ROUND_HALF_AWAY}, {"half even", FXP_ROUND_HALF_EVEN}};
    std::printf("%-12s", "");
    for (const double value : values)
        std::printf("%6g", value);
    for (const auto& rounding : roundings) {
        std::int8_t results[std::size(values)];
        qlConvertBuiltInDTypeVectWithCheck(values, std::size(values), DATA_TYPE_ID_DOUBLE, false, results,
                                           std::size(values), DATA_TYPE_ID_INT8, false, FXP_OVERFLOW_SATURATE,
                                           rounding.mode, false);
        std::printf("\n%-12s", rounding.name);
        for (const std::int8_t result : results)
            std::printf("%6d", result);
    }

    std::puts("\n\nOut of range, to int8:");
    for (const double value : {127.9, 300.0, -129.0, double(INFINITY), double(NAN)}) {
        std::int8_t wrapped, saturated;
        const bool wrappedKept =
            qlConvertBuiltInDTypeVectWithCheck(&value, 1, DATA_TYPE_ID_DOUBLE, false, &wrapped, 1, DATA_TYPE_ID_INT8,
                                               false, FXP_OVERFLOW_WRAP, FXP_ROUND_FLOOR, true);
        qlConvertBuiltInDTypeVectWithCheck(&value, 1, DATA_TYPE_ID_DOUBLE, false, &saturated, 1, DATA_TYPE_ID_INT8,
                                           false, FXP_OVERFLOW_SATURATE, FXP_ROUND_FLOOR, true);
        std::printf("%6g wraps to %4d, saturates to %4d%s\n", value, wrapped, saturated,
                    wrappedKept ? "" : "; something is lost");
    }

    std::puts("\nAsked beforehand:");
    const std::int32_t counts[] = {-5, 100, 200};
    for (const int count : {2, 3})
        std::printf("the first %d would %sleave the range of int8\n", count,
                    QLTypeSys::DataType::CheckForOverflowDuringDataTypeConversion(
                        counts, count, DATA_TYPE_ID_INT32, false, DATA_TYPE_ID_INT8, FXP_ROUND_FLOOR)
                        ? ""
                        : "not ");
}
