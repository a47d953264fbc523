// Aligned columns of text.
//
//   TextTable table({{"offset", Align::Right}, {"element", Align::Left}});
//   table.addRow({"8", "y"});
//   std::string text = table.text("  ", Colours(false));
#pragma once

#include <string>
#include <string_view>
#include <vector>

namespace inspector {

/// Escape sequences, or nothing where the output is no terminal.
class Colours {
  public:
    explicit Colours(bool isOn) : isOn_(isOn) {}
    std::string bold(std::string_view text) const { return wrapped("\x1b[1m", text); }
    std::string dim(std::string_view text) const { return wrapped("\x1b[2m", text); }

  private:
    std::string wrapped(std::string_view code, std::string_view text) const;
    bool isOn_;
};

enum class Align { Left, Right };

class TextTable {
  public:
    struct Column {
        std::string title;
        Align align;
    };

    explicit TextTable(std::vector<Column> columns) : columns_(std::move(columns)) {}

    /// Adds a row of one cell a column. A dimmed row is shown paler where colours are on.
    void addRow(std::vector<std::string> cells, bool isDimmed = false);

    /// The table, a line a row, each behind `indent`; columns without any content are left out.
    std::string text(std::string_view indent, const Colours& colours) const;

  private:
    struct Row {
        std::vector<std::string> cells;
        bool isDimmed;
    };
    std::string line(const std::vector<std::string>& cells, const std::vector<std::size_t>& widths) const;

    std::vector<Column> columns_;
    std::vector<Row> rows_;
};

} // namespace inspector
