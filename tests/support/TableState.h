// Everything that a table of types says of itself through its public interface, as lines: two tables with the same
// lines cannot be told apart.
#pragma once

#include <string>
#include <vector>

namespace QLTypeSys {
class DataTypeTable;
}

namespace testsupport {

/// The lines of the table, those of each record, and what it answers for each of `names`. Asks no view.
std::vector<std::string> stateOf(const QLTypeSys::DataTypeTable& table, const std::vector<std::string>& names);

/// What all views of the structure at `id` answer, for each index and some past the end.
std::vector<std::string> answersOf(const QLTypeSys::DataTypeTable& table, int id);

} // namespace testsupport
