// What loading libqltypes costs, beside an empty library of the same dependencies: each in a fresh process.
#include <cstdlib>
#include <cstring>

#include <dlfcn.h>
#include <sys/wait.h>
#include <unistd.h>

#include <benchmark/benchmark.h>

namespace {

// Runs this program once more as a process that loads `library` and ends.
void loadInAFreshProcess(benchmark::State& state, const char* library) {
    for (auto _ : state) {
        const pid_t child = fork();
        if (child == 0) {
            execl("/proc/self/exe", "load_bench", "--load", library, static_cast<char*>(nullptr));
            _exit(127);
        }
        int status = 0;
        waitpid(child, &status, 0);
        if (!WIFEXITED(status) || WEXITSTATUS(status) != 0) state.SkipWithError("the library did not load");
    }
}

void loadQltypes(benchmark::State& state) { loadInAFreshProcess(state, LIBRARY); }
void loadEmpty(benchmark::State& state) { loadInAFreshProcess(state, EMPTY_LIBRARY); }

BENCHMARK(loadQltypes)->Unit(benchmark::kMillisecond)->UseRealTime();
BENCHMARK(loadEmpty)->Unit(benchmark::kMillisecond)->UseRealTime();

} // namespace

int main(int argc, char** argv) {
    if (argc == 3 && std::strcmp(argv[1], "--load") == 0) return dlopen(argv[2], RTLD_NOW) ? 0 : 1;
    benchmark::Initialize(&argc, argv);
    benchmark::RunSpecifiedBenchmarks();
}
