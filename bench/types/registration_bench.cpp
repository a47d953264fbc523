// Registering many plain types, one call a type, beside as many empty messages in protobuf's DescriptorPool: all of
// them in one file, and one file a message, as they come when each is registered by a call of its own.
#include <chrono>
#include <memory>

#include <benchmark/benchmark.h>
#include <google/protobuf/descriptor.h>
#include <google/protobuf/descriptor.pb.h>

#include "bench/types/names.h"
#include "qltypes/types/DataTypeTable.h"

namespace {

// Times `work` on a fresh `Container` alone: making and destroying the container are left out on both sides.
template <class Container, class Work> void timeOnFresh(benchmark::State& state, Work work) {
    for (auto _ : state) {
        auto container = std::make_unique<Container>();
        const auto start = std::chrono::steady_clock::now();
        work(*container);
        const std::chrono::duration<double> taken = std::chrono::steady_clock::now() - start;
        state.SetIterationTime(taken.count());
    }
    state.SetItemsProcessed(state.iterations() * state.range(0));
}

void registerOurs(benchmark::State& state) {
    const std::vector<std::string> names = typeNames(static_cast<int>(state.range(0)));
    timeOnFresh<QLTypeSys::DataTypeTable>(state, [&](QLTypeSys::DataTypeTable& table) {
        for (const std::string& name : names)
            benchmark::DoNotOptimize(table.registerDataType(name.c_str(), dtSourceBuiltIn, nullptr));
    });
}

void registerProtobuf(benchmark::State& state) {
    google::protobuf::FileDescriptorProto file;
    file.set_name("messages.proto");
    for (const std::string& name : typeNames(static_cast<int>(state.range(0))))
        file.add_message_type()->set_name(name);
    timeOnFresh<google::protobuf::DescriptorPool>(state, [&](google::protobuf::DescriptorPool& pool) {
        if (!pool.BuildFile(file)) state.SkipWithError("the pool refused the file");
    });
}

void registerProtobufOneByOne(benchmark::State& state) {
    std::vector<google::protobuf::FileDescriptorProto> files;
    for (const std::string& name : typeNames(static_cast<int>(state.range(0)))) {
        files.emplace_back().set_name(name + ".proto");
        files.back().add_message_type()->set_name(name);
    }
    timeOnFresh<google::protobuf::DescriptorPool>(state, [&](google::protobuf::DescriptorPool& pool) {
        for (const google::protobuf::FileDescriptorProto& file : files)
            if (!pool.BuildFile(file)) state.SkipWithError("the pool refused a file");
    });
}

BENCHMARK(registerOurs)->Arg(100000)->UseManualTime()->Unit(benchmark::kMillisecond);
BENCHMARK(registerProtobufOneByOne)->Arg(100000)->UseManualTime()->Unit(benchmark::kMillisecond);
BENCHMARK(registerProtobuf)->Arg(100000)->UseManualTime()->Unit(benchmark::kMillisecond);

} // namespace

BENCHMARK_MAIN();
