#include "picture/ByteMap.h"

#include <algorithm>
#include <utility>

#include <fmt/format.h>

#include "output/ElementText.h"

namespace inspector {
namespace {

constexpr std::int64_t bytesOfRow = 8;
constexpr int mostLevels = 6;
constexpr std::int64_t rowsWanted = 400;   // with nested structures opened
constexpr std::size_t mostRows = 2000;     // in any case
constexpr std::int64_t longestArray = 6;   // rows of a leaf that are all shown
constexpr std::int64_t longestNested = 12; // rows of an array of structures that are all shown

std::string joined(const std::string& path, const std::string& name) { return path.empty() ? name : path + "." + name; }

// The rows of a block that has so many words: of a long array the first two, a gap and the last one are shown, of a
// structure that is not opened the first word and a gap.
std::int64_t rowsOfBlock(std::int64_t numWords, TypeKind kind) {
    if (kind == TypeKind::Structure) return std::min<std::int64_t>(numWords, 2);
    return std::min(numWords, longestArray);
}

// Which part of an array of structures is opened.
struct Opened {
    std::int64_t numOpened;
    std::int64_t numLeftOut;
};

// Counts the rows of structures, opened down to a number of levels.
class RowCounter {
  public:
    explicit RowCounter(const StructuresByName& all) : all_(all) {}

    std::int64_t rows(const StructureLayout& structure, int levels) {
        const auto key = std::pair(&structure, levels);
        if (const auto at = known_.find(key); at != known_.end()) return at->second;
        std::int64_t count = 0;
        std::int64_t lastWord = -1; // that has a row already
        for (const ElementLayout& element : structure.elements) {
            const std::int64_t firstWord = element.offset / bytesOfRow;
            const bool isShared = firstWord == lastWord;
            lastWord = (element.offset + element.size - 1) / bytesOfRow;
            std::int64_t here = rowsOfBlock(lastWord - firstWord + 1, element.typeKind) - (isShared ? 1 : 0);
            if (element.typeKind == TypeKind::Structure && levels > 0) {
                const StructureLayout& nested = *all_.at(element.cType.name);
                const Opened opened = openedOf(element, nested, levels - 1);
                here = opened.numOpened * rows(nested, levels - 1) + (opened.numLeftOut > 0 ? 1 : 0);
            }
            count = std::min(count + here, enough); // never too large for the next sum
        }
        return known_[key] = count;
    }

    Opened openedOf(const ElementLayout& element, const StructureLayout& nested, int levels) {
        const std::int64_t count = numValues(element);
        const bool isShort = count <= 2 || count <= longestNested / std::max<std::int64_t>(rows(nested, levels), 1);
        return isShort ? Opened{count, 0} : Opened{1, count - 1};
    }

  private:
    static constexpr std::int64_t enough = 1'000'000;
    const StructuresByName& all_;
    std::map<std::pair<const StructureLayout*, int>, std::int64_t> known_;
};

class Builder {
  public:
    Builder(const StructuresByName& all) : all_(all), counter_(all) {}

    ByteMap map(const StructureLayout& structure) {
        int levels = mostLevels;
        while (levels > 0 && counter_.rows(structure, levels) > rowsWanted)
            --levels;
        levels_ = levels;
        for (std::size_t i = 0; i < structure.elements.size(); ++i) {
            if (map_.rows.size() >= mostRows) {
                addRest(structure, i);
                break;
            }
            add(structure.elements[i], 0, 0, "");
        }
        return std::move(map_);
    }

  private:
    // All elements from the first one left out on.
    void addRest(const StructureLayout& structure, std::size_t first) {
        const std::size_t count = structure.elements.size() - first;
        const std::int64_t from = map_.rows.back().end;
        if (from < structure.size)
            map_.rows.push_back({from, structure.size, fmt::format("{} more elements", count), true});
    }

    void addAll(const StructureLayout& structure, std::int64_t base, int depth, const std::string& path) {
        for (const ElementLayout& element : structure.elements)
            add(element, base, depth, path);
    }

    void add(const ElementLayout& element, std::int64_t base, int depth, const std::string& path) {
        if (element.typeKind == TypeKind::Structure && depth < levels_)
            addNested(element, base, depth, path);
        else
            addLeaf(element, base, path);
        if (element.padding > 0) addPadding(element, base, path);
    }

    void addNested(const ElementLayout& element, std::int64_t base, int depth, const std::string& path) {
        const StructureLayout& nested = *all_.at(element.cType.name);
        const Opened opened = counter_.openedOf(element, nested, levels_ - depth - 1);
        const std::int64_t offset = base + element.offset;
        for (std::int64_t i = 0; i < opened.numOpened; ++i) {
            const std::string name = numValues(element) > 1 ? fmt::format("{}({})", element.name, i) : element.name;
            const std::size_t firstRow = map_.rows.size();
            const std::int64_t from = offset + i * nested.size;
            addAll(nested, from, depth + 1, joined(path, name));
            addNest(element, firstRow, depth, name, path, from, nested.size);
        }
        if (opened.numLeftOut == 0) return;
        const std::int64_t from = offset + nested.size;
        const std::int64_t size = opened.numLeftOut * nested.size;
        map_.rows.push_back(
            {from, from + size, fmt::format("{} more of {} bytes", opened.numLeftOut, nested.size), true});
        const std::string name = opened.numLeftOut == 1
                                     ? element.name + "(1)"
                                     : fmt::format("{0}(1) \u2013 ({1})", element.name, opened.numLeftOut);
        addNest(element, map_.rows.size() - 1, depth, name, path, from, size);
    }

    void addNest(const ElementLayout& element, std::size_t firstRow, int depth, const std::string& name,
                 const std::string& path, std::int64_t offset, std::int64_t size) {
        MapNest nest;
        nest.span.firstRow = firstRow;
        nest.span.lastRow = map_.rows.size() - 1;
        nest.depth = depth;
        nest.name = name;
        nest.path = joined(path, name);
        nest.type = element.typeLabel;
        nest.offset = offset;
        nest.size = size;
        map_.nests.push_back(nest);
        map_.depth = std::max(map_.depth, depth + 1);
    }

    void addLeaf(const ElementLayout& element, std::int64_t base, const std::string& path) {
        MapBlock block;
        block.kind = element.typeKind;
        block.name = nameWithDimensions(element);
        block.path = joined(path, block.name);
        block.type = typeText(element.isComplex, element.typeLabel);
        block.notes = notesOf(element);
        block.offset = base + element.offset;
        block.size = element.size;
        block.valueSize = element.size / numValues(element);
        addRows(block, element.name);
    }

    void addPadding(const ElementLayout& element, std::int64_t base, const std::string& path) {
        MapBlock block;
        block.isPadding = true;
        block.name = fmt::format("{} unused", element.padding);
        block.path = joined(path, "(padding)");
        block.offset = base + element.offset + element.size;
        block.size = element.padding;
        addRows(block, "");
    }

    // Adds the rows that a block needs, and the block.
    void addRows(MapBlock& block, const std::string& name) {
        const std::int64_t end = block.offset + block.size;
        const std::int64_t firstWord = block.offset / bytesOfRow;
        const std::int64_t lastWord = (end - 1) / bytesOfRow;
        block.span.firstRow = rowOf(firstWord);
        if (block.kind == TypeKind::Structure) {
            if (lastWord > firstWord) addGap(firstWord + 1, lastWord + 1, name);
        } else if (lastWord - firstWord < longestArray) {
            for (std::int64_t word = firstWord + 1; word <= lastWord; ++word)
                rowOf(word);
        } else {
            rowOf(firstWord + 1);
            addGap(firstWord + 2, lastWord, name);
            rowOf(lastWord);
        }
        block.span.lastRow = map_.rows.size() - 1;
        block.span.firstByte = static_cast<int>(block.offset % bytesOfRow);
        block.span.endByte = static_cast<int>((end - 1) % bytesOfRow) + 1;
        map_.blocks.push_back(block);
    }

    void addGap(std::int64_t firstWord, std::int64_t endWord, const std::string& name) {
        const std::int64_t from = firstWord * bytesOfRow;
        const std::int64_t to = endWord * bytesOfRow;
        map_.rows.push_back({from, to, fmt::format("{} more bytes of {}", to - from, name), false});
    }

    // The row of a word, which is the last one or new.
    std::size_t rowOf(std::int64_t word) {
        const std::int64_t offset = word * bytesOfRow;
        if (map_.rows.empty() || map_.rows.back().offset != offset)
            map_.rows.push_back({offset, offset + bytesOfRow, "", false});
        return map_.rows.size() - 1;
    }

    const StructuresByName& all_;
    RowCounter counter_;
    int levels_ = 0;
    ByteMap map_;
};

} // namespace

StructuresByName structuresByName(const Layout& layout) {
    StructuresByName byName;
    for (const StructureLayout& structure : layout.structures)
        byName.emplace(structure.name, &structure);
    return byName;
}

ByteMap byteMap(const StructureLayout& structure, const StructuresByName& all) { return Builder(all).map(structure); }

} // namespace inspector
