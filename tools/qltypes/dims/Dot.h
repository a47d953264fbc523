// The facts of a session as a graph in the language of Graphviz.
#pragma once

#include <string>

#include "dims/Session.h"

namespace inspector {

/// One node a dimension with its range, one cluster a class of equal ones, one arrow a greater-than, labelled with the
/// blocks that stated it.
std::string dotText(const Session& session);

} // namespace inspector
