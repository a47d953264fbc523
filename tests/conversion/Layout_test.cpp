// Layouts, broadcasts and the check, on every level and slot, against the plain loop over elements.
#include <algorithm>
#include <cstring>

#include <gtest/gtest.h>

#include "qltypes/conversion/BuiltInConversion.h"
#include "tests/conversion/Reference.h"
#include "tests/conversion/Support.h"

namespace {

using namespace conversiontest;
using Bytes = std::vector<std::byte>;

// The reference for one slot, on elements as bytes.
struct SlotReference {
    Combination combination;
    std::size_t srcSize;
    std::size_t dstSize;
    bool srcBoolean;
    bool dstBoolean;
    bool neverLoses;
    void (*convert)(const std::byte* s, std::byte* d);
    bool (*keeps)(const std::byte* s, const std::byte* d);
    bool (*isZero)(const std::byte* s);
    bool (*same)(const std::byte* a, const std::byte* b);
    Bytes (*mixedValues)();
    Bytes (*zeroAndOne)(); // lost nowhere
    Bytes (*losers)();     // each value is lost in this cell
};

template <class T> T elementAt(const std::byte* p) {
    T v;
    std::memcpy(&v, p, sizeof v);
    return v;
}

template <class T> Bytes bytesOf(const std::vector<T>& values) {
    Bytes bytes(values.size() * sizeof(T));
    std::memcpy(bytes.data(), values.data(), bytes.size());
    return bytes;
}

template <class S> std::vector<S> chosenValues() {
    std::vector<S> chosen;
    if constexpr (isFloating<S>)
        for (const double v :
             {0.0,          -0.0,          1.0,           0.5,          -0.5,         1.5,     2.5,   -2.5,
              126.5,        127.0,         127.5,         128.0,        -128.5,       -129.0,  255.0, 255.5,
              256.0,        300.25,        32767.5,       -32768.5,     65535.0,      65536.0, 1e9,   2147483647.0,
              2147483648.0, -2147483648.0, -2147483649.0, 4294967295.0, 4294967296.0, 1e12,    -1e18, 1e20,
              1.1e24,       3e38,          HUGE_VAL,      -HUGE_VAL,    std::nan("")})
            chosen.push_back(static_cast<S>(v));
    else
        for (const std::int64_t v :
             {0,     1,     2,     3,        100,        127, 128, 200,  255,  256,    1000,   32767,
              32768, 65535, 65536, 16777217, 2147483647, -1,  -2,  -128, -129, -32768, -32769, -65536})
            chosen.push_back(static_cast<S>(v));
    return chosen;
}

template <class S, class D> bool keepsNumber(const std::byte* s, const std::byte* d) {
    return reference::equal(reference::valueOf(elementAt<S>(s)), reference::valueOf(elementAt<D>(d)));
}

template <class S, class D, fxpModeRounding_tag rounding, fxpModeOverflow_tag overflow>
constexpr SlotReference slotReference = {
    .combination = {idOf<S>, idOf<D>, rounding, overflow},
    .srcSize = sizeof(S),
    .dstSize = sizeof(D),
    .srcBoolean = isBoolean<S>,
    .dstBoolean = isBoolean<D>,
    .neverLoses = holdsEveryValue<S, D>(),
    .convert =
        [](const std::byte* s, std::byte* d) {
            const D v = reference::convert<S, D>(elementAt<S>(s), rounding, overflow);
            std::memcpy(d, &v, sizeof v);
        },
    .keeps = keepsNumber<S, D>,
    .isZero =
        [](const std::byte* s) {
            const reference::Value v = reference::valueOf(elementAt<S>(s));
            return v.kind == reference::Kind::finite && v.exact.magnitude == 0;
        },
    .same =
        [](const std::byte* a, const std::byte* b) {
            if constexpr (isFloating<D>)
                if (std::isnan(elementAt<D>(a)) && std::isnan(elementAt<D>(b))) return true;
            return std::memcmp(a, b, sizeof(D)) == 0;
        },
    .mixedValues = [] { return bytesOf(chosenValues<S>()); },
    .zeroAndOne =
        [] {
            return bytesOf(std::vector<S>{static_cast<S>(0), static_cast<S>(1)});
        },
    .losers =
        [] {
            std::vector<S> lost;
            for (const S v : chosenValues<S>()) {
                const D d = reference::convert<S, D>(v, rounding, overflow);
                if (!reference::equal(reference::valueOf(v), reference::valueOf(d))) lost.push_back(v);
            }
            return bytesOf(lost);
        },
};

const SlotTable<SlotReference> slotReferences =
    slotTable<SlotReference>([]<class S, class D, fxpModeRounding_tag rounding, fxpModeOverflow_tag overflow> {
        return slotReference<S, D, rounding, overflow>;
    });

struct Call {
    const std::byte* src;
    std::byte* dst;
    std::size_t srcCount;
    std::size_t dstCount;
    bool srcComplex;
    bool dstComplex;
    bool check;
};

// The loop over elements as it is told, and the second one that compares.
bool loopOver(const SlotReference& slot, const Call& call) {
    const bool toBoolean = slot.dstBoolean && !slot.srcBoolean;
    const bool dstComplex = call.dstComplex && !toBoolean;
    const bool isBroadcast = toBoolean ? call.srcCount == 1 : call.srcCount <= 1;
    bool kept = true;
    for (std::size_t i = 0; i < call.dstCount; ++i) {
        const std::byte* real = call.src + ((isBroadcast ? 0 : i) << call.srcComplex) * slot.srcSize;
        const std::byte* imaginary = real + slot.srcSize;
        std::byte* d = call.dst + (i << dstComplex) * slot.dstSize;
        slot.convert(real, d);
        if (dstComplex && call.srcComplex) slot.convert(imaginary, d + slot.dstSize);
        if (dstComplex && !call.srcComplex) std::memset(d + slot.dstSize, 0, slot.dstSize);
        if (toBoolean && call.srcComplex && !slot.isZero(imaginary)) *d = std::byte{1};

        kept = kept && slot.keeps(real, d);
        if (call.srcComplex)
            kept = kept && (dstComplex ? slot.keeps(imaginary, d + slot.dstSize) : slot.isZero(imaginary));
    }
    return kept || !call.check || slot.neverLoses;
}

bool convertAsAsked(const SlotReference& slot, const Call& call) {
    const Combination& c = slot.combination;
    return utGetQlBuiltinDtypeConvFcn(c.srcId, c.dstId, c.overflow, c.rounding)(
        call.src, call.dst, call.srcCount, call.dstCount, call.srcComplex, call.dstComplex, call.check, c.srcId,
        c.dstId, c.overflow, c.rounding);
}

constexpr std::size_t guard = 80;
constexpr std::byte guardByte{0xa5};

// `count` parts picked from a pool in an order without a short period.
Bytes pick(const Bytes& pool, std::size_t size, std::size_t count, std::size_t from) {
    Bytes parts(count * size);
    for (std::size_t i = 0; i < count; ++i)
        std::memcpy(&parts[i * size], &pool[(from + i * 7 + i / 5) % (pool.size() / size) * size], size);
    return parts;
}

// Runs one call on memory with guards, at odd addresses, and compares every byte with the plain loop.
void expectLikeLoop(const SlotReference& slot, const Bytes& parts, Call call, std::size_t misalignment) {
    Bytes source(misalignment + parts.size());
    std::copy(parts.begin(), parts.end(), source.begin() + static_cast<std::ptrdiff_t>(misalignment));
    call.src = source.data() + misalignment;
    const std::size_t written = (call.dstCount * slot.dstSize) << call.dstComplex;
    Bytes expected(guard + misalignment + written + guard, guardByte);
    Bytes found = expected;
    call.dst = expected.data() + guard + misalignment;
    const bool expectedResult = loopOver(slot, call);
    call.dst = found.data() + guard + misalignment;
    ASSERT_EQ(convertAsAsked(slot, call), expectedResult);
    ASSERT_TRUE(std::equal(source.begin() + static_cast<std::ptrdiff_t>(misalignment), source.end(), parts.begin()));
    if (found == expected) return;
    for (std::size_t i = 0; i < written; i += slot.dstSize)
        ASSERT_TRUE(slot.same(&found[guard + misalignment + i], &expected[guard + misalignment + i]))
            << "part " << i / slot.dstSize;
    std::fill_n(found.begin() + static_cast<std::ptrdiff_t>(guard + misalignment), written, guardByte);
    ASSERT_TRUE(std::count(found.begin(), found.end(), guardByte) == static_cast<std::ptrdiff_t>(found.size()))
        << "a guard byte was written";
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
