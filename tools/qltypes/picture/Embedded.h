// Files of this folder that the build puts into the command.
#pragma once

#include <string_view>

namespace inspector {

/// map.css: colours and lines of a byte map.
std::string_view mapStyle();

/// The files of page/: the page with marks where the others belong, its style, its scripts in the order of their needs.
std::string_view pageText();
std::string_view pageStyle();
std::string_view pageModel();
std::string_view pageList();
std::string_view pageTree();
std::string_view pageMap();
std::string_view pageGraph();
std::string_view pageScript();

} // namespace inspector
