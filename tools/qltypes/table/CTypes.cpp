#include "table/CTypes.h"

#include <array>

#include <fmt/format.h>

#include "qltypes/structures/StructDataType.h"
#include "qltypes/structures/StructDataTypeUtils.h"
#include "qltypes/types/DataTypeTableUtils.h"

namespace inspector {
namespace {

CType integer(int size, bool isSigned) {
    return {CType::Kind::Number, fmt::format("{}int{}_t", isSigned ? "" : "u", 8 * size), size, size};
}

} // namespace

CType cTypeOf(const QLTypeSys::DataTypeTable& table, int id) {
    const int resolved = DtGetDataTypeIdAliasedThruTo(&table, id);
    const int size = DtGetDataTypeSize(&table, resolved);
    switch (resolved) {
    case DATA_TYPE_ID_DOUBLE:
        return {CType::Kind::Number, "double", size, size};
    case DATA_TYPE_ID_SINGLE:
        return {CType::Kind::Number, "float", size, size};
    case DATA_TYPE_ID_BOOLEAN:
        return {CType::Kind::Number, "unsigned char", size, size};
    default:
        break;
    }
    if (DtCheckForBuiltInDataType(resolved)) return integer(size, DtIsSignedIntDtype(&table, resolved));
    if (DtIsEnumType(&table, resolved)) return cTypeOf(table, DtGetDataTypeStorageId(&table, resolved));
    if (DtIsStructType(&table, resolved)) return {CType::Kind::Structure, DtGetDataTypeName(&table, resolved), size, 8};
    const bool fitsInteger = size == 1 || size == 2 || size == 4 || size == 8;
    if (fitsInteger && DtIsHalfPrecisionType(&table, resolved)) return integer(size, false);
    if (fitsInteger && DtIsFixptDTNotScaledDouble(&table, resolved))
        return integer(size, DtIsSignedFixptDT(&table, resolved));
    if (DtIsFixptDT(&table, resolved) && size == 8) return {CType::Kind::Number, "double", size, size};
    return {CType::Kind::Bytes, "unsigned char", size, 1};
}

} // namespace inspector
