#include "qltypes/dimensions/SymbolicDimsServices.h"

#include "qltypes/dimensions/SymbolicDimsTable.h"
#include "qltypes/host/Failure_internal.h"

namespace QLTypeSys::SymbolicDimsServices::Const {

void ComputeOutput(SymbolicDimsTable* table, const std::u16string& first, const std::u16string& second, int id,
                   int& output, bool flag) {
    if (!table->isaSymbolicDimension(id)) return;
    const SymbolicDims dims = table->getSymbolicDims(id);
    const std::size_t numDimensions = dims.getNumDimensions();
    if (!flag || numDimensions == 1) {
        output = id;
        return;
    }
    const int one = table->registerSymbolicDims(1);
    const int d0 = dims.getDimensionId(0);
    const int d1 = dims.getDimensionId(1);
    if (numDimensions == 2 && d0 == one) {
        output = d1;
    } else if (numDimensions == 2 && d1 == one) {
        output = d0;
    } else {
        const std::string column = SymbolicDimsND(table, {d0, one}).toString();
        const std::string row = SymbolicDimsND(table, {one, d1}).toString();
        failure::raise(Quillane::SymbolicDims::MatrixInterpretedAs1D(first, second, dims.toString(), column, row));
    }
}

} // namespace QLTypeSys::SymbolicDimsServices::Const
