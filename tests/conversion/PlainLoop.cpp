#include "tests/conversion/PlainLoop.h"

#include <algorithm>
#include <cmath>
#include <cstring>

#include "qltypes/conversion/BuiltInConversion.h"
#include "tests/conversion/Reference.h"

namespace conversiontest {

namespace {

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

} // namespace

const SlotTable<SlotReference> slotReferences =
    slotTable<SlotReference>([]<class S, class D, fxpModeRounding_tag rounding, fxpModeOverflow_tag overflow> {
        return slotReference<S, D, rounding, overflow>;
    });

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

std::string unlikeLoop(const SlotReference& slot, const Bytes& parts, Call call, std::size_t srcMisalignment,
                       std::size_t dstMisalignment) {
    constexpr std::size_t guard = 80;
    constexpr std::byte guardByte{0xa5};
    Bytes source(srcMisalignment);
    source.insert(source.end(), parts.begin(), parts.end());
    const Bytes sourceBefore = source;
    call.src = source.data() + srcMisalignment;
    const std::size_t begin = guard + dstMisalignment;
    const std::size_t written = (call.dstCount * slot.dstSize) << call.dstComplex;
    Bytes expected(begin + written + guard, guardByte);
    Bytes found = expected;
    call.dst = expected.data() + begin;
    const bool expectedResult = loopOver(slot, call);
    call.dst = found.data() + begin;
    if (convertAsAsked(slot, call) != expectedResult) return "the check says otherwise";
    if (source != sourceBefore) return "the source is written";
    if (found == expected) return "";
    for (std::size_t i = 0; i < written; i += slot.dstSize)
        if (!slot.same(&found[begin + i], &expected[begin + i])) return "part " + std::to_string(i / slot.dstSize);
    std::fill_n(found.begin() + static_cast<std::ptrdiff_t>(begin), written, guardByte);
    const bool guardsStand = std::all_of(found.begin(), found.end(), [](std::byte b) { return b == guardByte; });
    return guardsStand ? "" : "a guard byte is written";
}

} // namespace conversiontest
