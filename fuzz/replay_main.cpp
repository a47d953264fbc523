// Runs a fuzz target over saved inputs without a fuzzer: every file named, and every file in the folders named.
#include <filesystem>
#include <fstream>
#include <iterator>
#include <vector>

#include "fuzz/Fuzz.h"

namespace {

bool replay(const std::filesystem::path& path) {
    std::ifstream in(path, std::ios::binary);
    const std::vector<char> bytes((std::istreambuf_iterator<char>(in)), std::istreambuf_iterator<char>());
    if (!in.is_open() || in.bad()) {
        std::fprintf(stderr, "cannot read %s\n", path.c_str());
        return false;
    }
    // A copy of the exact size, so that a read beyond the end shows under the address sanitizer.
    const std::vector<std::uint8_t> input(bytes.begin(), bytes.end());
    LLVMFuzzerTestOneInput(input.data(), input.size());
    return true;
}

} // namespace

int main(int argc, char** argv) {
    int numInputs = 0;
    for (int i = 1; i < argc; ++i) {
        std::vector<std::filesystem::path> paths{argv[i]};
        if (std::filesystem::is_directory(argv[i]))
            paths.assign(std::filesystem::directory_iterator(argv[i]), std::filesystem::directory_iterator());
        for (const std::filesystem::path& path : paths) {
            if (!replay(path)) return 2;
            ++numInputs;
        }
    }
    std::printf("%d inputs\n", numInputs);
    return numInputs > 0 ? 0 : 2;
}
