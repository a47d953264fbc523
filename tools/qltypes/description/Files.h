// Whole files as texts.
#pragma once

#include <filesystem>
#include <string>

namespace inspector {

/// The text of a file. Throws InputError with the system's reason when it cannot be read.
std::string readFileText(const std::filesystem::path& file);

/// The text of standard input.
std::string readStandardInput();

} // namespace inspector
