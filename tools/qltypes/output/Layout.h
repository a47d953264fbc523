// What `qltypes layout` shows, as plain values: filled by TypeLoader from the library's answers, printed by LayoutText
// and LayoutJson.
#pragma once

#include <cstdint>
#include <optional>
#include <string>
#include <vector>

#include "description/Description.h"

namespace inspector {

/// Why an element does not begin where the one before it ends.
struct Move {
    std::int64_t from = 0; ///< where the element before it ends, in bytes
    std::int64_t alignment = 0;
    std::string reason; ///< "aligned to 8: not built-in, size 24"
};

struct ElementLayout {
    std::string name;
    std::string typeName;
    std::string typeLabel; ///< the type's name for people
    std::vector<std::int64_t> dimensions;
    bool isComplex = false;
    bool isFrameBased = false;
    bool hasVariableDimensions = false;
    double min = 0; ///< -inf when there is none
    double max = 0; ///< +inf when there is none
    std::string unit;
    std::int64_t offset = 0;  ///< in bytes
    std::int64_t size = 0;    ///< in bytes, all values of the element
    std::int64_t padding = 0; ///< bytes behind it that belong to nobody
    std::optional<Move> move;
};

struct StructureLayout {
    std::string name;
    std::string label;
    std::int64_t size = 0; ///< in bytes
    std::int64_t padding = 0;
    std::int64_t numFlatElements = 0;
    std::int64_t numRawElements = 0;
    std::int64_t numDFSElements = 0;
    std::vector<ElementLayout> elements;
};

/// A type that is no structure and not built in.
struct OtherType {
    std::string name;
    std::string kind;   ///< "alias", "number" or "client"
    std::string target; ///< the label of what an alias stands for
    std::int64_t size = 0;
};

struct Layout {
    std::vector<OtherType> otherTypes;
    std::vector<StructureLayout> structures;
    std::vector<Refusal> refusals;
    std::size_t numMessages = 0;
};

} // namespace inspector
