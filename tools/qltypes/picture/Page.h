// `qltypes layout --format html`: a page of the whole table that needs nothing but itself.
#pragma once

#include <string>

#include "output/Layout.h"

namespace inspector {

/// A page with a tree of the structures of `shown` and of all types that are no structures, byte maps, numberings and
/// the types that each structure uses. `all` has the structures nested in the shown ones. The page fetches nothing.
std::string layoutPage(const std::string& title, const Layout& shown, const Layout& all);

} // namespace inspector
