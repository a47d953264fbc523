#include "description/Files.h"

#include <cerrno>
#include <fstream>
#include <iostream>
#include <iterator>
#include <system_error>

#include "description/Description.h"

namespace inspector {
namespace {

std::string allOf(std::istream& stream) { return {std::istreambuf_iterator<char>(stream), {}}; }

} // namespace

std::string readFileText(const std::filesystem::path& file) {
    const auto fail = [&](int reason) {
        throw InputError({file.string(), ""}, "cannot be read: " + std::generic_category().message(reason));
    };
    std::error_code error;
    if (std::filesystem::is_directory(file, error)) fail(EISDIR);
    errno = 0;
    std::ifstream stream(file, std::ios::binary);
    if (!stream) fail(errno ? errno : EIO);
    std::string text = allOf(stream);
    if (stream.bad()) fail(EIO);
    return text;
}

std::string readStandardInput() { return allOf(std::cin); }

} // namespace inspector
