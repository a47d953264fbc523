// What a script of dims states, for other commands than dims: the facts as a list and as a graph.
#pragma once

#include <string>
#include <vector>

#include "dims/FactGraph.h"

namespace inspector {

struct KnownFacts {
    struct Fact {
        std::string expression;
        std::vector<std::string> blocks; ///< that stated it
    };
    std::string source; ///< the file
    std::vector<Fact> facts;
    FactGraph graph;
};

/// Runs the script `text` of a file; what it asks is not answered. Throws InputError for a statement that is wrong or
/// that contradicts earlier ones.
KnownFacts readKnownFacts(const std::string& file, const std::string& text);

} // namespace inspector
