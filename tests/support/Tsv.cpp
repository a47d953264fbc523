#include "tests/support/Tsv.h"

#include <fstream>
#include <stdexcept>

#include <boost/algorithm/string.hpp>

namespace testsupport {

std::vector<TsvRow> readTsv(const std::string& path) {
    std::ifstream in(path);
    std::vector<TsvRow> rows;
    std::string text;
    for (int line = 1; std::getline(in, text); ++line) {
        if (text.empty() || text[0] == '#') continue;
        TsvRow& row = rows.emplace_back();
        row.line = line;
        boost::split(row.columns, text, boost::is_any_of("\t"));
    }
    if (rows.empty()) throw std::runtime_error("no rows in " + path);
    return rows;
}

std::string unescaped(std::string_view column) {
    std::string text;
    for (std::size_t i = 0; i < column.size(); ++i) {
        if (column[i] != '\\') {
            text += column[i];
            continue;
        }
        const char kind = ++i < column.size() ? column[i] : '\0';
        if (kind == 't') {
            text += '\t';
        } else if (kind == 'n') {
            text += '\n';
        } else if (kind == '\\') {
            text += '\\';
        } else if (kind == 'x' && i + 2 < column.size()) {
            text += static_cast<char>(std::stoi(std::string(column.substr(i + 1, 2)), nullptr, 16));
            i += 2;
        } else {
            throw std::runtime_error("unknown escape in " + std::string(column));
        }
    }
    return text;
}

} // namespace testsupport
