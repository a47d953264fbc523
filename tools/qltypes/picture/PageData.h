// What the page knows: the layout as JSON, as far as the page cannot find it out itself.
#pragma once

#include <nlohmann/json.hpp>

#include "output/Layout.h"

namespace inspector {

/// Types by index, structures with their immediate elements, messages that were refused. Values that are the usual ones
/// are left out.
nlohmann::ordered_json pageData(const std::string& title, const Layout& shown, const Layout& all);

} // namespace inspector
