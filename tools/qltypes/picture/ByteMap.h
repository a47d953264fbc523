// The bytes of a structure as rows of eight, with what lies in them: what a picture of it shows, before any drawing.
//
// A row is one word of eight bytes. Nested structures always begin and end with a row, because the library aligns them
// to 8 and rounds their sizes up to 8. What would repeat itself is left out and stands as one gap: the middle of a long
// array, all but the first of many nested structures.
//
//   const ByteMap map = byteMap(structure, structuresByName(layout));
#pragma once

#include <cstddef>
#include <cstdint>
#include <map>
#include <string>
#include <vector>

#include "output/Layout.h"

namespace inspector {

/// Bytes from `offset` up to but not including `end`, in words.
struct MapRow {
    std::int64_t offset = 0;
    std::int64_t end = 0;
    std::string gap;       ///< what is left out here; empty for a word that is shown
    bool isOfMany = false; ///< whether the gap stands for structures or elements as a whole, which have no block
};

/// A part of the rows that belongs together: from one byte of a row to the end of a byte of another.
struct MapSpan {
    std::size_t firstRow = 0;
    std::size_t lastRow = 0;
    int firstByte = 0; ///< in the first row, 0 to 7
    int endByte = 8;   ///< in the last row, 1 to 8
};

/// A leaf, a nested structure that is not opened, or padding.
struct MapBlock {
    MapSpan span;
    bool isPadding = false;
    TypeKind kind = TypeKind::Other;
    std::string name;  ///< with its dimensions
    std::string path;  ///< with the structures around it, for people
    std::string type;  ///< with "complex"
    std::string notes; ///< unit, bounds, why it was moved
    std::int64_t offset = 0;
    std::int64_t size = 0;
    std::int64_t valueSize = 0; ///< bytes of one value, a complex one as a whole
};

/// A nested structure around rows. Its depth is 0 directly inside the structure that is shown.
struct MapNest {
    MapSpan span;
    int depth = 0;
    std::string name;
    std::string path;
    std::string type;
    std::int64_t offset = 0;
    std::int64_t size = 0;
};

struct ByteMap {
    std::vector<MapRow> rows;
    std::vector<MapBlock> blocks;
    std::vector<MapNest> nests;
    int depth = 0; ///< number of levels of nests
};

using StructuresByName = std::map<std::string, const StructureLayout*>;

/// The structures of a layout, which must live as long as the result is used.
StructuresByName structuresByName(const Layout& layout);

/// The map of a structure. `all` has the structures nested in it. Levels of nesting are left closed where the map would
/// become longer than a few hundred rows; a structure of too many elements of its own ends in a gap.
ByteMap byteMap(const StructureLayout& structure, const StructuresByName& all);

} // namespace inspector
