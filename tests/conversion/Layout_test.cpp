// Layouts, broadcasts and the check, on every level and slot, against the plain loop over elements.
#include <algorithm>
#include <cstring>

#include <gtest/gtest.h>

#include "tests/conversion/PlainLoop.h"

namespace {

using namespace conversiontest;

// `count` parts picked from a pool in an order without a short period.
Bytes pick(const Bytes& pool, std::size_t size, std::size_t count, std::size_t from) {
    Bytes parts(count * size);
    for (std::size_t i = 0; i < count; ++i)
        std::memcpy(&parts[i * size], &pool[(from + i * 7 + i / 5) % (pool.size() / size) * size], size);
    return parts;
}

void expectLikeLoop(const SlotReference& slot, const Bytes& parts, const Call& call, std::size_t misalignment) {
    ASSERT_EQ(unlikeLoop(slot, parts, call, misalignment, misalignment), "");
}

std::string callText(const SlotReference& slot, const Level& level, const Call& call) {
    const Combination& c = slot.combination;
    return combinationName(c.srcId, c.dstId, c.rounding, c.overflow) + ", level " + level.name + ", " +
           std::to_string(call.srcCount) + (call.srcComplex ? " complex" : " real") + " to " +
           std::to_string(call.dstCount) + (call.dstComplex ? " complex" : " real") + (call.check ? ", checked" : "");
}

// Every layout of `dstCount` elements, stepping and broadcast, with and without check.
void expectEveryLayout(const SlotReference& slot, const Level& level, const Bytes& pool, std::size_t dstCount) {
    for (const bool srcComplex : {false, true})
        for (const bool dstComplex : {false, true})
            for (const bool check : {false, true})
                for (const std::size_t srcCount : {dstCount, std::size_t{1}, std::size_t{0}}) {
                    const Call call = {nullptr, nullptr, srcCount, dstCount, srcComplex, dstComplex, check};
                    const Bytes parts = pick(pool, slot.srcSize, (dstCount + 1) * 2, dstCount * 5 + srcCount);
                    expectLikeLoop(slot, parts, call, dstCount % 4);
                    ASSERT_FALSE(testing::Test::HasFatalFailure()) << callText(slot, level, call);
                }
}

TEST(ConversionLayout, EveryLayoutOfEverySlotIsThePlainLoop) {
    onEachLevel([](const Level& level) {
        for (const SlotReference& slot : slotReferences) {
            const Bytes mixed = slot.mixedValues();
            for (const std::size_t count : {0, 1, 2, 3, 4, 5, 7, 8, 9, 15, 16, 17, 31, 33, 63, 65, 130, 257, 777}) {
                expectEveryLayout(slot, level, mixed, count);
                ASSERT_FALSE(HasFatalFailure());
            }
        }
    });
}

TEST(ConversionLayout, ALossIsFoundAtEveryPlace) {
    constexpr std::size_t numParts = 150;
    onEachLevel([](const Level& level) {
        for (const SlotReference& slot : slotReferences) {
            if (slot.neverLoses) continue;
            const std::size_t size = slot.srcSize;
            const Bytes losers = slot.losers();
            const Bytes keepers = slot.zeroAndOne();
            for (const bool complex : {false, true}) {
                if (complex && slot.dstBoolean) continue; // ones as imaginary parts are losses already
                const Call call = {nullptr, nullptr, numParts >> complex, numParts >> complex, complex, complex, true};
                for (std::size_t place = 0; place < numParts; ++place) {
                    Bytes parts = pick(keepers, size, numParts, place);
                    std::copy_n(&losers[place * size % losers.size()], size, &parts[place * size]);
                    expectLikeLoop(slot, parts, call, 0);
                    ASSERT_FALSE(HasFatalFailure()) << callText(slot, level, call) << ", loser at " << place;
                }
                expectLikeLoop(slot, pick(keepers, size, numParts, 3), call, 0);
                ASSERT_FALSE(HasFatalFailure()) << callText(slot, level, call) << ", no loser";
            }
        }
    });
}

TEST(ConversionLayout, ADroppedImaginaryPartIsFoundAtEveryPlace) {
    constexpr std::size_t numPairs = 70;
    onEachLevel([](const Level& level) {
        for (const SlotReference& slot : slotReferences) {
            if (slot.neverLoses) continue;
            const Bytes keepers = slot.zeroAndOne();
            const Call call = {nullptr, nullptr, numPairs, numPairs, true, false, true};
            Bytes parts(2 * numPairs * slot.srcSize);
            expectLikeLoop(slot, parts, call, 0);
            for (std::size_t place = 0; place < numPairs; ++place) {
                std::byte* const imaginary = &parts[(2 * place + 1) * slot.srcSize];
                std::copy_n(&keepers[slot.srcSize], slot.srcSize, imaginary);
                expectLikeLoop(slot, parts, call, 0);
                std::fill_n(imaginary, slot.srcSize, std::byte{0});
                ASSERT_FALSE(HasFatalFailure()) << callText(slot, level, call) << ", imaginary part at " << place;
            }
        }
    });
}

TEST(ConversionLayout, SourceAndDestinationMayBeTheSame) {
    onEachLevel([](const Level& level) {
        for (const SlotReference& slot : slotReferences) {
            if (slot.srcSize != slot.dstSize) continue;
            const Bytes pool = slot.mixedValues();
            for (const auto& [srcComplex, dstComplex] : {std::pair{false, false}, {true, true}, {true, false}})
                for (const bool check : {false, true})
                    for (const std::size_t count : {1, 5, 16, 37, 64, 200, 777, 2000}) {
                        Call call = {nullptr, nullptr, count, count, srcComplex, dstComplex, check};
                        const Bytes source = pick(pool, slot.srcSize, 2 * count, count);
                        Bytes expected = source, found = source;
                        call.src = source.data();
                        call.dst = expected.data();
                        const bool expectedResult = loopOver(slot, call);
                        call.src = call.dst = found.data();
                        ASSERT_EQ(convertAsAsked(slot, call), expectedResult) << callText(slot, level, call);
                        ASSERT_EQ(found, expected) << callText(slot, level, call);
                    }
        }
    });
}

class CachedBytes {
  public:
    explicit CachedBytes(std::size_t bytes) : before_(cachedBytes) { cachedBytes = bytes; }
    ~CachedBytes() { cachedBytes = before_; }

  private:
    std::size_t before_;
};

TEST(ConversionLayout, PastTheCachesAsThroughThem) {
    const CachedBytes few(100);
    onEachLevel([](const Level& level) {
        for (const SlotReference& slot : slotReferences) {
            const Bytes mixed = slot.mixedValues();
            for (const std::size_t count : {40, 255, 777})
                expectEveryLayout(slot, level, mixed, count);
            ASSERT_FALSE(HasFatalFailure());
        }
    });
}

TEST(ConversionLayout, LongVectorsPastTheCaches) {
    const CachedBytes few(1000);
    onEachLevel([](const Level& level) {
        for (const std::size_t slot :
             {slotOf(0, 2, FXP_OVERFLOW_SATURATE, FXP_ROUND_FLOOR), slotOf(3, 0, FXP_OVERFLOW_WRAP, FXP_ROUND_ZERO),
              slotOf(6, 7, FXP_OVERFLOW_SATURATE, FXP_ROUND_ZERO), slotOf(1, 8, FXP_OVERFLOW_WRAP, FXP_ROUND_ZERO)}) {
            const SlotReference& reference = slotReferences[slot];
            expectEveryLayout(reference, level, reference.mixedValues(), 21003); // several pages in turn, and a rest
            ASSERT_FALSE(HasFatalFailure());
            const Call call = {nullptr, nullptr, 70001, 70001, false, false, false};
            expectLikeLoop(reference, pick(reference.mixedValues(), reference.srcSize, 70001, 1), call, 3);
            ASSERT_FALSE(HasFatalFailure()) << callText(reference, level, call);
        }
    });
}

TEST(ConversionLayout, ABroadcastReadsOneElementOnly) {
    for (const SlotReference& slot : slotReferences)
        for (const bool complex : {false, true}) {
            // The element ends where the memory of this vector ends: reading on would be seen by the sanitizer.
            const Bytes one = pick(slot.mixedValues(), slot.srcSize, 1U << complex, 3);
            Bytes written((5 * slot.dstSize) << complex), expected = written;
            Call call = {one.data(), written.data(), 1, 5, complex, complex, true};
            const bool result = convertAsAsked(slot, call);
            call.dst = expected.data();
            EXPECT_EQ(loopOver(slot, call), result);
            EXPECT_EQ(written, expected);
        }
}

} // namespace
