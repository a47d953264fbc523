#include "output/TextTable.h"

#include <algorithm>

namespace inspector {
namespace {

// Number of characters of a UTF-8 text.
std::size_t widthOf(std::string_view text) {
    return static_cast<std::size_t>(
        std::count_if(text.begin(), text.end(), [](char c) { return (static_cast<unsigned char>(c) & 0xC0) != 0x80; }));
}

} // namespace

std::string Colours::wrapped(std::string_view code, std::string_view text) const {
    if (!isOn_) return std::string(text);
    return std::string(code).append(text).append("\x1b[0m");
}

void TextTable::addRow(std::vector<std::string> cells, bool isDimmed) { rows_.push_back({std::move(cells), isDimmed}); }

std::string TextTable::line(const std::vector<std::string>& cells, const std::vector<std::size_t>& widths) const {
    std::string line;
    for (std::size_t i = 0; i < columns_.size(); ++i) {
        if (widths[i] == 0) continue;
        if (!line.empty()) line += "  ";
        const std::string blanks(widths[i] - widthOf(cells[i]), ' ');
        line += columns_[i].align == Align::Right ? blanks + cells[i] : cells[i] + blanks;
    }
    line.erase(line.find_last_not_of(' ') + 1);
    return line;
}

std::string TextTable::text(std::string_view indent, const Colours& colours) const {
    std::vector<std::size_t> widths(columns_.size(), 0);
    for (const Row& row : rows_) {
        for (std::size_t i = 0; i < widths.size(); ++i)
            widths[i] = std::max(widths[i], widthOf(row.cells[i]));
    }
    std::vector<std::string> titles;
    for (std::size_t i = 0; i < widths.size(); ++i) {
        titles.push_back(columns_[i].title);
        if (widths[i] > 0) widths[i] = std::max(widths[i], widthOf(titles[i]));
    }
    std::string text;
    text.append(indent).append(colours.dim(line(titles, widths))).append("\n");
    for (const Row& row : rows_) {
        const std::string cells = line(row.cells, widths);
        text.append(indent).append(row.isDimmed ? colours.dim(cells) : cells).append("\n");
    }
    return text;
}

} // namespace inspector
