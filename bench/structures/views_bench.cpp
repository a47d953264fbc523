// Walks over all nodes of large structures, and single random questions, beside what others answer: HDF5's and LLVM's
// nested look-ups, and a bare search in prefix sums, which is the limit.
//
// Walks report the time of one node, for 10,000 and 1,000,000 of them. Questions run on a structure of 1,000,000 nodes.
#include <algorithm>
#include <random>

#include <benchmark/benchmark.h>

#include "bench/structures/shapes.h"
#include "qltypes/structures/ElementAccess.h"

#ifdef HAVE_HDF5
#include <hdf5.h>
#endif
#ifdef HAVE_LLVM
#include <llvm/IR/DataLayout.h>
#include <llvm/IR/DerivedTypes.h>
#include <llvm/IR/LLVMContext.h>
#endif

namespace {

using shapes::Kind;
using shapes::Shape;

constexpr long manyNodes = 1000000;

Shape& large(Kind kind) {
    static Shape all[] = {{Kind::wide, manyNodes}, {Kind::arrays, manyNodes}, {Kind::deep, manyNodes}};
    return all[static_cast<int>(kind)];
}

std::vector<long> randomIndices(long below) {
    std::mt19937_64 random(1);
    std::vector<long> made(1 << 16);
    for (long& idx : made)
        idx = std::uniform_int_distribution<long>(0, below - 1)(random);
    return made;
}

// --- Walks -----------------------------------------------------------------------------------------------------------

void walk(benchmark::State& state, Kind kind) {
    Shape shape(kind, state.range(0));
    const QLTypeSys::DFSElementAccess nodes(&shape.table, shape.id);
    const long numNodes = shape.numNodes();
    for (auto _ : state) {
        shape.record()->clearDFSCache();
        for (long idx = 0; idx < numNodes; ++idx) {
            benchmark::DoNotOptimize(nodes.getDataTypeId(idx));
            benchmark::DoNotOptimize(nodes.getOffset(idx));
            benchmark::DoNotOptimize(nodes.getStructElement(idx));
            benchmark::DoNotOptimize(nodes.getFullPathAsString(idx, false));
        }
    }
    state.SetItemsProcessed(state.iterations() * numNodes);
    state.counters["time_per_node"] = benchmark::Counter(static_cast<double>(state.iterations() * numNodes),
                                                         benchmark::Counter::kIsRate | benchmark::Counter::kInvert);
}

// --- Random questions ------------------------------------------------------------------------------------------------

template <class Question> void ask(benchmark::State& state, long below, Question question) {
    const std::vector<long> indices = randomIndices(below);
    std::size_t next = 0;
    for (auto _ : state) {
        benchmark::DoNotOptimize(question(indices[next]));
        next = (next + 1) % indices.size();
    }
}

void flatToOffset(benchmark::State& state, Kind kind) {
    Shape& s = large(kind);
    const QLTypeSys::FlatElementAccess leaves(&s.table, s.id);
    ask(state, s.numLeaves(), [&](long idx) { return leaves.getOffset(idx); });
}

void flatToOffsetByFunction(benchmark::State& state, Kind kind) {
    Shape& s = large(kind);
    ask(state, s.numLeaves(), [&](long idx) { return DtGetDataTypeFlatElementOffset(&s.table, s.id, idx); });
}

void flatToPath(benchmark::State& state, Kind kind) {
    Shape& s = large(kind);
    const QLTypeSys::FlatElementAccess leaves(&s.table, s.id);
    ask(state, s.numLeaves(), [&](long idx) { return leaves.getFullPathAsString(idx, false); });
}

void depthFirstToFlat(benchmark::State& state, Kind kind) {
    Shape& s = large(kind);
    const QLTypeSys::DFSElementAccess nodes(&s.table, s.id);
    ask(state, s.numNodes(), [&](long idx) { return nodes.getFlatElementIdx(idx); });
}

void depthFirstToRaw(benchmark::State& state, Kind kind) {
    Shape& s = large(kind);
    const QLTypeSys::DFSElementAccess nodes(&s.table, s.id);
    ask(state, s.numNodes(), [&](long idx) { return nodes.getRawElementIdx(idx); });
}

void depthFirstToParent(benchmark::State& state, Kind kind) {
    Shape& s = large(kind);
    const QLTypeSys::DFSElementAccess nodes(&s.table, s.id);
    ask(state, s.numNodes(), [&](long idx) {
        int parent;
        long element;
        nodes.getImmediateParentDTypeIdAndOffset(idx, parent, element);
        return element;
    });
}

void rawToOffset(benchmark::State& state, Kind kind) {
    Shape& s = large(kind);
    const QLTypeSys::RawElementAccess values(&s.table, s.id);
    ask(state, s.numValues(), [&](long idx) { return values.getOffset(idx); });
}

// --- Others ----------------------------------------------------------------------------------------------------------

// The limit: one search in an array of prefix sums, one read of an offset.
void prefixSums(benchmark::State& state) {
    std::vector<long> ends, offsets;
    for (long i = 0; i < manyNodes; ++i) {
        ends.push_back(i + 1);
        offsets.push_back(8 * i);
    }
    ask(state, manyNodes, [&](long idx) {
        return offsets[static_cast<std::size_t>(std::upper_bound(ends.begin(), ends.end(), idx) - ends.begin())];
    });
}
BENCHMARK(prefixSums);

#ifdef HAVE_LLVM
// From an offset to the element that contains it, which is the look-up that LLVM has.
void llvmNested(benchmark::State& state, Kind kind) {
    llvm::LLVMContext context;
    const llvm::DataLayout layout("e-m:e-i64:64-f80:128-n8:16:32:64-S128");
    llvm::Type* const leafTypes[] = {llvm::Type::getDoubleTy(context), llvm::Type::getInt8Ty(context),
                                     llvm::Type::getInt32Ty(context),  llvm::Type::getFloatTy(context),
                                     llvm::Type::getInt16Ty(context),  llvm::Type::getInt8Ty(context)};
    const auto leaves = [&](long count) {
        std::vector<llvm::Type*> made;
        for (long i = 0; i < count; ++i)
            made.push_back(leafTypes[i % std::ssize(leafTypes)]);
        return made;
    };
    llvm::StructType* type;
    if (kind == Kind::wide) {
        type = llvm::StructType::get(context, leaves(manyNodes - 1));
    } else if (kind == Kind::arrays) {
        llvm::Type* const inner = llvm::StructType::get(context, leaves(5));
        const std::vector<llvm::Type*> members{leafTypes[0], llvm::ArrayType::get(inner, 9)};
        llvm::Type* const middle = llvm::StructType::get(context, members);
        const std::vector<llvm::Type*> outer{llvm::ArrayType::get(middle, manyNodes / 57)};
        type = llvm::StructType::get(context, outer);
    } else {
        type = llvm::StructType::get(context, leaves(manyNodes / 200 - 1));
        for (int level = 1; level < 200; ++level) {
            std::vector<llvm::Type*> members = leaves(manyNodes / 200 - 1);
            members.push_back(type);
            type = llvm::StructType::get(context, members);
        }
    }
    const auto size = static_cast<long>(layout.getTypeAllocSize(type).getFixedSize());
    ask(state, size, [&](long offset) {
        llvm::Type* at = type;
        llvm::APInt rest(64, static_cast<std::uint64_t>(offset));
        return layout.getGEPIndicesForOffset(at, rest).size();
    });
}
#endif

#ifdef HAVE_HDF5
// A member's offset by its number, in a compound type as large as HDF5 takes.
void hdf5Member(benchmark::State& state) {
    constexpr long numMembers = 1000;
    const hid_t type = H5Tcreate(H5T_COMPOUND, numMembers * 8);
    for (long i = 0; i < numMembers; ++i)
        H5Tinsert(type, ("e" + std::to_string(i)).c_str(), static_cast<std::size_t>(8 * i), H5T_NATIVE_DOUBLE);
    ask(state, numMembers, [&](long idx) { return H5Tget_member_offset(type, static_cast<unsigned>(idx)); });
    H5Tclose(type);
}
BENCHMARK(hdf5Member);

// From a number of leaf to its offset through three levels, opening each nested type on the way as its users do.
void hdf5Nested(benchmark::State& state) {
    const hid_t inner = H5Tcreate(H5T_COMPOUND, 100 * 8);
    for (int i = 0; i < 100; ++i)
        H5Tinsert(inner, ("e" + std::to_string(i)).c_str(), static_cast<std::size_t>(8 * i), H5T_NATIVE_DOUBLE);
    const hid_t middle = H5Tcreate(H5T_COMPOUND, 100 * H5Tget_size(inner));
    for (int i = 0; i < 100; ++i)
        H5Tinsert(middle, ("m" + std::to_string(i)).c_str(), static_cast<std::size_t>(i) * H5Tget_size(inner), inner);
    ask(state, 100 * 100, [&](long idx) {
        const auto first = static_cast<unsigned>(idx / 100);
        const hid_t nested = H5Tget_member_type(middle, first);
        const std::size_t offset =
            H5Tget_member_offset(middle, first) + H5Tget_member_offset(nested, static_cast<unsigned>(idx % 100));
        H5Tclose(nested);
        return offset;
    });
    H5Tclose(middle);
    H5Tclose(inner);
}
BENCHMARK(hdf5Nested);
#endif

void registerAll() {
    struct Row {
        const char* name;
        void (*run)(benchmark::State&, Kind);
    };
    constexpr Row questions[] = {
        {"flatToOffset", flatToOffset},       {"flatToOffsetByFunction", flatToOffsetByFunction},
        {"flatToPath", flatToPath},           {"depthFirstToFlat", depthFirstToFlat},
        {"depthFirstToRaw", depthFirstToRaw}, {"depthFirstToParent", depthFirstToParent},
        {"rawToOffset", rawToOffset},
#ifdef HAVE_LLVM
        {"llvmNested", llvmNested},
#endif
    };
    for (const Kind kind : {Kind::wide, Kind::arrays, Kind::deep}) {
        const std::string suffix = std::string("/") + shapes::nameOf(kind);
        benchmark::RegisterBenchmark(("walk" + suffix).c_str(), walk, kind)
            ->Arg(10000)
            ->Arg(manyNodes)
            ->Unit(benchmark::kMillisecond);
        for (const Row& row : questions)
            benchmark::RegisterBenchmark((row.name + suffix).c_str(), row.run, kind);
    }
}

} // namespace

int main(int argc, char** argv) {
    registerAll();
    benchmark::Initialize(&argc, argv);
    if (benchmark::ReportUnrecognizedArguments(argc, argv)) return 1;
    benchmark::RunSpecifiedBenchmarks();
}
