// Every conversion of the matrix against memcpy of the same traffic, against the plain rules in a scalar loop, and
// against OpenCV's convertTo where the meaning is the same (saturating, halves to even); the overflow test against a
// pure read. Ends with a summary of ratios, each with the line that it is held against.
//
//   matrix_bench                                   everything, summary last
//   matrix_bench --level=avx2                      the same on a narrower level (portable, avx2, avx512)
//   matrix_bench --benchmark_filter='/1024/'       one size only
//
// The same traffic: a memcpy that reads and writes half as many bytes each as the conversion reads and writes together.
#include <algorithm>
#include <cstdio>
#include <cstdlib>
#include <cstring>
#include <map>
#include <memory>
#include <optional>
#include <random>
#include <string>
#include <sys/mman.h>
#include <vector>

#include <benchmark/benchmark.h>

#include "qltypes/conversion/BuiltInConversion.h"
#include "qltypes/conversion/Levels_internal.h"
#include "qltypes/conversion/OverflowPrediction_internal.h"

#ifdef QLTYPES_BENCH_OPENCV
#include <opencv2/core.hpp>
#endif

namespace {

using namespace QLTypeSys::conversion;

constexpr const char* typeNames[] = {"double", "single", "int8",   "uint8",  "int16",
                                     "uint16", "int32",  "uint32", "boolean"};
constexpr std::size_t typeSizes[] = {8, 4, 1, 1, 2, 2, 4, 4, 1};
constexpr const char* roundingNames[] = {"zero", "half_up", "ceiling", "floor", "as_zero", "half_away", "half_even"};
constexpr const char* overflowNames[] = {"wrap", "saturate"};

constexpr std::size_t sizes[] = {16, 1024, 65536, std::size_t{1} << 26};
constexpr std::size_t largestBytes = sizes[3] * sizeof(double);

// Two buffers of the largest size, touched once. Pages are large where the system gives them, for all alike. They begin
// at different places of a page: what is read and what is written just before would else look alike to the processor.
struct Buffer {
    std::byte* bytes;
    explicit Buffer(std::size_t offset) {
        constexpr std::size_t all = largestBytes + (std::size_t{2} << 20);
        void* const pages = std::aligned_alloc(std::size_t{2} << 20, all);
        madvise(pages, all, MADV_HUGEPAGE);
        std::memset(pages, 1, all);
        bytes = static_cast<std::byte*>(pages) + offset;
    }
};
Buffer& source() {
    static Buffer buffer(0);
    return buffer;
}
Buffer& destination() {
    static Buffer buffer(2112);
    return buffer;
}

// What the source holds: values of which some leave the range and need rounding, or such as are kept everywhere.
enum class Contents { any, kept };

void fillSource(int srcId, std::size_t count, Contents contents) {
    static int heldId = -1;
    static std::size_t heldCount = 0;
    static Contents heldContents{};
    if (heldId == srcId && heldCount >= count && heldContents == contents) return;
    heldId = srcId, heldCount = count, heldContents = contents;
    std::mt19937_64 random(1);
    const auto fill = [&]<class T>(T) {
        constexpr std::size_t period = 4099; // longer than a block, not a divisor of anything
        std::vector<T> some(period);
        for (T& v : some) {
            const double value = contents == Contents::kept ? static_cast<double>(random() % 2)
                                                            : static_cast<double>(random() % 1000) / 4 - 60;
            if constexpr (std::is_floating_point_v<T>)
                v = static_cast<T>(value);
            else
                v = static_cast<T>(static_cast<std::int64_t>(value));
        }
        for (std::size_t i = 0; i < count; i += period)
            std::memcpy(source().bytes + i * sizeof(T), some.data(), std::min(period, count - i) * sizeof(T));
    };
    switch (srcId) {
    case 0:
        return fill(double{});
    case 1:
        return fill(float{});
    case 2:
        return fill(std::int8_t{});
    case 3:
        return fill(std::uint8_t{});
    case 4:
        return fill(std::int16_t{});
    case 5:
        return fill(std::uint16_t{});
    case 6:
        return fill(std::int32_t{});
    case 7:
        return fill(std::uint32_t{});
    case 8:
        return fill(std::uint8_t{});
    }
}

void report(benchmark::State& state, std::size_t count, std::size_t bytesPerElement) {
    state.SetItemsProcessed(static_cast<std::int64_t>(state.iterations() * count));
    state.SetBytesProcessed(static_cast<std::int64_t>(state.iterations() * count * bytesPerElement));
}

void copyOfTraffic(benchmark::State& state, std::size_t count, std::size_t bytesPerElement) {
    std::size_t bytes = count * bytesPerElement / 2;
    for (auto _ : state) {
        benchmark::DoNotOptimize(bytes);
        std::memcpy(destination().bytes, source().bytes, bytes);
        benchmark::ClobberMemory();
    }
    report(state, count, bytesPerElement);
}

void convert(benchmark::State& state, Combination c, std::size_t count, bool check) {
    fillSource(c.srcId, count, check ? Contents::kept : Contents::any);
    bool kept = true;
    for (auto _ : state) {
        benchmark::DoNotOptimize(c);
        // The lookup is part of the call.
        kept &= utGetQlBuiltinDtypeConvFcn(c.srcId, c.dstId, c.overflow,
                                           c.rounding)(source().bytes, destination().bytes, count, count, false, false,
                                                       check, c.srcId, c.dstId, c.overflow, c.rounding);
        benchmark::ClobberMemory();
    }
    if (!kept) state.SkipWithError("a value was lost");
    report(state, count, typeSizes[c.srcId] + typeSizes[c.dstId]);
}

void convertByPlainRules(benchmark::State& state, Combination c, std::size_t count) {
    fillSource(c.srcId, count, Contents::any);
    const ConvertRun run = portableLevel.convert[slotOf(c.srcId, c.dstId, c.overflow, c.rounding)];
    for (auto _ : state) {
        run(source().bytes, destination().bytes, count);
        benchmark::ClobberMemory();
    }
    report(state, count, typeSizes[c.srcId] + typeSizes[c.dstId]);
}

void predict(benchmark::State& state, Combination c, std::size_t count) {
    fillSource(c.srcId, count, Contents::kept);
    bool overflow = false;
    for (auto _ : state) {
        overflow |= overflowExpected(source().bytes, static_cast<int>(count), c.srcId, false, c.dstId, c.rounding);
        benchmark::ClobberMemory();
    }
    if (overflow) state.SkipWithError("a value overflows");
    report(state, count, typeSizes[c.srcId]);
}

// A pure read: all words joined, by registers of 64 bytes where the processor has them.
[[gnu::target_clones("avx512f", "avx2", "default"), gnu::optimize("O3")]] std::uint64_t
joinedWords(const std::uint64_t* words, std::size_t count) {
    std::uint64_t joined[32] = {};
    for (std::size_t i = 0; i + 32 <= count; i += 32)
        for (std::size_t k = 0; k < 32; ++k)
            joined[k] |= words[i + k];
    std::uint64_t all = 0;
    for (const std::uint64_t word : joined)
        all |= word;
    return all;
}

void readAll(benchmark::State& state, std::size_t count, std::size_t bytesPerElement) {
    for (auto _ : state) {
        benchmark::DoNotOptimize(
            joinedWords(reinterpret_cast<const std::uint64_t*>(source().bytes), count * bytesPerElement / 8));
        benchmark::ClobberMemory();
    }
    report(state, count, bytesPerElement);
}

#ifdef QLTYPES_BENCH_OPENCV
constexpr int openCvTypes[] = {CV_64F, CV_32F, CV_8S, CV_8U, CV_16S, CV_16U, CV_32S, -1, -1};

bool openCvMeansTheSame(const Combination& c) {
    if (openCvTypes[c.srcId] < 0 || openCvTypes[c.dstId] < 0) return false;
    if (roundingFlags[c.srcId][c.dstId] && c.rounding != FXP_ROUND_HALF_EVEN) return false;
    return !overflowFlags[c.srcId][c.dstId] || c.overflow == FXP_OVERFLOW_SATURATE;
}

void convertByOpenCv(benchmark::State& state, Combination c, std::size_t count) {
    fillSource(c.srcId, count, Contents::any);
    // One row as long as rows may be, and as many as it takes.
    const int rows = static_cast<int>((count + (1 << 24) - 1) >> 24), columns = static_cast<int>(count) / rows;
    const cv::Mat from(rows, columns, openCvTypes[c.srcId], source().bytes);
    cv::Mat to(rows, columns, openCvTypes[c.dstId], destination().bytes);
    for (auto _ : state) {
        from.convertTo(to, openCvTypes[c.dstId]);
        benchmark::ClobberMemory();
    }
    report(state, count, typeSizes[c.srcId] + typeSizes[c.dstId]);
}
#endif

// ---- names: what/size/..., so that the summary finds its pairs ----

std::string cellName(const Combination& c) {
    std::string name = std::string(typeNames[c.srcId]) + "_to_" + typeNames[c.dstId];
    if (roundingFlags[c.srcId][c.dstId]) name += std::string("_") + roundingNames[c.rounding];
    if (overflowFlags[c.srcId][c.dstId]) name += std::string("_") + overflowNames[c.overflow];
    return name;
}

std::string caseName(const std::string& what, std::size_t count, const std::string& detail) {
    return what + "/" + std::to_string(count) + "/" + detail;
}

std::vector<Combination> allCombinations() {
    std::vector<Combination> all;
    std::map<std::string, bool> seen;
    for (std::size_t slot = 0; slot < numSlots; ++slot)
        if (const Combination c = combinationAt(slot); !std::exchange(seen[cellName(c)], true)) all.push_back(c);
    return all;
}

// Both levels copy alike then.
bool copiesTheBytes(const Combination& c) {
    return c.srcId == c.dstId || (typeSizes[c.srcId] == typeSizes[c.dstId] && c.srcId > 1 && c.dstId > 1 &&
                                  c.dstId != booleanId && c.overflow == FXP_OVERFLOW_WRAP);
}

// ---- the summary ----

using Times = std::map<std::string, double>; // the shortest of the repetitions, in seconds

class Collector : public benchmark::ConsoleReporter {
  public:
    explicit Collector(bool quiet) : quiet_(quiet) {}
    bool ReportContext(const Context& context) override { return ConsoleReporter::ReportContext(context); }
    void ReportRuns(const std::vector<Run>& runs) override {
        for (const Run& run : runs) {
            if (run.error_occurred || run.run_type != Run::RT_Iteration) continue;
            // Of the processor: other programs on the machine do not count.
            const double seconds = run.cpu_accumulated_time / static_cast<double>(run.iterations);
            const auto [found, isNew] = times_.emplace(run.run_name.function_name, seconds);
            if (!isNew) found->second = std::min(found->second, seconds);
        }
        if (!quiet_) ConsoleReporter::ReportRuns(runs);
    }
    const Times& times() const { return times_; }

  private:
    bool quiet_;
    Times times_;
};

// Ratios of one kind against their line.
class Line {
  public:
    Line(std::string title, double limit) : title_(std::move(title)), limit_(limit) {}
    /// `timesReading` is the time against that of only reading the source, where that is of interest.
    void add(const std::string& name, double ratio, std::optional<double> timesReading) {
        cells_.push_back({ratio, name, timesReading});
    }
    void print(bool all) {
        if (cells_.empty()) return;
        std::sort(cells_.begin(), cells_.end(), [](const Cell& a, const Cell& b) { return a.ratio < b.ratio; });
        const auto isBeyond = [&](const Cell& cell) { return cell.ratio > limit_; };
        const auto isReading = [&](const Cell& cell) {
            return isBeyond(cell) && cell.timesReading && *cell.timesReading <= limit_;
        };
        const auto beyond = std::count_if(cells_.begin(), cells_.end(), isBeyond);
        std::printf("%-62s at most %4.2f: %s (%zu cells, median %.2f, worst %.2f", title_.c_str(), limit_,
                    beyond ? "NOT MET" : "met", cells_.size(), cells_[cells_.size() / 2].ratio, cells_.back().ratio);
        if (beyond) std::printf(", %td beyond", beyond);
        if (const auto reading = std::count_if(cells_.begin(), cells_.end(), isReading))
            std::printf(", %td of them within %.2f of only reading the source", reading, limit_);
        std::printf(")\n");
        for (auto cell = cells_.rbegin(); cell != cells_.rend(); ++cell) {
            if (!all && !isBeyond(*cell)) continue;
            std::printf("    %5.2f %s%s", cell->ratio, cell->name.c_str(), isBeyond(*cell) ? "  beyond" : "");
            if (cell->timesReading) std::printf("  (%.2f of only reading the source)", *cell->timesReading);
            std::printf("\n");
        }
    }

  private:
    struct Cell {
        double ratio;
        std::string name;
        std::optional<double> timesReading;
    };

    std::string title_;
    double limit_;
    std::vector<Cell> cells_;
};

void printSummary(const Times& times, const std::vector<Combination>& combinations, bool all) {
    const auto ratio = [&](Line& line, const Combination& c, const std::string& numerator,
                           const std::string& denominator, const std::string& read = {}) {
        const auto above = times.find(numerator), below = times.find(denominator), source = times.find(read);
        if (above == times.end() || below == times.end()) return;
        std::optional<double> timesReading;
        if (source != times.end()) timesReading = above->second / source->second;
        line.add(cellName(c), above->second / below->second, timesReading);
    };
    const bool wide = std::string(levelInUse->name) == "avx512";
    std::printf("\nRatios of times, level %s. Cells copy the same traffic where nothing else is said.\n",
                levelInUse->name);
    for (const std::size_t count : sizes) {
        const std::string n = std::to_string(count) + " elements, ";
        const bool memory = count == sizes[3], few = count == sizes[0];
        Line saturating(n + "saturating and plain / memcpy", memory ? 1.15 : few ? 4 : wide ? 2.0 : 4);
        Line wrapping(n + "wrapping / memcpy", memory ? 1.15 : few ? 4 : wide ? 2.2 : 6);
        Line checkedToCopy(n + "checked / memcpy", 1.3 * 1.15);
        Line checked(n + "checked / unchecked", 2.0);
        Line prediction(n + "overflow test / pure read", memory ? 1.25 : 2.0);
        Line openCv(n + "ours / OpenCV", 1.0);
        Line plain(n + "ours / plain rules", 1.0);
        for (const Combination& c : combinations) {
            const std::string cell = cellName(c);
            const std::string copy = caseName("memcpy", count, std::to_string(typeSizes[c.srcId] + typeSizes[c.dstId]));
            // Memory may be read slower than it is copied: a bound that no conversion can pass.
            const std::string read = caseName("read", count, std::to_string(typeSizes[c.srcId]));
            const bool wraps = overflowFlags[c.srcId][c.dstId] && c.overflow == FXP_OVERFLOW_WRAP;
            ratio(wraps ? wrapping : saturating, c, caseName("convert", count, cell), copy, memory ? read : "");
            if (memory)
                ratio(checkedToCopy, c, caseName("checked", count, cell), copy, read);
            else if (!few)
                ratio(checked, c, caseName("checked", count, cell), caseName("convert", count, cell));
            if (!few) ratio(prediction, c, caseName("overflow_test", count, cell), read);
            ratio(openCv, c, caseName("convert", count, cell), caseName("opencv", count, cell));
            if (!copiesTheBytes(c)) ratio(plain, c, caseName("convert", count, cell), caseName("plain", count, cell));
        }
        for (Line* line : {&saturating, &wrapping, &checked, &checkedToCopy, &prediction, &openCv, &plain})
            line->print(all);
    }
}

template <class... Args> void add(const std::string& name, std::size_t count, Args... args) {
    // Alternating repetitions: a disturbance does not hit one side of a ratio only.
    auto* made = benchmark::RegisterBenchmark(name.c_str(), args...);
    made->Repetitions(count == sizes[3] ? 3 : 5)->Unit(benchmark::kNanosecond);
    made->MinTime(count == sizes[3] ? 0.0001 : 0.002);
}

bool takeFlag(int& argc, char** argv, const char* prefix, std::string& value) {
    for (int i = 1; i < argc; ++i)
        if (std::strncmp(argv[i], prefix, std::strlen(prefix)) == 0) {
            value = argv[i] + std::strlen(prefix);
            std::copy(argv + i + 1, argv + argc, argv + i);
            --argc;
            return true;
        }
    return false;
}

} // namespace

int main(int argc, char** argv) {
    std::string value;
    if (takeFlag(argc, argv, "--level=", value)) {
        const auto levels = availableLevels();
        const auto found = std::find_if(levels.begin(), levels.end(), [&](const Level* l) { return l->name == value; });
        if (found == levels.end()) {
            std::fprintf(stderr, "no level '%s' on this processor\n", value.c_str());
            return 2;
        }
        levelInUse = *found;
    }
    const bool all = takeFlag(argc, argv, "--all", value);
    const bool verbose = takeFlag(argc, argv, "--verbose", value);
    benchmark::Initialize(&argc, argv);
    source(), destination(); // pages touched before anything is timed

    const std::vector<Combination> combinations = allCombinations();
    for (const std::size_t count : sizes) {
        for (const std::size_t bytes : {2, 3, 4, 5, 6, 8, 9, 10, 12, 16})
            add(caseName("memcpy", count, std::to_string(bytes)), count,
                [=](benchmark::State& state) { copyOfTraffic(state, count, bytes); });
        for (const std::size_t bytes : {1, 2, 4, 8})
            add(caseName("read", count, std::to_string(bytes)), count,
                [=](benchmark::State& state) { readAll(state, count, bytes); });
        for (const Combination& c : combinations)
            add(caseName("convert", count, cellName(c)), count,
                [=](benchmark::State& state) { convert(state, c, count, false); });
        for (const Combination& c : combinations) {
            if (levelInUse->convertWhileKept[c.srcId][c.dstId])
                add(caseName("checked", count, cellName(c)), count,
                    [=](benchmark::State& state) { convert(state, c, count, true); });
            if (c.overflow == FXP_OVERFLOW_WRAP &&
                levelInUse->overflows[slotOf(c.srcId, c.dstId, c.overflow, c.rounding)])
                add(caseName("overflow_test", count, cellName(c)), count,
                    [=](benchmark::State& state) { predict(state, c, count); });
        }
        for (const Combination& c : combinations) {
            if (count == sizes[1])
                add(caseName("plain", count, cellName(c)), count,
                    [=](benchmark::State& state) { convertByPlainRules(state, c, count); });
#ifdef QLTYPES_BENCH_OPENCV
            if (openCvMeansTheSame(c))
                add(caseName("opencv", count, cellName(c)), count,
                    [=](benchmark::State& state) { convertByOpenCv(state, c, count); });
#endif
        }
    }
#ifdef QLTYPES_BENCH_OPENCV
    cv::setNumThreads(1);
#else
    std::puts("OpenCV is not here: its lines are left out");
#endif

    Collector collector(!verbose);
    benchmark::RunSpecifiedBenchmarks(&collector);
    printSummary(collector.times(), combinations, all);
    benchmark::Shutdown();
}
