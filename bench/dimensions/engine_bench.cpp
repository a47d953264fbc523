// The expression engine against GiNaC, on the same work in the same program; and what handles and the table cost.
#include <algorithm>
#include <numeric>
#include <random>
#include <string>
#include <vector>

#include <benchmark/benchmark.h>
#ifdef QLTYPES_HAVE_GINAC
#include <ginac/ginac.h>
#endif

#include "qlplatform/symbolic/SymbolicExprSimplify.h"
#include "qltypes/dimensions/SymbolicDimsTable.h"

namespace {

using QL::SymbolicOp;

constexpr int numSymbols = 20;
constexpr int numExpressions = 10'000;
constexpr int wideSum = 50'000;

// Our side: expressions are ids of a table.
class Engine {
  public:
    using Expr = unsigned long;
    Expr symbol(int i) { return table_.addSymbol("x" + std::to_string(i)); }
    Expr number(int value) { return table_.addInt(value); }
    Expr add(Expr a, Expr b) { return table_.add(SymbolicOp::Plus, a, b); }
    Expr multiply(Expr a, Expr b) { return table_.add(SymbolicOp::Multiply, a, b); }
    Expr divide(Expr a, Expr b) { return table_.add(SymbolicOp::Divide, a, b); }
    Expr modulo(Expr a, Expr b) { return table_.add(SymbolicOp::Modulo, a, b); }
    Expr simplified(Expr e) {
        unsigned long scratch = 0;
        return QL::SymbolicExprSimplify(table_, 10, false).simplify(e, scratch);
    }

  private:
    QL::SymbolicExprTable table_{QL::SymbolDomain::Integers};
};

#ifdef QLTYPES_HAVE_GINAC
DECLARE_FUNCTION_2P(modulo)
REGISTER_FUNCTION(modulo, dummy())

// GiNaC has no modulo: a function without a rule, whose operand is normalised first.
class Ginac {
  public:
    using Expr = GiNaC::ex;
    Expr symbol(int i) {
        while (static_cast<int>(symbols_.size()) <= i)
            symbols_.emplace_back("x" + std::to_string(symbols_.size()));
        return symbols_[static_cast<std::size_t>(i)];
    }
    Expr number(int value) { return value; }
    Expr add(const Expr& a, const Expr& b) { return a + b; }
    Expr multiply(const Expr& a, const Expr& b) { return a * b; }
    Expr divide(const Expr& a, const Expr& b) { return a / b; }
    Expr modulo(const Expr& a, const Expr& b) { return ::modulo(a.normal(), b); }
    Expr simplified(const Expr& e) { return e.normal(); }

  private:
    std::vector<GiNaC::symbol> symbols_;
};
#endif

// Every benchmark builds a new system each time, so that nothing is remembered between rounds.
template <class System> void smallExpressions(benchmark::State& state) {
    for (auto _ : state) {
        System s;
        std::mt19937 random(1);
        const auto any = [&] { return s.symbol(static_cast<int>(random() % numSymbols)); };
        const auto two = s.number(2);
        for (int i = 0; i < numExpressions; ++i) {
            const auto k = any(), l = any(), m = any();
            const auto e = s.modulo(s.divide(s.add(s.multiply(k, l), s.multiply(two, k)), two), m);
            benchmark::DoNotOptimize(s.simplified(e));
        }
    }
    state.SetItemsProcessed(state.iterations() * numExpressions);
}

template <class System> void sumsOf50(benchmark::State& state) {
    for (auto _ : state) {
        System s;
        std::mt19937 random(2);
        const auto any = [&] { return s.symbol(static_cast<int>(random() % numSymbols)); };
        for (int i = 0; i < 200; ++i) {
            auto sum = any();
            for (int t = 1; t < 50; ++t)
                sum = s.add(sum, s.multiply(any(), any()));
            benchmark::DoNotOptimize(s.simplified(sum));
        }
    }
    state.SetItemsProcessed(state.iterations() * 200);
}

template <class System> void productsOf50(benchmark::State& state) {
    for (auto _ : state) {
        System s;
        std::mt19937 random(3);
        for (int i = 0; i < 200; ++i) {
            auto product = s.symbol(0);
            for (int t = 1; t < 50; ++t)
                product = s.multiply(product, s.symbol(static_cast<int>(random() % numSymbols)));
            benchmark::DoNotOptimize(s.simplified(product));
        }
    }
    state.SetItemsProcessed(state.iterations() * 200);
}

template <class System> void deepNests(benchmark::State& state) {
    for (auto _ : state) {
        System s;
        for (int i = 0; i < numSymbols; ++i) { // continued fractions
            auto e = s.symbol(i);
            for (int depth = 1; depth < 12; ++depth)
                e = s.add(s.symbol((i + depth) % numSymbols), s.divide(s.number(1), e));
            benchmark::DoNotOptimize(s.simplified(e));
        }
    }
    state.SetItemsProcessed(state.iterations() * numSymbols);
}

template <class System> void squaredFortyTimes(benchmark::State& state) {
    for (auto _ : state) {
        System s;
        for (int i = 0; i < 100; ++i) {
            auto e = s.symbol(i);
            for (int depth = 0; depth < 40; ++depth)
                e = s.multiply(e, e);
            benchmark::DoNotOptimize(s.simplified(e));
        }
    }
    state.SetItemsProcessed(state.iterations() * 100);
}

// As wide as GiNaC normalises in a bench's time.
template <class System> void sumOf1000(benchmark::State& state) {
    for (auto _ : state) {
        System s;
        auto sum = s.symbol(0);
        for (int i = 1; i < 1000; ++i)
            sum = s.add(sum, s.multiply(s.number(2), s.symbol(i)));
        benchmark::DoNotOptimize(s.simplified(sum));
    }
    state.SetItemsProcessed(state.iterations() * 1000);
}

void engineWideSum(benchmark::State& state) {
    for (auto _ : state) {
        Engine s;
        auto sum = s.symbol(0);
        for (int i = 1; i < wideSum; ++i)
            sum = s.add(sum, s.multiply(s.number(2), s.symbol(i)));
        benchmark::DoNotOptimize(s.simplified(sum));
    }
    state.SetItemsProcessed(state.iterations() * wideSum);
}

#ifdef QLTYPES_HAVE_GINAC
// By a list of terms: adding them one by one copies the sum at each step. It is put in order, not normalised, which
// takes most of a minute.
void ginacWideSum(benchmark::State& state) {
    for (auto _ : state) {
        Ginac s;
        GiNaC::exvector terms;
        for (int i = 0; i < wideSum; ++i)
            terms.push_back(2 * s.symbol(i));
        benchmark::DoNotOptimize(GiNaC::ex(GiNaC::add(terms)));
    }
    state.SetItemsProcessed(state.iterations() * wideSum);
}
#endif

void constructExisting(benchmark::State& state) {
    const int side = static_cast<int>(state.range(0));
    QL::SymbolicExprTable table;
    std::vector<unsigned long> symbols;
    for (int i = 0; i < side; ++i)
        symbols.push_back(table.addSymbol("x" + std::to_string(i)));
    const auto all = [&] {
        for (const unsigned long a : symbols)
            for (const unsigned long b : symbols)
                benchmark::DoNotOptimize(table.add(SymbolicOp::Plus, a, b));
    };
    all();
    for (auto _ : state)
        all();
    state.SetItemsProcessed(state.iterations() * side * side);
    state.counters["bytesANode"] = static_cast<double>(table.sizeInMemory()) / static_cast<double>(table.getNumExprs());
}

// An operator on handles, which simplifies, where the result exists.
void operatorOnHandles(benchmark::State& state) {
    QLTypeSys::SymbolicDimsTable table;
    const QLTypeSys::SymbolicDimsString k(table, "K"), l(table, "L"), m(table, "M");
    const QLTypeSys::SymbolicDims sum = k * l + m;
    for (auto _ : state) {
        benchmark::DoNotOptimize(sum + k);
        benchmark::DoNotOptimize(sum - k);
        benchmark::DoNotOptimize(sum * k);
        benchmark::DoNotOptimize(sum / k);
        benchmark::DoNotOptimize(sum % k);
    }
    state.SetItemsProcessed(state.iterations() * 5);
}

#ifdef QLTYPES_HAVE_GINAC
#define QLTYPES_BENCH_BOTH(work)                                                                                       \
    BENCHMARK(work<Engine>)->Unit(benchmark::kMillisecond);                                                            \
    BENCHMARK(work<Ginac>)->Unit(benchmark::kMillisecond)
#else
#define QLTYPES_BENCH_BOTH(work) BENCHMARK(work<Engine>)->Unit(benchmark::kMillisecond)
#endif

QLTYPES_BENCH_BOTH(smallExpressions);
QLTYPES_BENCH_BOTH(sumsOf50);
QLTYPES_BENCH_BOTH(productsOf50);
QLTYPES_BENCH_BOTH(deepNests);
QLTYPES_BENCH_BOTH(squaredFortyTimes);
QLTYPES_BENCH_BOTH(sumOf1000);
BENCHMARK(engineWideSum)->Unit(benchmark::kMillisecond);
#ifdef QLTYPES_HAVE_GINAC
BENCHMARK(ginacWideSum)->Unit(benchmark::kMillisecond);
#endif
BENCHMARK(constructExisting)->Arg(100)->Arg(1000);
BENCHMARK(operatorOnHandles);

} // namespace

BENCHMARK_MAIN();
