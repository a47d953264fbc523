// The constraint store: 100,000 statements over 20,000 symbols with questions between and after them, and shapes on
// which following every chain of edges would not end. Questions are timed one by one; counters give the median and the
// 99th percentile in microseconds.
#include <algorithm>
#include <chrono>
#include <random>
#include <string>
#include <vector>

#include <benchmark/benchmark.h>

#include "qlplatform/services/IException.h"
#include "qltypes/dimensions/SymbolicDimsTable.h"

class QLBlock {};

namespace {

using QLTypeSys::SymbolicDimsConstraints;
using QLTypeSys::SymbolicDimsString;
using QLTypeSys::SymbolicDimsTable;

constexpr int numStatements = 100'000;
constexpr int numSymbols = 20'000;

class Store {
  public:
    explicit Store(int count) : constraints(&table) {
        for (int i = 0; i < count; ++i)
            symbols.push_back(SymbolicDimsString(table, "x" + std::to_string(i)).getId());
    }

    SymbolicDimsTable table;
    SymbolicDimsConstraints constraints;
    std::vector<int> symbols;
};

/// Times of single questions.
class Times {
  public:
    template <class Question> void add(const Question& question) {
        const auto begin = std::chrono::steady_clock::now();
        benchmark::DoNotOptimize(question());
        const auto end = std::chrono::steady_clock::now();
        micros_.push_back(std::chrono::duration<double, std::micro>(end - begin).count());
    }
    void report(benchmark::State& state, const std::string& name) {
        if (micros_.empty()) return;
        std::sort(micros_.begin(), micros_.end());
        state.counters[name + "50"] = micros_[micros_.size() / 2];
        state.counters[name + "99"] = micros_[micros_.size() * 99 / 100];
    }

  private:
    std::vector<double> micros_;
};

struct Questions {
    Times equal, greater, range;
    void ask(const Store& store, std::mt19937& random) {
        const int a = store.symbols[random() % store.symbols.size()];
        const int b = store.symbols[random() % store.symbols.size()];
        equal.add([&] { return store.constraints.isEqual(a, b); });
        greater.add([&] { return store.constraints.isGreaterThan(a, b); });
        range.add([&] { return store.constraints.getRange(a); });
    }
    void report(benchmark::State& state, const std::string& when) {
        equal.report(state, when + "Equal");
        greater.report(state, when + "Greater");
        range.report(state, when + "Range");
    }
};

// What a mix states: parts of equalities, greater-thans and bounds. Greater-thans are stated between any two symbols
// and mostly refused once there are many, or downwards only, so that all of them hold.
struct Mix {
    const char* name;
    unsigned equal, greater, bound;
    bool downwards;
};
constexpr Mix mixes[] = {
    {"even", 1, 1, 1, false},       {"even, downwards", 1, 1, 1, true},
    {"order", 0, 3, 1, false},      {"order, downwards", 0, 3, 1, true},
    {"order only", 0, 1, 0, false}, {"order only, downwards", 0, 1, 0, true},
    {"equality", 3, 1, 1, false},
};

void statements(benchmark::State& state) {
    const Mix& mix = mixes[state.range(0)];
    state.SetLabel(mix.name);
    Questions between, after;
    double refused = 0;
    for (auto _ : state) {
        std::mt19937 random(7);
        Store store(numSymbols);
        QLBlock blocks[16];
        const auto any = [&] { return store.symbols[random() % store.symbols.size()]; };
        for (int i = 0; i < numStatements; ++i) {
            int a = any(), b = any();
            const int value = static_cast<int>(random() % 1'000'000);
            const QLBlock* const block = &blocks[random() % 16];
            const unsigned kind = static_cast<unsigned>(random()) % (mix.equal + mix.greater + mix.bound);
            try {
                if (kind < mix.equal) {
                    store.constraints.addEqual(a, b, block);
                } else if (kind < mix.equal + mix.greater) {
                    if (mix.downwards && a > b) std::swap(a, b);
                    store.constraints.addGreaterThan(a, b, block);
                } else if (value % 2 == 0) {
                    store.constraints.addGreaterThanValue(a, value / 4, block);
                } else {
                    store.constraints.addRange(a, value / 4, value / 2 + 300'000, block, QLTypeSys::generateBothBounds);
                }
            } catch (const foundation::core::except::IException&) {
                ++refused;
            }
            state.PauseTiming();
            between.ask(store, random);
            state.ResumeTiming();
        }
        state.PauseTiming();
        for (int i = 0; i < 20'000; ++i)
            after.ask(store, random);
        state.ResumeTiming();
    }
    state.SetItemsProcessed(state.iterations() * numStatements);
    state.counters["refused"] = refused / static_cast<double>(state.iterations());
    between.report(state, "");
    after.report(state, "after");
}
BENCHMARK(statements)->DenseRange(0, std::size(mixes) - 1)->Unit(benchmark::kMillisecond)->Iterations(1);

// Statements alone, without a question between them.
void statementsOnly(benchmark::State& state) {
    const Mix& mix = mixes[state.range(0)];
    state.SetLabel(mix.name);
    for (auto _ : state) {
        std::mt19937 random(7);
        Store store(numSymbols);
        const auto any = [&] { return store.symbols[random() % store.symbols.size()]; };
        for (int i = 0; i < numStatements; ++i) {
            int a = any(), b = any();
            const unsigned kind = static_cast<unsigned>(random()) % (mix.equal + mix.greater + mix.bound);
            try {
                if (kind < mix.equal) {
                    store.constraints.addEqual(a, b, nullptr);
                } else if (kind < mix.equal + mix.greater) {
                    if (mix.downwards && a > b) std::swap(a, b);
                    store.constraints.addGreaterThan(a, b, nullptr);
                } else {
                    store.constraints.addGreaterThanValue(a, static_cast<int>(random() % 250'000), nullptr);
                }
            } catch (const foundation::core::except::IException&) {
            }
        }
    }
    state.SetItemsProcessed(state.iterations() * numStatements);
}
BENCHMARK(statementsOnly)->DenseRange(0, std::size(mixes) - 1)->Unit(benchmark::kMillisecond)->Iterations(1);

// 60 diamonds on top of each other: 2^60 chains from the top to the bottom. Each question after a change at the bottom.
void ladder(benchmark::State& state) {
    constexpr std::size_t numDiamonds = 60;
    Store store(3 * numDiamonds + 2);
    const std::vector<int>& x = store.symbols;
    SymbolicDimsConstraints& known = store.constraints;
    for (std::size_t i = 0; i < numDiamonds; ++i) {
        const std::size_t top = 3 * i;
        known.addGreaterThan(x[top], x[top + 1], nullptr);
        known.addGreaterThan(x[top], x[top + 2], nullptr);
        known.addGreaterThan(x[top + 1], x[top + 3], nullptr);
        known.addGreaterThan(x[top + 2], x[top + 3], nullptr);
    }
    const int top = x[0], bottom = x[3 * numDiamonds], apart = x.back();
    Times equal, chain, noChain, back, range;
    int bound = 0;
    for (auto _ : state) {
        known.addGreaterThanValue(bottom, ++bound, nullptr);
        equal.add([&] { return known.isEqual(top, bottom); });
        chain.add([&] { return known.isGreaterThan(top, bottom); });
        noChain.add([&] { return known.isGreaterThan(top, apart); });
        back.add([&] { return known.isGreaterThan(bottom, top); });
        range.add([&] { return known.getRange(top); });
    }
    equal.report(state, "Equal");
    chain.report(state, "Chain");
    noChain.report(state, "NoChain");
    back.report(state, "Back");
    range.report(state, "Range");
}
BENCHMARK(ladder);

// A chain of 100,000 edges or equalities, stated from its top down, from its bottom up, or in any order.
enum Direction { Down, Up, Shuffled };
std::vector<int> chainOrder(Direction direction) {
    std::vector<int> order(numStatements);
    for (int i = 0; i < numStatements; ++i)
        order[static_cast<std::size_t>(i)] = direction == Up ? numStatements - 1 - i : i;
    if (direction == Shuffled) std::shuffle(order.begin(), order.end(), std::mt19937(11));
    return order;
}

void chain(benchmark::State& state) {
    const bool equal = state.range(0) != 0;
    const auto direction = static_cast<Direction>(state.range(1));
    state.SetLabel(std::string(equal ? "equal, " : "greater, ") + (direction == Down ? "downwards"
                                                                   : direction == Up ? "upwards"
                                                                                     : "any order"));
    const std::vector<int> order = chainOrder(direction);
    Questions after;
    Times ends;
    for (auto _ : state) {
        Store store(numStatements + 1);
        for (const int i : order) {
            const int a = store.symbols[static_cast<std::size_t>(i)],
                      b = store.symbols[static_cast<std::size_t>(i + 1)];
            if (equal)
                store.constraints.addEqual(a, b, nullptr);
            else
                store.constraints.addGreaterThan(a, b, nullptr);
        }
        state.PauseTiming();
        std::mt19937 random(7);
        const int top = store.symbols.front(), bottom = store.symbols.back();
        ends.add([&] { return store.constraints.getRange(top); });
        ends.add([&] { return store.constraints.isEqual(top, bottom); });
        ends.add([&] { return store.constraints.isGreaterThan(top, bottom); });
        for (int i = 0; i < 1000; ++i)
            after.ask(store, random);
        state.ResumeTiming();
    }
    state.SetItemsProcessed(state.iterations() * numStatements);
    ends.report(state, "ends");
    after.report(state, "after");
}
BENCHMARK(chain)->ArgsProduct({{0, 1}, {Down, Up, Shuffled}})->Unit(benchmark::kMillisecond)->Iterations(1);

} // namespace

BENCHMARK_MAIN();
