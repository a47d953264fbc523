#include "picture/Svg.h"

#include <algorithm>
#include <set>
#include <utility>

#include <fmt/format.h>

#include "picture/ByteMap.h"
#include "picture/Embedded.h"
#include "picture/Escape.h"
#include "picture/KindStyle.h"
#include "qlplatform/strings/Strings.h"

namespace inspector {
namespace {

// Lengths in pixels.
constexpr double margin = 16;
constexpr double byteWidth = 72;
constexpr double cellsWidth = 8 * byteWidth;
constexpr double rowHeight = 38;
constexpr double gapHeight = 26;
constexpr double offsetWidth = 56;
constexpr double lineNameGap = 14; // between the cells and the names of cache lines
constexpr double textMargin = 7;
constexpr double nameCharacter = 7.3; // width of one in the font of names, and of types
constexpr double typeCharacter = 6.4;
constexpr double noteHeight = 18;

constexpr std::int64_t cacheLine = 64;

std::size_t numCharacters(const std::string& text) { return qlsvUtf16FromUtf8(text).size(); }

// The text, or its beginning and an ellipsis.
std::string shortened(const std::string& text, double width, double character) {
    const auto fitting = static_cast<std::size_t>(std::max(width / character, 1.0));
    std::u16string units = qlsvUtf16FromUtf8(text);
    if (units.size() <= fitting) return text;
    units.resize(fitting - 1);
    return qlsvUtf8FromUtf16(units) + "\u2026";
}

std::string plural(std::int64_t count, const char* what) {
    return fmt::format("{} {}{}", count, what, count == 1 ? "" : "s");
}

// The map of one structure, drawn from a height on.
class MapWriter {
  public:
    MapWriter(const StructureLayout& structure, const StructuresByName& all)
        : structure_(structure), map_(byteMap(structure, all)) {
        nestWidths_.assign(static_cast<std::size_t>(map_.depth), 64);
        for (const MapNest& nest : map_.nests) {
            double& width = nestWidths_[static_cast<std::size_t>(nest.depth)];
            const double name = static_cast<double>(numCharacters(nest.name)) * nameCharacter;
            const double type = static_cast<double>(numCharacters(nest.type)) * typeCharacter;
            width = std::clamp(std::max(name, type) + 2 * textMargin + 2, width, 190.0);
        }
        left_ = margin + offsetWidth;
        for (const double width : nestWidths_)
            left_ += width;
        for (const MapRow& row : map_.rows)
            lineNameWidth_ =
                std::max(lineNameWidth_, static_cast<double>(numCharacters(lineName(row))) * typeCharacter);
    }

    double width() const { return left_ + cellsWidth + lineNameGap + lineNameWidth_ + margin; }
    double bottom() const { return y_; }
    const ByteMap& map() const { return map_; }

    std::string draw(double top) {
        y_ = top;
        drawTitle();
        placeRows();
        for (const MapNest& nest : map_.nests)
            drawNest(nest);
        for (const MapBlock& block : map_.blocks)
            drawBlock(block);
        drawRows();
        drawNotes();
        return std::move(text_);
    }

  private:
    template <class... Arguments> void add(fmt::format_string<Arguments...> format, Arguments&&... arguments) {
        text_ += fmt::format(format, std::forward<Arguments>(arguments)...);
    }

    double columnOf(int byte) const { return left_ + byte * byteWidth; }
    double topOf(std::size_t row) const { return tops_[row]; }
    double bottomOf(std::size_t row) const { return tops_[row + 1]; }
    bool isGap(std::size_t row) const { return !map_.rows[row].gap.empty(); }

    void drawTitle() {
        const std::int64_t numLines = (structure_.size + cacheLine - 1) / cacheLine;
        const std::string padding =
            structure_.padding == 0 ? "no padding" : fmt::format("{} of them padding", structure_.padding);
        add("<text class=\"title\" x=\"{}\" y=\"{}\">{}</text>\n", margin, y_ + 16, escapedForXml(structure_.label));
        add("<text class=\"about\" x=\"{}\" y=\"{}\">{}, {}; {}</text>\n", margin, y_ + 36,
            plural(structure_.size, "byte"), padding, plural(numLines, "cache line"));
        for (int byte = 0; byte < 8; ++byte) {
            add("<text class=\"offset middle\" x=\"{}\" y=\"{}\">+{}</text>\n", columnOf(byte) + byteWidth / 2, y_ + 60,
                byte);
        }
        y_ += 66;
    }

    void placeRows() {
        for (std::size_t row = 0; row < map_.rows.size(); ++row) {
            tops_.push_back(y_);
            y_ += isGap(row) ? gapHeight : rowHeight;
        }
        tops_.push_back(y_);
    }

    void drawNest(const MapNest& nest) {
        const auto depth = static_cast<std::size_t>(nest.depth);
        double x = margin + offsetWidth;
        for (std::size_t i = 0; i < depth; ++i)
            x += nestWidths_[i];
        // An innermost one reaches to the cells.
        const bool isInnermost = std::none_of(map_.nests.begin(), map_.nests.end(), [&](const MapNest& other) {
            return other.depth > nest.depth && other.span.firstRow >= nest.span.firstRow &&
                   other.span.lastRow <= nest.span.lastRow;
        });
        const double width = isInnermost ? left_ - x : nestWidths_[depth];
        const double top = topOf(nest.span.firstRow);
        const double height = bottomOf(nest.span.lastRow) - top;
        add("<g><title>{}</title>", escapedForXml(fmt::format("{}: {}\noffset {}, {}", nest.path, nest.type,
                                                              nest.offset, plural(nest.size, "byte"))));
        add("<rect class=\"nest nest-{}\" x=\"{}\" y=\"{}\" width=\"{}\" height=\"{}\"/>", depth % 2, x, top, width,
            height);
        const bool hasType = height > gapHeight;
        addText("name", x + textMargin, top + (hasType ? 16 : 17), nest.name, width - 2 * textMargin, nameCharacter);
        if (hasType) addText("type", x + textMargin, top + 30, nest.type, width - 2 * textMargin, typeCharacter);
        text_ += "</g>\n";
    }

    // The cache lines that begin in a row; empty for none.
    static std::string lineName(const MapRow& row) {
        const std::int64_t first = (row.offset + cacheLine - 1) / cacheLine;
        const std::int64_t last = (row.end - 1) / cacheLine;
        if (first > last) return "";
        return first == last ? fmt::format("line {}", first) : fmt::format("lines {}\u2013{}", first, last);
    }

    // Returns whether the text is there in full.
    bool addText(const char* style, double x, double y, const std::string& text, double width, double character) {
        const std::string fitting = shortened(text, width, character);
        add("<text class=\"{}\" x=\"{}\" y=\"{}\">{}</text>", style, x, y, escapedForXml(fitting));
        return fitting == text;
    }

    void drawBlock(const MapBlock& block) {
        const MapSpan& span = block.span;
        const char* const style = block.isPadding ? "padding" : styleOf(block.kind).style;
        std::string about = fmt::format("{}{}{}\noffset {}, {}", block.path, block.type.empty() ? "" : ": ", block.type,
                                        block.offset, plural(block.size, "byte"));
        if (!block.notes.empty()) about += "\n" + block.notes;
        add("<g><title>{}</title>", escapedForXml(about));
        const std::string outline = outlineOf(span);
        add("<path class=\"fill {}\" d=\"{}\"/>", style, outline);
        if (block.isPadding) add("<path class=\"fill\" fill=\"url(#hatch)\" d=\"{}\"/>", outline);
        drawTicks(block);
        add("<path class=\"edge\" d=\"{}\"/>", outline);
        drawBlockText(block);
        text_ += "</g>\n";
    }

    // Around all bytes of a span; where its two ends lie in neighbouring rows, a line between them belongs to both.
    std::string outlineOf(const MapSpan& span) const {
        const double first = columnOf(span.firstByte);
        const double end = columnOf(span.endByte);
        const double top = topOf(span.firstRow);
        const double bottom = bottomOf(span.lastRow);
        if (span.firstRow == span.lastRow) return fmt::format("M{} {}H{}V{}H{}Z", first, top, end, bottom, first);
        return fmt::format("M{0} {1}H{2}V{3}H{4}V{5}H{6}V{7}H{0}Z", first, top, columnOf(8), topOf(span.lastRow), end,
                           bottom, columnOf(0), bottomOf(span.firstRow));
    }

    // Between the values of an array.
    void drawTicks(const MapBlock& block) {
        if (block.isPadding || block.valueSize == block.size) return;
        const std::size_t rowOfText = textPlaceOf(block.span).row;
        for (std::size_t row = block.span.firstRow; row <= block.span.lastRow; ++row) {
            if (isGap(row)) continue;
            const int first = row == block.span.firstRow ? block.span.firstByte : 0;
            const int end = row == block.span.lastRow ? block.span.endByte : 8;
            for (int byte = first; byte < end; ++byte) {
                const std::int64_t into = map_.rows[row].offset + byte - block.offset;
                if (into % block.valueSize != 0 || into == 0) continue;
                if (byte > first)
                    add("<path class=\"tick\" d=\"M{} {}V{}\"/>", columnOf(byte),
                        row == rowOfText ? bottomOf(row) - 6 : topOf(row), bottomOf(row));
                else
                    add("<path class=\"tick\" d=\"M{} {}H{}\"/>", columnOf(first), topOf(row), columnOf(end));
            }
        }
    }

    // Where the texts of a block stand: in the wider of its first two rows.
    struct TextPlace {
        std::size_t row;
        int firstByte;
        int endByte;
    };
    TextPlace textPlaceOf(const MapSpan& span) const {
        const TextPlace first = {span.firstRow, span.firstByte, span.firstRow == span.lastRow ? span.endByte : 8};
        if (span.lastRow == span.firstRow || isGap(span.firstRow + 1)) return first;
        const TextPlace second = {span.firstRow + 1, 0, span.lastRow == span.firstRow + 1 ? span.endByte : 8};
        return second.endByte > first.endByte - first.firstByte ? second : first;
    }

    // Name and type; what does not fit is told below the map.
    void drawBlockText(const MapBlock& block) {
        const auto [row, first, end] = textPlaceOf(block.span);
        const double width = (end - first) * byteWidth - 2 * textMargin;
        const double x = columnOf(first) + textMargin;
        if (block.isPadding) {
            add("<rect class=\"unused\" x=\"{}\" y=\"{}\" width=\"{}\" height=\"16\" rx=\"3\"/>", x - 3,
                topOf(row) + 11, static_cast<double>(numCharacters(block.name)) * typeCharacter + 6);
            addText("type", x, topOf(row) + 23, block.name, width, typeCharacter);
            return;
        }
        const bool hasName = addText("name", x, topOf(row) + 16, block.name, width, nameCharacter);
        const bool hasType = addText("type", x, topOf(row) + 30, block.type, width, typeCharacter);
        if (!hasName || !hasType) notes_.push_back(fmt::format("at {}: {}, {}", block.offset, block.path, block.type));
    }

    // Offsets, gaps and the beginnings of cache lines.
    void drawRows() {
        for (std::size_t row = 0; row < map_.rows.size(); ++row) {
            const std::int64_t offset = map_.rows[row].offset;
            const std::string& gap = map_.rows[row].gap;
            const double middle = (topOf(row) + bottomOf(row)) / 2 + 4;
            add("<text class=\"offset\" x=\"{}\" y=\"{}\">{}</text>\n", margin + offsetWidth - 10, middle, offset);
            if (!gap.empty()) drawGap(row);
            const std::string name = lineName(map_.rows[row]);
            if (name.empty()) continue;
            const bool isMarked = offset % cacheLine == 0 && gap.empty();
            if (isMarked) add("<path class=\"line\" d=\"M{} {}H{}\"/>\n", left_ - 6, topOf(row), columnOf(8) + 8);
            add("<text class=\"line-name\" x=\"{}\" y=\"{}\">{}</text>\n", columnOf(8) + lineNameGap,
                isMarked ? topOf(row) + 4 : middle, name);
        }
        add("<text class=\"offset\" x=\"{}\" y=\"{}\">{}</text>\n", margin + offsetWidth - 10, y_ + 13,
            structure_.size);
        y_ += 22;
    }

    void drawGap(std::size_t row) {
        const double top = topOf(row);
        if (map_.rows[row].isOfMany) {
            const std::string outline = outlineOf({row, row, 0, 8});
            add("<path class=\"fill structure\" d=\"{0}\"/><path class=\"edge\" d=\"{0}\"/>", outline);
        }
        add("<path class=\"tear\" d=\"M{0} {1}H{2}M{0} {3}H{2}\"/>\n", columnOf(0), top + 3, columnOf(8),
            bottomOf(row) - 3);
        add("<text class=\"gap-text middle\" x=\"{}\" y=\"{}\">\u22ee {}</text>\n", columnOf(4), top + 17,
            escapedForXml(map_.rows[row].gap));
    }

    void drawNotes() {
        for (const std::string& note : notes_) {
            add("<text class=\"note\" x=\"{}\" y=\"{}\">{}</text>\n", margin + offsetWidth, y_ + 12,
                escapedForXml(note));
            y_ += noteHeight;
        }
    }

    const StructureLayout& structure_;
    const ByteMap map_;
    std::vector<double> nestWidths_;
    double lineNameWidth_ = 0;
    double left_ = 0;          // of the cells
    double y_ = 0;             // how far the picture is drawn
    std::vector<double> tops_; // of the rows, and the end of the last
    std::vector<std::string> notes_;
    std::string text_;
};

// What the colours and lines mean, as far as they occur.
class Legend {
  public:
    void note(const ByteMap& map) {
        for (const MapBlock& block : map.blocks) {
            if (block.isPadding)
                hasPadding_ = true;
            else
                kinds_.insert(block.kind);
        }
    }

    std::string draw(double& y, double width) {
        x_ = margin;
        y_ = y;
        for (const KindStyle& row : kindStyles) {
            if (kinds_.contains(row.kind)) addSwatch(row.style, row.name, width);
        }
        if (hasPadding_) addSwatch("padding", "padding", width);
        advance(46, "start of a cache line (64 bytes)", width);
        text_ += fmt::format("<path class=\"line\" d=\"M{} {}h30\"/>", x_, y_ + 8);
        addName(36, "start of a cache line (64 bytes)");
        y = y_ + 26;
        return std::move(text_);
    }

  private:
    static double widthOf(const std::string& name) { return static_cast<double>(name.size()) * nameCharacter; }

    // Goes to the next line where there is no room.
    void advance(double extra, const std::string& name, double width) {
        if (x_ > margin && x_ + extra + widthOf(name) > width - margin) {
            x_ = margin;
            y_ += 22;
        }
    }

    void addSwatch(const char* style, const std::string& name, double width) {
        advance(22, name, width);
        const std::string box = fmt::format("x=\"{}\" y=\"{}\" width=\"16\" height=\"16\"", x_, y_);
        text_ += fmt::format("<rect class=\"fill {}\" {}/>", style, box);
        if (name == "padding") text_ += fmt::format("<rect class=\"fill\" fill=\"url(#hatch)\" {}/>", box);
        text_ += fmt::format("<rect class=\"edge\" {}/>", box);
        addName(22, name);
    }

    void addName(double extra, const std::string& name) {
        text_ += fmt::format("<text class=\"about\" x=\"{}\" y=\"{}\">{}</text>\n", x_ + extra, y_ + 12, name);
        x_ += extra + widthOf(name) + 18;
    }

    std::set<TypeKind> kinds_;
    bool hasPadding_ = false;
    double x_ = 0;
    double y_ = 0;
    std::string text_;
};

} // namespace

std::string layoutSvg(const Layout& shown, const Layout& all) {
    const StructuresByName byName = structuresByName(all);
    std::string body;
    Legend legend;
    double width = 400; // of a legend alone
    double y = margin;
    for (const StructureLayout& structure : shown.structures) {
        MapWriter writer(structure, byName);
        body += writer.draw(y);
        legend.note(writer.map());
        width = std::max(width, writer.width());
        y = writer.bottom() + 22;
    }
    body += legend.draw(y, width);
    return fmt::format(
        "<svg xmlns=\"http://www.w3.org/2000/svg\" width=\"{0}\" height=\"{1}\" viewBox=\"0 0 {0} {1}\">\n"
        "<title>Bytes of {2}</title>\n<style>\n{3}</style>\n"
        "<defs><pattern id=\"hatch\" width=\"7\" height=\"7\" patternUnits=\"userSpaceOnUse\" "
        "patternTransform=\"rotate(45)\"><path class=\"hatch\" d=\"M0 0V7\"/></pattern></defs>\n"
        "<rect class=\"ground\" width=\"{0}\" height=\"{1}\"/>\n{4}</svg>\n",
        width, y, escapedForXml(shown.structures.size() == 1 ? shown.structures.front().label : "structures"),
        mapStyle(), body);
}

} // namespace inspector
