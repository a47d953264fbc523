// The memory manager of dynamic matrices and the string pool, at a thousand and at a million live entries.
//
// Each entry goes through the operations of a life again and again; items are operations. The entries are visited in
// the order of their addresses, as a model steps through its signals, or shuffled. Beside them: the language's
// allocator alone (the floor: what no index can be faster than), and the manager's rule over a standard map.
#include <algorithm>
#include <cstddef>
#include <new>
#include <random>
#include <unordered_map>
#include <utility>
#include <vector>

#include <benchmark/benchmark.h>
#include <boost/functional/hash.hpp>

#include "qlplatform/strings/DynamicStringPool.h"
#include "qltypes/dynamic_matrix/DynamicMatrix.h"
#include "qltypes/dynamic_matrix/DynamicMatrixMemoryManager.h"

namespace {

using Manager = QLTypeSys::DynamicMatrixMemoryManager;
using QLTypeSys::MemoryBounds;
using Key = Manager::Key;

enum Order { inOrder, shuffled };

std::vector<std::size_t> visits(std::size_t count, Order order) {
    std::vector<std::size_t> indices(count);
    for (std::size_t i = 0; i < count; ++i)
        indices[i] = i;
    if (order == shuffled) std::shuffle(indices.begin(), indices.end(), std::mt19937(65));
    return indices;
}

/// The memory of one signal that is a matrix.
struct Signal {
    void* block;
    std::byte rest[sizeof(QLTypeSys::DynamicMatrix) - sizeof(void*)];
};

struct OurManager {
    Key allocate(const void* owner, unsigned long size) { return Manager::GetMemoryManager().Allocate(owner, size); }
    Key getOrAllocate(const Key& key, unsigned long size) {
        return Manager::GetMemoryManager().GetOrAllocate(key, size);
    }
    void deallocate(const Key& key) { Manager::GetMemoryManager().Deallocate(key); }
};

struct StandardMap {
    std::unordered_map<Key, MemoryBounds, boost::hash<Key>> blocks;

    Key allocate(const void* owner, unsigned long size) {
        const auto capacity = static_cast<unsigned long>(static_cast<double>(size) * 1.5);
        const Key key(owner, new (std::nothrow) char[capacity]);
        blocks[key] = {size, capacity, static_cast<unsigned long>(static_cast<double>(size) / 1.5)};
        return key;
    }
    Key getOrAllocate(const Key& key, unsigned long size) {
        const auto known = blocks.find(key);
        if (known != blocks.end()) {
            if (known->second.lowerBound <= size && size <= known->second.upperBound) return key;
            deallocate(key);
        }
        return allocate(key.first, size);
    }
    void deallocate(const Key& key) {
        if (blocks.erase(key) != 0) delete[] static_cast<char*>(key.second);
    }
};

struct AllocatorAlone {
    Key allocate(const void* owner, unsigned long size) { return {owner, new (std::nothrow) char[size * 3 / 2]}; }
    Key getOrAllocate(const Key& key, unsigned long size) {
        if (size > 66 && size <= 150) return key;
        deallocate(key);
        return allocate(key.first, size);
    }
    void deallocate(const Key& key) { delete[] static_cast<char*>(key.second); }
};

template <class Blocks> class Signals {
  public:
    explicit Signals(std::size_t count) : signals_(count) {
        for (Signal& signal : signals_)
            signal.block = blocks_.allocate(&signal, 100).second;
    }
    ~Signals() {
        for (Signal& signal : signals_)
            blocks_.deallocate({&signal, signal.block});
    }

    void resize(std::size_t i, unsigned long size) {
        Signal& signal = signals_[i];
        signal.block = blocks_.getOrAllocate({&signal, signal.block}, size).second;
    }

    void rebuild(std::size_t i) {
        Signal& signal = signals_[i];
        blocks_.deallocate({&signal, signal.block});
        signal.block = blocks_.allocate(&signal, 100).second;
    }

  private:
    Blocks blocks_;
    std::vector<Signal> signals_;
};

// Visits one entry an iteration, with `numOperations` in each visit.
template <class Visit> void run(benchmark::State& state, Order order, std::int64_t numOperations, const Visit& visit) {
    const std::vector<std::size_t> indices = visits(static_cast<std::size_t>(state.range(0)), order);
    std::size_t at = 0;
    for (auto _ : state) {
        visit(indices[at]);
        if (++at == indices.size()) at = 0;
    }
    state.SetItemsProcessed(state.iterations() * numOperations);
}

// Grown past its bounds, twice resized within them, taken down and made anew.
template <class Blocks> void matrixLife(benchmark::State& state, Order order) {
    Signals<Blocks> signals(static_cast<std::size_t>(state.range(0)));
    run(state, order, 5, [&](std::size_t i) {
        signals.resize(i, 160);
        signals.resize(i, 130);
        signals.resize(i, 110);
        signals.rebuild(i);
    });
}

// Resized within its bounds only.
template <class Blocks> void matrixStays(benchmark::State& state, Order order) {
    Signals<Blocks> signals(static_cast<std::size_t>(state.range(0)));
    run(state, order, 1, [&](std::size_t i) { signals.resize(i, 90); });
}

// Put, written through the handle, removed.
void stringLife(benchmark::State& state, Order order) {
    auto& pool = stringutil::DynamicStringPool::GetPool("bench");
    std::vector<void*> slots(static_cast<std::size_t>(state.range(0)));
    for (void*& slot : slots)
        slot = pool.put(&slot, u"");
    run(state, order, 3, [&](std::size_t i) {
        void*& slot = slots[i];
        stringutil::voidPtrToUStrRef(slot) = u"on";
        pool.remove(&slot);
        slot = pool.put(&slot, u"");
    });
    for (void*& slot : slots)
        pool.remove(&slot);
}

constexpr auto managerLife = matrixLife<OurManager>;
constexpr auto standardMapLife = matrixLife<StandardMap>;
constexpr auto allocatorAloneLife = matrixLife<AllocatorAlone>;
constexpr auto managerStays = matrixStays<OurManager>;
constexpr auto standardMapStays = matrixStays<StandardMap>;

void entries(benchmark::internal::Benchmark* b) { b->Arg(1000)->Arg(1000000)->ArgName("live"); }

} // namespace

BENCHMARK_CAPTURE(managerLife, in_order, inOrder)->Apply(entries);
BENCHMARK_CAPTURE(managerLife, shuffled, shuffled)->Apply(entries);
BENCHMARK_CAPTURE(standardMapLife, in_order, inOrder)->Apply(entries);
BENCHMARK_CAPTURE(standardMapLife, shuffled, shuffled)->Apply(entries);
BENCHMARK_CAPTURE(allocatorAloneLife, in_order, inOrder)->Apply(entries);
BENCHMARK_CAPTURE(allocatorAloneLife, shuffled, shuffled)->Apply(entries);
BENCHMARK_CAPTURE(managerStays, in_order, inOrder)->Apply(entries);
BENCHMARK_CAPTURE(managerStays, shuffled, shuffled)->Apply(entries);
BENCHMARK_CAPTURE(standardMapStays, in_order, inOrder)->Apply(entries);
BENCHMARK_CAPTURE(standardMapStays, shuffled, shuffled)->Apply(entries);
BENCHMARK_CAPTURE(stringLife, in_order, inOrder)->Apply(entries);
BENCHMARK_CAPTURE(stringLife, shuffled, shuffled)->Apply(entries);

BENCHMARK_MAIN();
