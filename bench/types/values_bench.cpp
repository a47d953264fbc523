// Operations on values by identifier, beside a direct call of the same function through a pointer. The functions are of
// two kinds: the cheapest that can be (a few stores), which shows what the road to them costs, and those of a value
// that owns memory, as most types with functions do.
#include <cstdlib>
#include <cstring>
#include <vector>

#include <benchmark/benchmark.h>

#include "qltypes/types/DataTypeTable.h"

namespace {

struct Cheap {
    long words[4];
    static int construct(void* p, const void*) {
        *static_cast<Cheap*>(p) = {{1, 2, 3, 4}};
        return 1;
    }
    static int destruct(void*) { return 1; }
    static int copy(void* dst, const void* src) {
        *static_cast<Cheap*>(dst) = *static_cast<const Cheap*>(src);
        return 1;
    }
};

struct Owner {
    static constexpr std::size_t size = 64;
    char* data;
    static int construct(void* p, const void*) {
        static_cast<Owner*>(p)->data = static_cast<char*>(std::calloc(1, size));
        return 1;
    }
    static int destruct(void* p) {
        std::free(static_cast<Owner*>(p)->data);
        return 1;
    }
    static int copy(void* dst, const void* src) {
        destruct(dst);
        static_cast<Owner*>(dst)->data = static_cast<char*>(std::malloc(size));
        std::memcpy(static_cast<Owner*>(dst)->data, static_cast<const Owner*>(src)->data, size);
        return 1;
    }
};

// A table with a client type whose functions are those of Value, and the functions themselves as pointers.
template <class Value> struct Fixture {
    explicit Fixture(const benchmark::State& state) : values(static_cast<std::size_t>(state.range(0))), from(values) {
        id = table.registerDataType("Value", dtSourceBuiltIn, nullptr);
        QLTypeSys::DataType* record = table.getDataTypeAliasedThruTo(id);
        record->setSize(sizeof(Value));
        record->setConstructFcn(construct);
        record->setDestructFcn(destruct);
        record->setDeepCopyFcn(copy);
        benchmark::DoNotOptimize(construct);
        benchmark::DoNotOptimize(destruct);
        benchmark::DoNotOptimize(copy);
        for (std::size_t i = 0; i < values.size(); ++i)
            construct(&values[i], nullptr), construct(&from[i], nullptr);
    }
    ~Fixture() {
        for (std::size_t i = 0; i < values.size(); ++i)
            destruct(&values[i]), destruct(&from[i]);
    }
    QLTypeSys::ConstructFcn construct = Value::construct;
    QLTypeSys::DestructFcn destruct = Value::destruct;
    QLTypeSys::DeepCopyFcn copy = Value::copy;
    QLTypeSys::DataTypeTable table;
    int id;
    std::vector<Value> values, from;
};

template <class Value, class Operation> void run(benchmark::State& state, Operation operation) {
    Fixture<Value> f(state);
    for (auto _ : state)
        for (std::size_t i = 0; i < f.values.size(); ++i)
            operation(f, i);
    state.SetItemsProcessed(state.iterations() * state.range(0));
}

template <class Value> void constructById(benchmark::State& state) {
    run<Value>(state, [](Fixture<Value>& f, std::size_t i) {
        f.table.destruct(f.id, &f.values[i]);
        f.table.construct(f.id, &f.values[i]);
    });
}
template <class Value> void constructDirect(benchmark::State& state) {
    run<Value>(state, [](Fixture<Value>& f, std::size_t i) {
        f.destruct(&f.values[i]);
        f.construct(&f.values[i], nullptr);
    });
}
template <class Value> void copyById(benchmark::State& state) {
    run<Value>(state, [](Fixture<Value>& f, std::size_t i) { f.table.deepCopy(f.id, &f.values[i], &f.from[i]); });
}
template <class Value> void copyDirect(benchmark::State& state) {
    run<Value>(state, [](Fixture<Value>& f, std::size_t i) { f.copy(&f.values[i], &f.from[i]); });
}

// The least that an operation by identifier can cost: one index, one virtual call and the function. Of two classes, so
// that the compiler cannot know which is called.
struct Record {
    virtual ~Record() = default;
    virtual void copy(void* dst, const void* src) const = 0;
    QLTypeSys::DeepCopyFcn function = nullptr;
};
struct CopyingRecord : Record {
    void copy(void* dst, const void* src) const override {
        if (!function(dst, src)) std::abort();
    }
};
struct RefusingRecord : Record {
    void copy(void*, const void*) const override { std::abort(); }
};
template <class Value> void copyByLeastRoad(benchmark::State& state) {
    CopyingRecord copying;
    RefusingRecord refusing;
    copying.function = Value::copy;
    std::vector<const Record*> records(32, &copying);
    records[0] = &refusing;
    benchmark::DoNotOptimize(records.data());
    benchmark::ClobberMemory();
    run<Value>(state, [&](Fixture<Value>& f, std::size_t i) {
        records[static_cast<std::size_t>(f.id)]->copy(&f.values[i], &f.from[i]);
    });
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

BENCHMARK(constructById<Cheap>)->Arg(1)->Arg(1000);
BENCHMARK(constructDirect<Cheap>)->Arg(1)->Arg(1000);
BENCHMARK(copyById<Cheap>)->Arg(1)->Arg(1000);
BENCHMARK(copyDirect<Cheap>)->Arg(1)->Arg(1000);
BENCHMARK(copyByLeastRoad<Cheap>)->Arg(1)->Arg(1000);
BENCHMARK(constructById<Owner>)->Arg(1)->Arg(1000);
BENCHMARK(constructDirect<Owner>)->Arg(1)->Arg(1000);
BENCHMARK(copyById<Owner>)->Arg(1)->Arg(1000);
BENCHMARK(copyDirect<Owner>)->Arg(1)->Arg(1000);
BENCHMARK(copyByLeastRoad<Owner>)->Arg(1)->Arg(1000);
BENCHMARK(isPositiveById)->Arg(1)->Arg(1000);
BENCHMARK(isPositiveDirect)->Arg(1)->Arg(1000);

} // namespace

BENCHMARK_MAIN();
