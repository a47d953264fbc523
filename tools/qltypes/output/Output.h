// Standard output, written once a command has all that it wants to say: bad input leaves no half of a table behind.
#pragma once

#include <string>

#include "output/TextTable.h"

namespace inspector {

/// Colours when standard output is a terminal.
Colours coloursOfOutput();

/// Writes the text to standard output. Throws std::system_error when it cannot be written.
void print(const std::string& text);

} // namespace inspector
