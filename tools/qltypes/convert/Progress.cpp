#include "convert/Progress.h"

#include <algorithm>
#include <cstdio>
#include <string>

#include <sys/stat.h>
#include <unistd.h>

#include <fmt/format.h>

namespace inspector {
namespace {

using namespace std::chrono_literals;

constexpr std::size_t barWidth = 40;

} // namespace

Progress::Progress() : isTerminal_(isatty(STDERR_FILENO) == 1), next_(std::chrono::steady_clock::now() + 500ms) {
    struct stat input {};
    if (fstat(STDIN_FILENO, &input) == 0 && S_ISREG(input.st_mode)) total_ = static_cast<std::size_t>(input.st_size);
}

Progress::~Progress() {
    if (isDrawn_) std::fputs("\r\x1b[K", stderr);
}

void Progress::show(std::size_t numBytes) {
    if (!isTerminal_) return;
    const auto now = std::chrono::steady_clock::now();
    if (now < next_) return;
    next_ = now + 100ms;
    isDrawn_ = true;
    const std::size_t megabytes = numBytes >> 20;
    if (total_ == 0) {
        fmt::print(stderr, "\r{} MiB\x1b[K", megabytes);
    } else {
        const double part = std::min(1.0, static_cast<double>(numBytes) / static_cast<double>(total_));
        const auto numDone = static_cast<std::size_t>(part * static_cast<double>(barWidth));
        fmt::print(stderr, "\r[{:<{}}] {:3.0f} % {} MiB\x1b[K", std::string(numDone, '#'), barWidth, part * 100.0,
                   megabytes);
    }
    std::fflush(stderr);
}

} // namespace inspector
