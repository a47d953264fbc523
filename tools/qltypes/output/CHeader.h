// Structures as C declarations that a compiler checks against the layout.
#pragma once

#include <string>

#include "output/Layout.h"

namespace inspector {

/// A header with the structures and a static assertion for every size and offset. `layout` has each structure behind
/// those that it contains. `withPadding` declares padding as members.
///
/// A structure that the compiler's own rule would lay out otherwise is packed, and its members are aligned one by one.
/// Names that C keeps for itself get "x_" in front. An element with several dimensions becomes an array of one, with
/// all its values in the order of memory.
std::string cHeader(const Layout& layout, bool withPadding);

} // namespace inspector
