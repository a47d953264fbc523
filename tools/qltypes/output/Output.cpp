#include "output/Output.h"

#include <cerrno>
#include <cstdio>
#include <system_error>

#include <unistd.h>

namespace inspector {

Colours coloursOfOutput() { return Colours(isatty(STDOUT_FILENO) == 1); }

void print(const std::string& text) {
    const std::size_t numWritten = std::fwrite(text.data(), 1, text.size(), stdout);
    if (numWritten != text.size() || std::fflush(stdout) != 0)
        throw std::system_error(errno, std::generic_category(), "standard output");
}

} // namespace inspector
