#include "qltypes/conversion/CheckedConversion.h"

#include "qltypes/conversion/BuiltInConversion.h"

bool qlConvertBuiltInDTypeVectWithCheck(const void* src, unsigned long srcCount, int srcId, bool srcComplex, void* dst,
                                        unsigned long dstCount, int dstId, bool dstComplex,
                                        fxpModeOverflow_tag overflow, fxpModeRounding_tag rounding, bool check) {
    return utGetQlBuiltinDtypeConvFcn(srcId, dstId, overflow, rounding)(
        src, dst, srcCount, dstCount, srcComplex, dstComplex, check, srcId, dstId, overflow, rounding);
}
