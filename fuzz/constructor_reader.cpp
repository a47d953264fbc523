// The reader of constructor texts: never crashes, agrees with the slow reader, and reads back what is written.
#include <climits>

#include "fuzz/Fuzz.h"
#include "fuzz/NumberTexts.h"
#include "qltypes/fixed_point/ConstructorString.h"

extern "C" int LLVMFuzzerTestOneInput(const std::uint8_t* data, std::size_t size) {
    using reference::Ending;
    const std::string text(reinterpret_cast<const char*>(data), size);
    const fxpCtorParseResult* result = nullptr;
    const Ending ending = fuzz::endingOf([&] { result = &constructorStringToFxpDataType(text); });

    const reference::Reading expected = reference::readConstructor(text);
    fuzz::claim(ending == expected.ending, "the slow reader ends the same way");
    if (ending != Ending::read) return 0;

    const fxpDataTypeProp& prop = result->prop;
    fuzz::claim(prop == expected.prop, "the slow reader reads the same record");
    fuzz::claim(result->ScalingGiven == expected.scalingGiven, "the slow reader says the same of the scaling");
    fuzz::claim(&constructorStringToFxpDataType(std::string_view(text)) == result, "a second reading finds the first");

    for (const FxpDT::baseCtorPrefer base : {FxpDT::PreferNumerictype, FxpDT::PreferFixdt}) {
        for (const FxpDT::scalingRepPrefer rep :
             {FxpDT::PreferFractionLength, FxpDT::PreferSlopeBias, FxpDT::PreferNoScaling}) {
            const std::string& written = fxpDataTypeToConstructorString(prop, base, rep);
            const bool hasOverride = prop.DataTypeMode == FXP_DT_BOOLEAN && prop.DataTypeOverrideOff;
            const bool hasNoFraction = rep == FxpDT::PreferFractionLength && prop.FixedExponent == INT_MIN;
            if (!prop.validateFxpDTProp() || hasOverride || hasNoFraction) continue;
            const fxpDataTypeProp& again = constructorStringToFxpDataType(written).prop;
            fuzz::claim(rep == FxpDT::PreferNoScaling ? again.WordLength == prop.WordLength
                                                      : fuzz::cameBack(prop, again),
                        "a written record reads back");
        }
    }
    return 0;
}
