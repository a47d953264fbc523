// Tables of text cases in tests/data: one case a line, columns separated by tabs, comments after '#' in first place.
#pragma once

#include <string>
#include <string_view>
#include <vector>

namespace testsupport {

struct TsvRow {
    int line;                         ///< line number in the file, from 1
    std::vector<std::string> columns; ///< as they stand in the file
};

/// The rows of a table of tests/data. Throws when the file cannot be read or has no row.
std::vector<TsvRow> readTsv(const std::string& path);

/// The bytes that \t, \n, \\ and \xNN stand for in a column; throws for another escape.
std::string unescaped(std::string_view column);

} // namespace testsupport
