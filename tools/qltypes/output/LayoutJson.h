// A layout for programs: the keys are stable.
#pragma once

#include <string>

#include "output/Layout.h"

namespace inspector {

/// One JSON document: "types" (those that are no structures), "structures", "refused" and "summary". Offsets and sizes
/// are in bytes; what is not given (a unit, a bound) is null.
std::string layoutJson(const Layout& layout);

/// One JSON document with one node of a structure.
std::string nodeJson(const std::string& structureLabel, const NodeLayout& node);

} // namespace inspector
