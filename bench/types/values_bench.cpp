// Operations on values by identifier, beside a direct call of the same function through a pointer.
#include <vector>

#include <benchmark/benchmark.h>

#include "qltypes/types/DataTypeTable.h"

namespace {

struct Value {
    long words[4];
};

int constructValue(void* p, const void*) {
    *static_cast<Value*>(p) = {{1, 2, 3, 4}};
    return 1;
}
int copyValue(void* dst, const void* src) {
    *static_cast<Value*>(dst) = *static_cast<const Value*>(src);
    return 1;
}

// A table with one client type whose functions are set.
struct Fixture {
    Fixture() {
        id = table.registerDataType("Value", dtSourceBuiltIn, nullptr);
        QLTypeSys::DataType* record = table.getDataTypeAliasedThruTo(id);
        record->setSize(sizeof(Value));
        record->setConstructFcn(constructValue);
        record->setDeepCopyFcn(copyValue);
    }
    QLTypeSys::DataTypeTable table;
    int id;
};

void constructById(benchmark::State& state) {
    Fixture f;
    std::vector<Value> values(static_cast<std::size_t>(state.range(0)));
    for (auto _ : state)
        for (Value& value : values)
            f.table.construct(f.id, &value);
    benchmark::DoNotOptimize(values.data());
    state.SetItemsProcessed(state.iterations() * state.range(0));
}

void constructDirect(benchmark::State& state) {
    QLTypeSys::ConstructFcn f = constructValue;
    benchmark::DoNotOptimize(f);
    std::vector<Value> values(static_cast<std::size_t>(state.range(0)));
    for (auto _ : state)
        for (Value& value : values)
            f(&value, nullptr);
    benchmark::DoNotOptimize(values.data());
    state.SetItemsProcessed(state.iterations() * state.range(0));
}

void copyById(benchmark::State& state) {
    Fixture f;
    const std::vector<Value> from(static_cast<std::size_t>(state.range(0)));
    std::vector<Value> to(from.size());
    for (auto _ : state)
        for (std::size_t i = 0; i < to.size(); ++i)
            f.table.deepCopy(f.id, &to[i], &from[i]);
    benchmark::DoNotOptimize(to.data());
    state.SetItemsProcessed(state.iterations() * state.range(0));
}

void copyDirect(benchmark::State& state) {
    QLTypeSys::DeepCopyFcn f = copyValue;
    benchmark::DoNotOptimize(f);
    const std::vector<Value> from(static_cast<std::size_t>(state.range(0)));
    std::vector<Value> to(from.size());
    for (auto _ : state)
        for (std::size_t i = 0; i < to.size(); ++i)
            f(&to[i], &from[i]);
    benchmark::DoNotOptimize(to.data());
    state.SetItemsProcessed(state.iterations() * state.range(0));
}

void isPositiveById(benchmark::State& state) {
    const QLTypeSys::DataTypeTable table;
    const int count = static_cast<int>(state.range(0));
    const std::vector<double> data(static_cast<std::size_t>(count), 1.5);
    std::vector<unsigned char> result(data.size());
    for (auto _ : state) {
        table.isPositive(DATA_TYPE_ID_DOUBLE, count, data.data(), nullptr, result.data());
        benchmark::ClobberMemory();
    }
    state.SetItemsProcessed(state.iterations() * count);
}

void isPositiveDirect(benchmark::State& state) {
    const QLTypeSys::DataTypeTable table;
    QLTypeSys::IsPositiveFcn f = table.getDataTypeAt(1)->getIsPositiveFcn();
    benchmark::DoNotOptimize(f);
    const int count = static_cast<int>(state.range(0));
    const std::vector<double> data(static_cast<std::size_t>(count), 1.5);
    std::vector<unsigned char> result(data.size());
    for (auto _ : state) {
        f(table.getDataTypeAccess(), nullptr, DATA_TYPE_ID_DOUBLE, count, data.data(), nullptr, result.data());
        benchmark::ClobberMemory();
    }
    state.SetItemsProcessed(state.iterations() * count);
}

BENCHMARK(constructById)->Arg(1)->Arg(1000);
BENCHMARK(constructDirect)->Arg(1)->Arg(1000);
BENCHMARK(copyById)->Arg(1)->Arg(1000);
BENCHMARK(copyDirect)->Arg(1)->Arg(1000);
BENCHMARK(isPositiveById)->Arg(1)->Arg(1000);
BENCHMARK(isPositiveDirect)->Arg(1)->Arg(1000);

} // namespace

BENCHMARK_MAIN();
