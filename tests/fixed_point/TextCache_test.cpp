#include <bit>
#include <functional>
#include <limits>
#include <random>
#include <vector>

#include <gtest/gtest.h>

#include "qltypes/fixed_point/TextCache_internal.h"
#include "tests/fixed_point/Props.h"

namespace {

constexpr double notANumber = std::numeric_limits<double>::quiet_NaN();

constexpr fxpDataTypeProp plain{FXP_DT_FIXPT, 1, 16, 0, -7, 1.0, 0.0, 0};
constexpr fxpDataTypeProp scaled{FXP_DT_FIXPT, 1, 16, 0, -7, 1.5, 2.0, 0};

/// The record after a change.
template <class Change> fxpDataTypeProp changed(fxpDataTypeProp prop, Change change) {
    change(prop);
    return prop;
}

/// The mixing of five words, written out.
std::uint64_t slowHash(const fxpDataTypeProp& prop) {
    const std::uint64_t words[] = {
        std::uint64_t(std::int64_t{prop.DataTypeMode}), prop.Signedness, std::uint64_t(std::int64_t{prop.WordLength}),
        std::uint64_t(std::int64_t{prop.FixedExponent}), std::uint64_t(std::int64_t{prop.DataTypeOverrideOff})};
    std::uint64_t hash = 0;
    for (std::uint64_t word : words) {
        word *= 0xc6a4a7935bd1e995u;
        word ^= word >> 47;
        word *= 0xc6a4a7935bd1e995u;
        hash ^= word;
        hash *= 0xc6a4a7935bd1e995u;
        hash += 0xe6546b64u;
    }
    return hash;
}

TEST(TextCache, HashMixesFiveFieldsInTheirOrder) {
    const FXP::UnitScaledHash hash;
    EXPECT_EQ(hash(plain), slowHash(plain));
    EXPECT_EQ(hash({FXP_DT_SCALED_DOUBLE, 2, -5, 0, 2147483647, 1.0, 0.0, 1}),
              slowHash({FXP_DT_SCALED_DOUBLE, 2, -5, 0, 2147483647, 1.0, 0.0, 1}));
    EXPECT_NE(hash(plain), hash(changed(plain, [](auto& p) { p.DataTypeMode = FXP_DT_SCALED_DOUBLE; })));
    EXPECT_NE(hash(plain), hash(changed(plain, [](auto& p) { p.Signedness = 0; })));
    EXPECT_NE(hash(plain), hash(changed(plain, [](auto& p) { p.WordLength = 17; })));
    EXPECT_NE(hash(plain), hash(changed(plain, [](auto& p) { p.FixedExponent = 7; })));
    EXPECT_NE(hash(plain), hash(changed(plain, [](auto& p) { p.DataTypeOverrideOff = 1; })));
    EXPECT_EQ(hash(plain), hash(changed(plain, [](auto& p) { p.ExponentLength = 9; }))); // kept
}

TEST(TextCache, EqualityIsThatOfTheFieldsAndTheHashes) { // kept
    constexpr unsigned long long seed = 31;
    SCOPED_TRACE(seed);
    std::mt19937_64 random(seed);
    const auto randomRecord = [&] {
        return fxpDataTypeProp{static_cast<fxpModeDataType>(random() % 2),
                               unsigned(random() % 2),
                               int(random() % 2),
                               unsigned(random() % 2),
                               int(random() % 2),
                               1.0,
                               random() % 2 ? 0.0 : -0.0,
                               int(random() % 3) - 1};
    };
    const FXP::UnitScaledEqual equal;
    for (int i = 0; i < 20000; ++i) {
        const fxpDataTypeProp a = randomRecord(), b = randomRecord();
        const bool fieldsEqual = a.DataTypeMode == b.DataTypeMode && a.Signedness == b.Signedness &&
                                 a.WordLength == b.WordLength && a.ExponentLength == b.ExponentLength &&
                                 a.FixedExponent == b.FixedExponent && a.Bias == b.Bias;
        ASSERT_EQ(equal(a, b), fieldsEqual && slowHash(a) == slowHash(b)) << a << b;
    }
    EXPECT_FALSE(equal(plain, changed(plain, [](auto& p) { p.SlopeAdjustmentFactor = 1.5; })));
}

struct OrderRow {
    const char* what;
    fxpDataTypeProp lesser, greater;
};

// clang-format off
constexpr OrderRow orderRows[] = {
    {"mode, as a signed number",    {static_cast<fxpModeDataType>(-1), 1, 9, 0, 9, 1.5, 9.0, 0}, {FXP_DT_FIXPT, 0, 1, 0, 0, 1.5, 0.0, 0}},
    {"mode before exponent",        {FXP_DT_FIXPT, 1, 16, 0, 9, 1.5, 0.0, 0},       {FXP_DT_SCALED_DOUBLE, 1, 16, 0, 0, 1.5, 0.0, 0}},
    {"exponent before factor",      {FXP_DT_FIXPT, 1, 16, 0, -1, 1.9, 9.0, 1},      {FXP_DT_FIXPT, 1, 16, 0, 0, 1.5, 0.0, 0}},
    {"factor before bias",          {FXP_DT_FIXPT, 1, 16, 0, 0, 1.5, 9.0, 0},       {FXP_DT_FIXPT, 1, 16, 0, 0, 1.9, 0.0, 0}},
    {"bias before word length",     {FXP_DT_FIXPT, 1, 16, 0, 0, 1.5, -1.0, 0},      {FXP_DT_FIXPT, 1, 8, 0, 0, 1.5, 0.0, 0}},
    {"word length before sign",     {FXP_DT_FIXPT, 1, 8, 0, 0, 1.5, 0.0, 0},        {FXP_DT_FIXPT, 0, 16, 0, 0, 1.5, 0.0, 0}},
    {"word length as unsigned",     {FXP_DT_FIXPT, 1, 2147483647, 0, 0, 1.5, 0.0, 0}, {FXP_DT_FIXPT, 1, -1, 0, 0, 1.5, 0.0, 0}},
    {"sign before override",        {FXP_DT_FIXPT, 0, 8, 0, 0, 1.5, 0.0, 1},        {FXP_DT_FIXPT, 1, 8, 0, 0, 1.5, 0.0, 0}},
    {"override last",               {FXP_DT_FIXPT, 1, 8, 9, 0, 1.5, 0.0, 0},        {FXP_DT_FIXPT, 1, 8, 0, 0, 1.5, 0.0, 1}},
    {"custom float: exponent bits", {FXP_DT_CUSTOM_FLOAT, 1, 8, 4, 0, 1.5, 0.0, 1}, {FXP_DT_CUSTOM_FLOAT, 1, 8, 5, 0, 1.5, 0.0, 0}},
    {"double: override",            {FXP_DT_DOUBLE, 1, 64, 11, 9, 1.9, 9.0, 0},     {FXP_DT_DOUBLE, 0, 8, 0, 0, 1.5, 0.0, 1}},
    {"single: override",            {FXP_DT_SINGLE, 1, 64, 11, 9, 1.9, 9.0, -1},    {FXP_DT_SINGLE, 0, 8, 0, 0, 1.5, 0.0, 0}},
    {"boolean: override",           {FXP_DT_BOOLEAN, 1, 64, 11, 9, 1.9, 9.0, 0},    {FXP_DT_BOOLEAN, 0, 8, 0, 0, 1.5, 0.0, 1}},
    {"a NaN factor is last",        {FXP_DT_FIXPT, 1, 8, 0, 0, 1e300, 9.0, 1},      {FXP_DT_FIXPT, 1, 8, 0, 0, notANumber, 0.0, 0}},
    {"a NaN bias is last",          {FXP_DT_FIXPT, 1, 8, 0, 0, 1.5, 1e300, 1},      {FXP_DT_FIXPT, 1, 8, 0, 0, 1.5, notANumber, 0}},
};

constexpr OrderRow sameEntryRows[] = {
    {"kept: exponent bits of fixed point", {FXP_DT_FIXPT, 1, 8, 0, 0, 1.5, 0.0, 0},   {FXP_DT_FIXPT, 1, 8, 9, 0, 1.5, 0.0, 0}},
    {"kept: all but override in double",   {FXP_DT_DOUBLE, 1, 64, 11, 0, 1.5, 0.0, 0}, {FXP_DT_DOUBLE, 0, 8, 0, 9, 1.9, 9.0, 0}},
    {"kept: signs of zero",                {FXP_DT_FIXPT, 1, 8, 0, 0, 1.5, 0.0, 0},   {FXP_DT_FIXPT, 1, 8, 0, 0, 1.5, -0.0, 0}},
    {"NaNs",                               {FXP_DT_FIXPT, 1, 8, 0, 0, notANumber, 0.0, 0}, {FXP_DT_FIXPT, 1, 8, 0, 0, -notANumber, 0.0, 0}},
};
// clang-format on

TEST(TextCache, OrderOfScaledRecords) {
    const FXP::ScaledOrder before;
    for (const OrderRow& row : orderRows) {
        SCOPED_TRACE(row.what);
        EXPECT_TRUE(before(row.lesser, row.greater));
        EXPECT_FALSE(before(row.greater, row.lesser));
        EXPECT_FALSE(before(row.lesser, row.lesser));
    }
    for (const OrderRow& row : sameEntryRows) {
        SCOPED_TRACE(row.what);
        EXPECT_FALSE(before(row.lesser, row.greater));
        EXPECT_FALSE(before(row.greater, row.lesser));
    }
}

TEST(TextCache, OrderIsStrictAndTransitive) {
    constexpr unsigned long long seed = 32;
    SCOPED_TRACE(seed);
    std::mt19937_64 random(seed);
    const double doubles[] = {0.0, -0.0, 1.0, 1.5, -2.0, notANumber, std::numeric_limits<double>::infinity()};
    std::vector<fxpDataTypeProp> props;
    for (int i = 0; i < 120; ++i)
        props.push_back({static_cast<fxpModeDataType>(random() % 6), unsigned(random() % 2), int(random() % 2) - 1,
                         unsigned(random() % 2), int(random() % 2), doubles[random() % 7], doubles[random() % 7],
                         int(random() % 2)});
    const FXP::ScaledOrder before;
    const auto same = [&](const auto& a, const auto& b) { return !before(a, b) && !before(b, a); };
    for (const auto& a : props)
        for (const auto& b : props)
            for (const auto& c : props) {
                ASSERT_FALSE(before(a, b) && before(b, a));
                ASSERT_TRUE(!(before(a, b) && before(b, c)) || before(a, c)) << a << b << c;
                ASSERT_TRUE(!(same(a, b) && same(b, c)) || same(a, c)) << a << b << c;
            }
}

TEST(TextCache, ABiasAloneIsAScaling) {
    const fxpDataTypeProp withNaN{FXP_DT_FIXPT, 1, 16, 0, 0, 1.0, notANumber, 0};
    EXPECT_EQ(&FXP::textCacheEntry(withNaN), &FXP::textCacheEntry(withNaN));
    EXPECT_EQ(&FXP::textCacheEntry({FXP_DT_DOUBLE, 1, 64, 11, 0, 1.0, 8.0, 0}),
              &FXP::textCacheEntry({FXP_DT_DOUBLE, 1, 64, 11, 0, 1.0, 9.0, 0}));
}

TEST(TextCache, EntriesAreMadeOnceAndStay) {
    fxpTextCacheEntry& first = FXP::textCacheEntry(plain);
    fxpTextCacheEntry& second = FXP::textCacheEntry(scaled);
    EXPECT_NE(&first, &second);
    for (const std::string& text : first.texts)
        EXPECT_EQ(text, "");
    first.texts[0] = "a text";
    for (int i = 1; i < 5000; ++i) {
        FXP::textCacheEntry(changed(plain, [&](auto& p) { p.WordLength = 100 + i; }));
        FXP::textCacheEntry(changed(scaled, [&](auto& p) { p.WordLength = 100 + i; }));
    }
    EXPECT_EQ(&FXP::textCacheEntry(plain), &first);
    EXPECT_EQ(&FXP::textCacheEntry(scaled), &second);
    EXPECT_EQ(first.texts[0], "a text");
    EXPECT_NE(&FXP::textCacheEntry(changed(plain, [](auto& p) { p.ExponentLength = 5; })), &first);
    EXPECT_NE(&FXP::textCacheEntry(changed(plain, [](auto& p) { p.DataTypeOverrideOff = 1; })), &first);
    EXPECT_EQ(&FXP::textCacheEntry(changed(plain, [](auto& p) { p.Bias = -0.0; })), &first);
    EXPECT_EQ(&FXP::textCacheEntry(changed(scaled, [](auto& p) { p.ExponentLength = 5; })), &second); // kept
}

} // namespace
