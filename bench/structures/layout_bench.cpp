// The layout pass, per element, beside LLVM's over as many fields.
#include <benchmark/benchmark.h>

#include "bench/structures/shapes.h"

#ifdef HAVE_LLVM
#include <llvm/IR/DataLayout.h>
#include <llvm/IR/DerivedTypes.h>
#include <llvm/IR/LLVMContext.h>
#endif

namespace {

void setTimePerElement(benchmark::State& state) {
    state.counters["time_per_element"] = benchmark::Counter(static_cast<double>(state.iterations() * state.range(0)),
                                                            benchmark::Counter::kIsRate | benchmark::Counter::kInvert);
}

// Offsets, size, counts, flags and ground of a structure of leaves. Run again, all but the flags is computed again.
void layout(benchmark::State& state) {
    shapes::Shape shape(shapes::Kind::wide, state.range(0) + 1);
    for (auto _ : state)
        if (DtComputeDerivedStructAttributes(&shape.table, shape.id)) state.SkipWithError("no layout");
    setTimePerElement(state);
}
BENCHMARK(layout)->Arg(1000)->Arg(200000)->Unit(benchmark::kMicrosecond);

// The same, each time in a table of its own: the first run also derives the flags.
void firstLayout(benchmark::State& state) {
    for (auto _ : state) {
        state.PauseTiming();
        QLTypeSys::DataTypeTable table;
        const int id = table.registerStructDataType("S", static_cast<DataTypeSource>(2), nullptr);
        StructDataType* const structure = DtGetStructDataTypeObject(&table, id);
        structure->setNumElements(state.range(0));
        long i = 0;
        for (StructElement* e : structure->getElements())
            e->setDataTypeId(shapes::leafTypes[i++ % std::ssize(shapes::leafTypes)]);
        state.ResumeTiming();
        if (DtComputeDerivedStructAttributes(&table, id)) state.SkipWithError("no layout");
        benchmark::DoNotOptimize(structure->getSize());
        state.PauseTiming();
        table.resetToBuiltin();
        state.ResumeTiming();
    }
    setTimePerElement(state);
}
BENCHMARK(firstLayout)->Arg(1000)->Arg(200000)->Unit(benchmark::kMicrosecond);

#ifdef HAVE_LLVM
// A data layout remembers the structures that it laid out, so each run has its own.
void llvmLayout(benchmark::State& state) {
    llvm::LLVMContext context;
    llvm::Type* const leafTypes[] = {llvm::Type::getDoubleTy(context), llvm::Type::getInt8Ty(context),
                                     llvm::Type::getInt32Ty(context),  llvm::Type::getFloatTy(context),
                                     llvm::Type::getInt16Ty(context),  llvm::Type::getInt8Ty(context)};
    std::vector<llvm::Type*> members;
    for (long i = 0; i < state.range(0); ++i)
        members.push_back(leafTypes[i % std::ssize(leafTypes)]);
    llvm::StructType* const type = llvm::StructType::get(context, members);
    for (auto _ : state) {
        state.PauseTiming();
        auto data = std::make_unique<llvm::DataLayout>("e-m:e-i64:64-f80:128-n8:16:32:64-S128");
        state.ResumeTiming();
        benchmark::DoNotOptimize(data->getStructLayout(type));
        state.PauseTiming();
        data.reset();
        state.ResumeTiming();
    }
    setTimePerElement(state);
}
BENCHMARK(llvmLayout)->Arg(1000)->Arg(200000)->Unit(benchmark::kMicrosecond);
#endif

} // namespace

BENCHMARK_MAIN();
