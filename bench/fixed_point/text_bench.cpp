// Texts of number types: reading and writing them for the first time and again, beside one match of the same grammar by
// boost::regex.
#include <string>
#include <vector>

#include <benchmark/benchmark.h>
#include <boost/regex.hpp>

#include "qltypes/fixed_point/ConstructorString.h"
#include "qltypes/fixed_point/IdentifierString.h"
#include "qltypes/fixed_point/TypeNames.h"

namespace {

/// The `index`-th of an endless row of different records: plain powers of two, slopes and biases in turn.
fxpDataTypeProp propAt(std::size_t index) {
    const int wordLength = 65 + static_cast<int>(index / 64);
    const int exponent = static_cast<int>(index % 64) - 32;
    switch (index % 4) {
    case 0:
        return {FXP_DT_FIXPT, 1, wordLength, 0, exponent, 1.0, 0.0, 0};
    case 1:
        return {FXP_DT_SCALED_DOUBLE, 0, wordLength, 0, exponent, 1.0, 0.0, 0};
    case 2:
        return {FXP_DT_FIXPT, 1, wordLength, 0, exponent, 1.6, 0.0, 0};
    default:
        return {FXP_DT_FIXPT, 0, wordLength, 0, exponent, 1.25, -2.5, 0};
    }
}

/// Identifier texts as propAt would be written, without asking the library, which would remember them.
std::string identifierAt(std::size_t index) {
    const std::string wordLength = std::to_string(65 + index / 64);
    const std::string number = std::to_string(index % 64 + 1);
    switch (index % 4) {
    case 0:
        return "sfix" + wordLength + "_En" + number;
    case 1:
        return "fltu" + wordLength + "_E" + number;
    case 2:
        return "sfix" + wordLength + "_S" + number + "p125en6";
    default:
        return "ufix" + wordLength + "_S" + number + "p25_Bn" + number + "p5";
    }
}

std::string constructorAt(std::size_t index) {
    const std::string wordLength = std::to_string(65 + index / 64);
    const std::string number = std::to_string(index % 64 + 1);
    switch (index % 4) {
    case 0:
        return "fixdt(1," + wordLength + ',' + number + ')';
    case 1:
        return "numerictype(0," + wordLength + ',' + number + ",'DataType','ScaledDouble')";
    case 2:
        return "fixdt(1," + wordLength + ",1." + number + "e-6,0)";
    default:
        return "fixdt(0," + wordLength + ",1.25," + number + ",-2.5)";
    }
}

template <class MakeText> std::vector<std::string> texts(std::size_t first, std::size_t count, MakeText makeText) {
    std::vector<std::string> result;
    for (std::size_t i = 0; i < count; ++i)
        result.push_back(makeText(first + i));
    return result;
}

/// Where a benchmark of first readings or writings goes on: nothing may be met twice in the process.
std::size_t nextNew = 1000000;

/// Each of `range(0)` texts in turn, all read before.
template <class MakeText, class Use> void again(benchmark::State& state, MakeText makeText, Use use) {
    const std::vector<std::string> known = texts(0, static_cast<std::size_t>(state.range(0)), makeText);
    for (const std::string& text : known)
        use(text);
    std::size_t next = 0;
    for (auto _ : state) {
        benchmark::DoNotOptimize(use(known[next]));
        if (++next == known.size()) next = 0;
    }
    state.SetItemsProcessed(state.iterations());
}

/// A text that was never met before at each turn.
template <class MakeText, class Use> void firstTime(benchmark::State& state, MakeText makeText, Use use) {
    const std::size_t count = static_cast<std::size_t>(state.max_iterations);
    const std::vector<std::string> unknown = texts(nextNew, count, makeText);
    nextNew += count;
    std::size_t next = 0;
    for (auto _ : state)
        benchmark::DoNotOptimize(use(unknown[next++]));
    state.SetItemsProcessed(state.iterations());
}

const auto readIdentifier = [](const std::string& text) { return &identifierStringToFxpDataType(text); };
const auto readConstructor = [](const std::string& text) { return &constructorStringToFxpDataType(text); };

void identifierReadAgain(benchmark::State& state) { again(state, identifierAt, readIdentifier); }
void identifierReadFirst(benchmark::State& state) { firstTime(state, identifierAt, readIdentifier); }
void constructorReadAgain(benchmark::State& state) { again(state, constructorAt, readConstructor); }
void constructorReadFirst(benchmark::State& state) { firstTime(state, constructorAt, readConstructor); }

/// The same without a std::string in the caller's hand.
void identifierReadAgainFromChars(benchmark::State& state) {
    again(state, identifierAt, [](const std::string& text) { return &identifierStringToFxpDataType(text.c_str()); });
}

void identifierMatch(benchmark::State& state) {
    again(state, identifierAt,
          [](const std::string& text) { return FXP::doesQLTypeNameMatchFixptPattern(text.c_str()); });
}

void identifierMatchByBoostRegex(benchmark::State& state) {
    const boost::regex pattern(
        "([su]fix|flt[su])[1-9][0-9]*((_F1p[0-9]*[1-9])?(_En?[1-9][0-9]*)|(_S([1-9][0-9]*(p[0-9]*[1-9])?|p[0-9]*[1-9])"
        "(en?[1-9][0-9]*)?))?(_Bn?([1-9][0-9]*(p[0-9]*[1-9])?|p[0-9]*[1-9])(en?[1-9][0-9]*)?)?");
    again(state, identifierAt, [&](const std::string& text) { return boost::regex_match(text, pattern); });
}

template <class Write> void writeAgain(benchmark::State& state, Write write) {
    std::vector<fxpDataTypeProp> known;
    for (std::size_t i = 0; i < static_cast<std::size_t>(state.range(0)); ++i)
        write(known.emplace_back(propAt(i)));
    std::size_t next = 0;
    for (auto _ : state) {
        benchmark::DoNotOptimize(write(known[next]));
        if (++next == known.size()) next = 0;
    }
    state.SetItemsProcessed(state.iterations());
}

template <class Write> void writeFirst(benchmark::State& state, Write write) {
    std::size_t next = nextNew;
    for (auto _ : state)
        benchmark::DoNotOptimize(write(propAt(next++)));
    nextNew = next;
    state.SetItemsProcessed(state.iterations());
}

const auto writeIdentifier = [](const fxpDataTypeProp& prop) { return &fxpDataTypeToIdentifierString(&prop); };
const auto writeConstructor = [](const fxpDataTypeProp& prop) {
    return &fxpDataTypeToConstructorString(prop, FxpDT::PreferFixdt, FxpDT::PreferFractionLength);
};

void identifierWriteAgain(benchmark::State& state) { writeAgain(state, writeIdentifier); }
void identifierWriteFirst(benchmark::State& state) { writeFirst(state, writeIdentifier); }
void constructorWriteAgain(benchmark::State& state) { writeAgain(state, writeConstructor); }
void constructorWriteFirst(benchmark::State& state) { writeFirst(state, writeConstructor); }

// The limits: read again 40 ns, read for the first time 3000 ns. First times run a fixed number of turns, since what
// they meet is remembered for good.
constexpr int firstTimes = 200000;

BENCHMARK(identifierReadAgain)->Arg(8)->Arg(1000)->Arg(50000);
BENCHMARK(identifierReadAgainFromChars)->Arg(8)->Arg(1000);
BENCHMARK(identifierReadFirst)->Iterations(firstTimes);
BENCHMARK(identifierMatch)->Arg(1000);
BENCHMARK(identifierMatchByBoostRegex)->Arg(1000);
BENCHMARK(constructorReadAgain)->Arg(8)->Arg(1000)->Arg(50000);
BENCHMARK(constructorReadFirst)->Iterations(firstTimes);
BENCHMARK(identifierWriteAgain)->Arg(8)->Arg(1000)->Arg(50000);
BENCHMARK(identifierWriteFirst)->Iterations(firstTimes);
BENCHMARK(constructorWriteAgain)->Arg(8)->Arg(1000)->Arg(50000);
BENCHMARK(constructorWriteFirst)->Iterations(firstTimes);

} // namespace

BENCHMARK_MAIN();
