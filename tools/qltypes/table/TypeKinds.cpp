#include "table/TypeKinds.h"

#include "qltypes/fixed_point/FixPointDefs.h"
#include "qltypes/types/DataTypeTableUtils.h"

namespace inspector {
namespace {

bool isUnscaled(const fxpDataTypeProp& prop) {
    return prop.DataTypeMode == FXP_DT_FIXPT && prop.FixedExponent == 0 && prop.SlopeAdjustmentFactor == 1.0 &&
           prop.Bias == 0.0;
}

} // namespace

TypeKind kindOf(const QLTypeSys::DataTypeTable& table, int id) {
    const int resolved = DtGetDataTypeIdAliasedThruTo(&table, id);
    if (DtIsStructType(&table, resolved)) return TypeKind::Structure;
    if (resolved == DATA_TYPE_ID_BOOLEAN) return TypeKind::Boolean;
    if (DtIsBuiltInOrCustomFloat(&table, resolved)) return TypeKind::Float;
    if (DtIsIntDtype(&table, resolved)) return TypeKind::Integer;
    if (DtIsEnumType(&table, resolved)) return TypeKind::Enumeration;
    if (!DtIsFixptDT(&table, resolved)) return TypeKind::Other;
    const auto* const prop = static_cast<const fxpDataTypeProp*>(DtGetDataTypeProperties(&table, nullptr, resolved));
    return isUnscaled(*prop) ? TypeKind::Integer : TypeKind::FixedPoint;
}

} // namespace inspector
