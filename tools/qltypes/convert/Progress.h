// A bar on standard error for input that takes its time; nothing where standard error is no terminal.
#pragma once

#include <chrono>
#include <cstddef>

namespace inspector {

class Progress {
  public:
    Progress();
    /// Removes the bar.
    ~Progress();
    Progress(const Progress&) = delete;
    Progress& operator=(const Progress&) = delete;

    /// Tells how many bytes of standard input were read. Draws ten times a second at most, and not in the first half
    /// second.
    void show(std::size_t numBytes);

  private:
    bool isTerminal_;
    bool isDrawn_ = false;
    std::size_t total_ = 0; // 0: not known
    std::chrono::steady_clock::time_point next_;
};

} // namespace inspector
