#include "qltypes/structures/StructChecksum.h"

#include <algorithm>

#include "qlplatform/strings/Strings.h"
#include "qltypes/dimensions/SymbolicDimsTable.h"
#include "qltypes/structures/StructDataType.h"
#include "qltypes/structures/StructDataTypeUtils.h"

using QLTypeSys::DataTypeTable;

namespace {

constexpr std::size_t longestShortItem = 0xfffe;

std::string numericText(const std::vector<unsigned long>& dims) {
    std::string text = "[ ";
    const bool isScalar = std::all_of(dims.begin(), dims.end(), [](unsigned long dim) { return dim == 1; });
    for (const unsigned long dim : dims) {
        text += std::to_string(dim) + ' ';
        if (isScalar) break;
    }
    return text + ']';
}

std::string symbolicText(const QLTypeSys::SymbolicDims& dims) {
    const std::string text = dims.toString();
    return dims.getNumDimensions() == 1 ? '[' + text + ']' : text;
}

} // namespace

StructElemTypeDesc::~StructElemTypeDesc() = default;

std::string StructElemDesc::genDescription() const {
    const char* const typeText = type->getText();
    if (!typeText) return {};
    std::string text = std::string(typeText) + ':' + name + ':';
    const bool isSymbolic = symbolicDimsTable && symbolicDimsTable->isaSymbolicDimension(symbDimsId);
    text += isSymbolic ? symbolicText(symbolicDimsTable->getSymbolicDims(symbDimsId)) : numericText(dims);
    if (isComplex) text += ":complex";
    return text + ';';
}

void addStructElementToChecksum(qlChecksumRec& rec, const StructElemDesc& desc) {
    const std::string text = desc.genDescription();
    const std::size_t length = utStrlen(text.c_str());
    if (length <= longestShortItem)
        rec.addn(text.c_str(), length);
    else
        rec.addLongItemToCheckSum(text.c_str(), length);
}

const qlChecksumValue& DtGetStructDataTypeChecksum(const DataTypeTable* table, int id) {
    return DtGetStructDataTypeObject_AliasedThruIfNeeded(table, id)->getDtChecksumValue();
}

void DtSetStructDataTypeChecksum(DataTypeTable* table, int id, const qlChecksumValue& value) {
    DtGetStructDataTypeObject_AliasedThruIfNeeded(table, id)->setDtChecksumValue(value);
}
