// Registering many plain types, beside as many empty messages in protobuf's DescriptorPool.
#include <benchmark/benchmark.h>
#include <google/protobuf/descriptor.h>
#include <google/protobuf/descriptor.pb.h>

#include "bench/types/names.h"
#include "qltypes/types/DataTypeTable.h"

namespace {

void registerOurs(benchmark::State& state) {
    const std::vector<std::string> names = typeNames(static_cast<int>(state.range(0)));
    for (auto _ : state) {
        QLTypeSys::DataTypeTable table;
        for (const std::string& name : names)
            benchmark::DoNotOptimize(table.registerDataType(name.c_str(), dtSourceBuiltIn, nullptr));
    }
    state.SetItemsProcessed(state.iterations() * state.range(0));
}

void registerProtobuf(benchmark::State& state) {
    google::protobuf::FileDescriptorProto file;
    file.set_name("messages.proto");
    for (const std::string& name : typeNames(static_cast<int>(state.range(0))))
        file.add_message_type()->set_name(name);
    for (auto _ : state) {
        google::protobuf::DescriptorPool pool;
        if (!pool.BuildFile(file)) state.SkipWithError("the pool refused the file");
    }
    state.SetItemsProcessed(state.iterations() * state.range(0));
}

BENCHMARK(registerOurs)->Arg(100000)->Unit(benchmark::kMillisecond);
BENCHMARK(registerProtobuf)->Arg(100000)->Unit(benchmark::kMillisecond);

} // namespace

BENCHMARK_MAIN();
