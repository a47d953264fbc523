// `qltypes layout --format svg`: the bytes of structures drawn as a map.
#pragma once

#include <string>

#include "output/Layout.h"

namespace inspector {

/// One picture of all structures of `shown`, below one another. `all` has the structures nested in them.
std::string layoutSvg(const Layout& shown, const Layout& all);

} // namespace inspector
