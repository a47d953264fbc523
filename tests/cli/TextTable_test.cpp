#include "output/TextTable.h"

#include <gtest/gtest.h>

namespace {

using namespace inspector;

TextTable example() {
    TextTable table({{"size", Align::Right}, {"name", Align::Left}, {"unused", Align::Left}, {"notes", Align::Left}});
    table.addRow({"8", "x", "", ""});
    table.addRow({"1024", "µ", "", "wide"}, true);
    table.addRow({"", "longer", "", "n"});
    return table;
}

TEST(TextTable, ColumnsAreAlignedAndEmptyOnesLeftOut) {
    EXPECT_EQ(example().text("  ", Colours(false)), "  size  name    notes\n"
                                                    "     8  x\n"
                                                    "  1024  µ       wide\n"
                                                    "        longer  n\n");
}

TEST(TextTable, ColoursStandOutsideOfTheAlignment) {
    EXPECT_EQ(example().text("", Colours(true)), "\x1b[2msize  name    notes\x1b[0m\n"
                                                 "   8  x\n"
                                                 "\x1b[2m1024  µ       wide\x1b[0m\n"
                                                 "      longer  n\n");
}

} // namespace
