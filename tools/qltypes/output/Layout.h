// What `qltypes layout` shows, as plain values: filled by TypeLoader from the library's answers, printed by LayoutText,
// LayoutJson and the pictures.
#pragma once

#include <cstdint>
#include <optional>
#include <string>
#include <utility>
#include <vector>

#include "description/Description.h"
#include "dims/KnownFacts.h"

namespace inspector {

/// Why an element does not begin where the one before it ends.
struct Move {
    std::int64_t from = 0; ///< where the element before it ends, in bytes
    std::int64_t alignment = 0;
    std::string reason; ///< "aligned to 8: not built-in, size 24"
};

/// What holds one value in C.
struct CType {
    enum class Kind { Number, Structure, Bytes };
    Kind kind = Kind::Bytes;
    std::string name; ///< of the number's type, of the structure, or of a byte
    std::int64_t size = 0;
    std::int64_t alignment = 1; ///< of the C type, in bytes; that of a structure as it is declared here
};

/// What sort of value a type holds, behind its aliases.
enum class TypeKind { Float, Integer, Boolean, FixedPoint, Enumeration, Structure, Other };

struct ElementLayout {
    std::string name;
    std::string typeName;
    std::string typeLabel; ///< the type's name for people
    TypeKind typeKind = TypeKind::Other;
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
    CType cType;
};

/// A node of a structure with its numbers.
struct NodeLayout {
    std::string path; ///< from the structure down, "y(1).b"; empty for the structure itself
    std::int64_t depthFirst = 0;
    std::optional<std::int64_t> flat;                         ///< of a leaf
    std::optional<std::pair<std::int64_t, std::int64_t>> raw; ///< of a leaf: its first and last value
    std::optional<std::int64_t> immediate;                    ///< of a direct child
    std::string typeName;
    std::string typeLabel; ///< the type's name for people
    bool isComplex = false;
    std::int64_t offset = 0; ///< in bytes, from the start of the structure
    std::int64_t width = 0;
    std::optional<std::pair<std::string, std::int64_t>> parent; ///< label of the structure around it, index in that
};

/// How a structure enters a checksum.
struct ChecksumLayout {
    std::vector<std::string> descriptions; ///< one text an element, in order
    std::string digest;                    ///< four words of 32 bits, each as eight hexadecimal digits
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
    std::vector<NodeLayout> nodes;          ///< in depth-first order; empty unless they were asked for
    std::optional<ChecksumLayout> checksum; ///< where it was asked for
};

/// A type that is no structure and not built in.
struct OtherType {
    std::string name;
    std::string kind; ///< "alias", "number", "client", "enumeration", "string", "matrix", "image" or "date-time"
    TypeKind typeKind = TypeKind::Other;
    std::string target; ///< the label of what an alias stands for
    std::int64_t size = 0;
    std::string storage; ///< of an enumeration: the type that holds its values
    std::vector<EnumerationMember> members;
};

struct Layout {
    std::vector<OtherType> otherTypes;
    std::vector<StructureLayout> structures;
    std::vector<Refusal> refusals;
    std::size_t numMessages = 0;
    std::vector<KnownFacts> knownFacts; ///< of symbolic dimensions, one for each script
};

} // namespace inspector
