#include <climits>
#include <cstddef>

#include <gtest/gtest.h>

#include "qltypes/host/HostInfo.h"
#include "qltypes/host/HostInfo_internal.h"

namespace {

using Host = FXPCORE::TORVEXHostInfo;

TEST(HostInfo, DescribesTheMachine) {
    struct Row {
        const char* name;
        int (*get)();
        int expected;
    };
    constexpr Row rows[] = {
        {"char", Host::getBitsPerChar, 8},
        {"short", Host::getBitsPerShort, 16},
        {"int", Host::getBitsPerInt, 32},
        {"long", Host::getBitsPerLong, 64},
        {"long long", Host::getBitsPerLongLong, 64},
        {"pointer", Host::getBitsPerPointer, 64},
        {"word", Host::getWordSize, 64},
        {"double", Host::getBitsPerDouble, 64},
        {"float", Host::getBitsPerFloat, 32},
        {"half", Host::getBitsPerHalf, 16},
        {"size_t", Host::getBitsPerSizeT, 64},
        {"ptrdiff_t", Host::getBitsPerPtrDiffT, 64},
        {"long long mode", Host::getLongLongMode, 1},
        {"endianness", Host::getEndianness, 1},
        {"division", Host::getIntDivRndMode, 0},
    };
    for (const Row& row : rows)
        EXPECT_EQ(row.get(), row.expected) << row.name;
    EXPECT_TRUE(Host::getShiftRightOnSignedInteger());
}

TEST(HostInfo, AgreesWithTheCompiler) {
    EXPECT_EQ(Host::getBitsPerLong(), static_cast<int>(sizeof(long) * CHAR_BIT));
    EXPECT_EQ(Host::getBitsPerPointer(), static_cast<int>(sizeof(void*) * CHAR_BIT));
    EXPECT_EQ(Host::getBitsPerSizeT(), static_cast<int>(sizeof(std::size_t) * CHAR_BIT));
    EXPECT_EQ(Host::getShiftRightOnSignedInteger(), (-2 >> 1) == -1);
}

TEST(HostInfo, RoundingFollowsFromAllQuotients) {
    using FXPCORE::roundingFromQuotients;
    EXPECT_EQ(roundingFromQuotients({-2, -2, -2, -2, -2, -2, 1, 1, 1}), 1);
    EXPECT_EQ(roundingFromQuotients({-1, -1, -1, -1, -1, -1, 1, 1, 1}), 0);
    for (const int first : {-1, -2})
        for (std::size_t changed = 0; changed < 9; ++changed)
            for (const int value : {-3, 0, 2}) {
                std::array<int, 9> quotients = {first, first, first, first, first, first, 1, 1, 1};
                quotients[changed] = value;
                EXPECT_EQ(roundingFromQuotients(quotients), 2) << changed << " is " << value;
            }
    EXPECT_EQ(roundingFromQuotients({-2, -2, -1, -2, -2, -1, 1, 1, 1}), 2);
}

} // namespace
