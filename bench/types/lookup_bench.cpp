// Name to identifier, id to record: the table beside absl::flat_hash_map and std::unordered_map with the same keys.
// Each lookup takes a const char*, as clients have it.
#include <unordered_map>

#include <absl/container/flat_hash_map.h>
#include <absl/strings/string_view.h>
#include <benchmark/benchmark.h>

#include "bench/types/names.h"
#include "qltypes/types/DataTypeTable.h"

namespace {

template <class Lookup> void lookUpAll(benchmark::State& state, const std::vector<std::string>& names, Lookup lookup) {
    const std::vector<int> order = shuffledIndices(static_cast<int>(names.size()));
    for (auto _ : state)
        for (const int i : order)
            benchmark::DoNotOptimize(lookup(names[static_cast<std::size_t>(i)].c_str()));
    state.SetItemsProcessed(state.iterations() * static_cast<long>(names.size()));
}

void nameToIdOurs(benchmark::State& state) {
    const std::vector<std::string> names = typeNames(static_cast<int>(state.range(0)));
    QLTypeSys::DataTypeTable table;
    for (const std::string& name : names)
        table.registerDataType(name.c_str(), dtSourceBuiltIn, nullptr);
    lookUpAll(state, names, [&](const char* name) { return table.getDataTypeId(name); });
}

void nameToIdAbseil(benchmark::State& state) {
    const std::vector<std::string> names = typeNames(static_cast<int>(state.range(0)));
    absl::flat_hash_map<std::string, int> map;
    for (const std::string& name : names)
        map.emplace(name, static_cast<int>(map.size()));
    lookUpAll(state, names, [&](const char* name) { return map.find(absl::string_view(name))->second; });
}

void nameToIdStandard(benchmark::State& state) {
    const std::vector<std::string> names = typeNames(static_cast<int>(state.range(0)));
    std::unordered_map<std::string, int> map;
    for (const std::string& name : names)
        map.emplace(name, static_cast<int>(map.size()));
    lookUpAll(state, names, [&](const char* name) { return map.find(name)->second; });
}

void idToRecord(benchmark::State& state) {
    QLTypeSys::DataTypeTable table;
    for (const std::string& name : typeNames(1000))
        table.registerDataType(name.c_str(), dtSourceBuiltIn, nullptr);
    unsigned long id = 0;
    for (auto _ : state)
        benchmark::DoNotOptimize(table.getDataTypeAt(++id & 1023));
}

BENCHMARK(nameToIdOurs)->Arg(1000)->Arg(100000);
BENCHMARK(nameToIdAbseil)->Arg(1000)->Arg(100000);
BENCHMARK(nameToIdStandard)->Arg(1000)->Arg(100000);
BENCHMARK(idToRecord);

} // namespace

BENCHMARK_MAIN();
