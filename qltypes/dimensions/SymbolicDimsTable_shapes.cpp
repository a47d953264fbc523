// Reshaping: singleton dimensions removed, collapsed and put in.
#include "qlplatform/symbolic/SymbolicExpr.h"
#include "qltypes/dimensions/ExprIds_internal.h"
#include "qltypes/dimensions/SymbolicDimsTable.h"
#include "qltypes/host/Assert_internal.h"

namespace QLTypeSys {

std::vector<int> SymbolicDimsTable::dimensionIds(int id) const {
    const SymbolicDims dims = getSymbolicDims(id);
    std::vector<int> ids(dims.getNumDimensions());
    for (std::size_t i = 0; i < ids.size(); ++i)
        ids[i] = dims.getDimensionId(i);
    return ids;
}

int SymbolicDimsTable::listOf(const std::vector<int>& dimensions) {
    QLTYPES_ASSERT(!dimensions.empty());
    return SymbolicDimsND(this, dimensions).getId();
}

int SymbolicDimsTable::removeTrailingOnes(int id, unsigned long minDims) {
    const std::size_t numDimensions = getSymbolicDims(id).getNumDimensions();
    if (numDimensions == 1 || numDimensions <= minDims) return id;
    std::vector<int> dimensions = dimensionIds(id);
    while (dimensions.size() > minDims && isOne(dimensions.back()))
        dimensions.pop_back();
    return dimensions.size() == 1 ? dimensions.front() : listOf(dimensions);
}

int SymbolicDimsTable::removeLeadingOnes(int id) {
    const std::vector<int> dimensions = dimensionIds(id);
    if (dimensions.size() == 1) return id;
    std::vector<int> kept;
    for (const int dimension : dimensions)
        if (!kept.empty() || !isOne(dimension)) kept.push_back(dimension);
    if (kept.empty()) return dimensions.front();
    return kept.size() == 1 ? kept.front() : listOf(kept);
}

int SymbolicDimsTable::collapseDimensions(int id, unsigned long index) {
    const int one = symbolicIdOf(oneIntExprId_);
    std::vector<int> dimensions = dimensionIds(id);
    if (dimensions.size() == 1) return one;
    QLTYPES_ASSERT(index < dimensions.size());
    dimensions[index] = one;
    return listOf(dimensions);
}

int SymbolicDimsTable::amendSymbolicDims(int id, const std::vector<int>& numeric) {
    if (!isSymbolicDimsIdValid(id) || numeric.empty() || !isaSymbolicDimension(id)) return id;
    const std::vector<unsigned long> values = getNumericDims(id);
    if (numeric.size() <= values.size()) return id;
    const std::vector<int> parts = values.size() == 1 ? std::vector<int>{id} : dimensionIds(id);
    const int one = symbolicIdOf(oneIntExprId_);
    std::vector<int> amended;
    std::size_t next = 0; // the first part that is not yet placed
    for (const int entry : numeric) {
        if (next == values.size())
            amended.push_back(one);
        else if (entry == static_cast<int>(values[next]))
            amended.push_back(parts[next++]);
        else if (entry == 1)
            amended.push_back(one);
        // kept: any other entry is dropped without complaint
    }
    return listOf(amended);
}

} // namespace QLTypeSys
