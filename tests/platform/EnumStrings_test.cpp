#include <gtest/gtest.h>

#include "qlplatform/strings/EnumStrings.h"
#include "qlplatform/strings/Strings.h"

namespace {

constexpr EnumStr rows[] = {{"Row", 1}, {"Column", 0}, {"Hidden", 7, 1}, {"RowAgain", 1}, {"Row", 9}};
constexpr EnumStrs table = {5, rows};
constexpr EnumStrs noEntries = {0, nullptr};
constexpr EnumStrs negativeCount = {-3, rows};

TEST(EnumStrings, TheFirstEntryAnswers) {
    EXPECT_STREQ(utEnumStrs_EnumValue_to_string(&table, 1), "Row");
    EXPECT_STREQ(utEnumStrs_EnumValue_to_string(&table, 0), "Column");
    EXPECT_EQ(utOldEnumStrs_string_to_EnumValue(&table, "Row"), 1);
    EXPECT_EQ(utOldEnumStrs_string_to_EnumValue(&table, "RowAgain"), 1);
}

TEST(EnumStrings, HiddenEntriesAreFound) {
    EXPECT_STREQ(utEnumStrs_EnumValue_to_string(&table, 7), "Hidden");
    EXPECT_EQ(utOldEnumStrs_string_to_EnumValue(&table, "Hidden"), 7);
}

TEST(EnumStrings, WhatIsMissingHasItsAnswer) {
    EXPECT_STREQ(utEnumStrs_EnumValue_to_string(&table, 2), "");
    for (const char* name : {"row", "Ro", "Rows", ""})
        EXPECT_EQ(utOldEnumStrs_string_to_EnumValue(&table, name), -1) << name;
    EXPECT_EQ(utOldEnumStrs_string_to_EnumValue(&table, nullptr), -1);
    for (const EnumStrs* empty : {&noEntries, &negativeCount}) {
        EXPECT_STREQ(utEnumStrs_EnumValue_to_string(empty, 1), "");
        EXPECT_EQ(utOldEnumStrs_string_to_EnumValue(empty, "Row"), -1);
    }
}

TEST(Strings, EmptyIsNullOrWithoutCharacters) {
    EXPECT_TRUE(utIsEmptyString(nullptr));
    EXPECT_TRUE(utIsEmptyString(""));
    EXPECT_FALSE(utIsEmptyString(" "));
}

} // namespace
