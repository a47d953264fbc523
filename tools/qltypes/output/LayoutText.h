// A layout for people.
#pragma once

#include <string>

#include "output/Layout.h"
#include "output/TextTable.h"

namespace inspector {

/// A table for each structure, then the refused messages and a summary. `isSelection` leaves out what is not a table or
/// the summary.
std::string layoutText(const Layout& layout, bool isSelection, const Colours& colours);

/// One node of a structure, a line a property.
std::string nodeText(const std::string& structureLabel, const NodeLayout& node, const Colours& colours);

} // namespace inspector
