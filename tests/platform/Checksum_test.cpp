#include <cstring>

#include <gtest/gtest.h>

#include "qlplatform/checksum/Checksum.h"

namespace {

TEST(Checksum, OfNothingIsTheDigestOfNothing) {
    // d41d8cd98f00b204e9800998ecf8427e
    const qlChecksumValue expected{{0xd98c1dd4, 0x04b2008f, 0x980980e9, 0x7e42f8ec}};
    EXPECT_EQ(qlChecksumRec().value(), expected);
}

TEST(Checksum, ItemsTheirBoundsTheirOrderAndTheirFormCount) {
    const auto of = [](std::initializer_list<const char*> items) {
        ut_md5ChecksumRec rec;
        for (const char* item : items)
            rec.addn(item, std::strlen(item));
        return rec.value();
    };
    EXPECT_EQ(of({"ab", "c"}), of({"ab", "c"}));
    EXPECT_NE(of({"ab", "c"}), of({"a", "bc"}));
    EXPECT_NE(of({"ab", "c"}), of({"c", "ab"}));
    EXPECT_NE(of({"abc"}), of({"abc", ""}));
    qlChecksumRec asLong;
    asLong.addLongItemToCheckSum("abc", 3);
    EXPECT_NE(asLong.value(), of({"abc"}));
}

TEST(Checksum, AValueCanBeTakenOnTheWay) {
    qlChecksumRec rec;
    rec.addn("a", 1);
    const qlChecksumValue first = rec.value();
    EXPECT_EQ(rec.value(), first);
    qlChecksumRec copy(rec);
    rec.addn("b", 1);
    EXPECT_NE(rec.value(), first);
    EXPECT_EQ(copy.value(), first);
    copy = rec;
    EXPECT_EQ(copy.value(), rec.value());
}

} // namespace
