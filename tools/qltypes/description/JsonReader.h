// Reads a JSON type description; type-description.schema.json beside the inspector's sources is its documentation.
#pragma once

#include <string>

#include "description/Description.h"

namespace inspector {

/// Reads the text of a description. Throws InputError at the first thing that is wrong: with line and column where the
/// text is no JSON, with a JSON pointer where it is. References are not looked at.
Description readJsonDescription(const std::string& file, const std::string& text);

} // namespace inspector
