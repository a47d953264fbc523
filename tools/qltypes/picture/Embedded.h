// Files of this folder that the build puts into the command.
#pragma once

#include <string_view>

namespace inspector {

/// map.css: colours and lines of a byte map.
std::string_view mapStyle();

} // namespace inspector
