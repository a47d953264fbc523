#include "qltypes/conversion/CheckedConversion.h"

#include <algorithm>

#include "qltypes/conversion/BuiltInConversion.h"
#include "qltypes/conversion/OverflowPrediction_internal.h"
#include "qltypes/types/DataTypeTable.h"

bool qlConvertBuiltInDTypeVectWithCheck(const void* src, unsigned long srcCount, int srcId, bool srcComplex, void* dst,
                                        unsigned long dstCount, int dstId, bool dstComplex,
                                        fxpModeOverflow_tag overflow, fxpModeRounding_tag rounding, bool check) {
    return utGetQlBuiltinDtypeConvFcn(srcId, dstId, overflow, rounding)(
        src, dst, srcCount, dstCount, srcComplex, dstComplex, check, srcId, dstId, overflow, rounding);
}

int qlBuiltInConvertBetween(_qlDataTypeAccess_tag* access, const char*, int dstId, int srcId, int count,
                            const void* src, const void*, void* dst) {
    const auto builtIn = [access](int id) {
        const int end = access->table->getDataTypeAt(static_cast<unsigned long>(id + 1))->getIdAliasedThruTo();
        return end == DATA_TYPE_ID_AUTO ? static_cast<int>(DATA_TYPE_ID_DOUBLE) : end;
    };
    const auto numValues = static_cast<unsigned long>(std::max(count, 0));
    qlConvertBuiltInDTypeVectWithCheck(src, numValues, builtIn(srcId), false, dst, numValues, builtIn(dstId), false,
                                       FXP_OVERFLOW_SATURATE, FXP_ROUND_ZERO, true);
    return 1; // kept: what was lost is not reported on this road
}

bool QLTypeSys::DataType::CheckForOverflowDuringDataTypeConversion(const void* data, int count, int srcId,
                                                                   bool isComplex, int dstId,
                                                                   fxpModeRounding_tag rounding) {
    return conversion::overflowExpected(data, count, srcId, isComplex, dstId, rounding);
}
