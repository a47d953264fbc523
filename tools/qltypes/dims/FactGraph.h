// What a session knows of its dimensions, as plain values: classes of equal ones, and which is greater than which.
#pragma once

#include <cstddef>
#include <string>
#include <vector>

namespace inspector {

class Session;

struct FactGraph {
    /// A size that facts are about; a number is none.
    struct Node {
        std::string name;
        std::string bounds; ///< "16 to 512"; empty where there are none
    };
    struct Greater {
        std::size_t greater = 0;
        std::size_t smaller = 0;
        std::vector<std::string> blocks; ///< that stated it
    };
    std::vector<Node> nodes;
    std::vector<std::vector<std::size_t>> classes; ///< of equal nodes; each node is in one
    std::vector<Greater> greater;
};

/// The same graph for the same facts, whatever order the library lists them in.
FactGraph factGraph(const Session& session);

} // namespace inspector
