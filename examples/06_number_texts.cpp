// Number types and their two texts: the identifier, which is legal as a symbol, and the constructor, which users write.
#include <cmath>
#include <cstdio>

#include "qlplatform/services/IException.h"
#include "qltypes/fixed_point/ConstructorString.h"
#include "qltypes/fixed_point/IdentifierString.h"
#include "qltypes/fixed_point/TypeNames.h"

namespace {

void show(const fxpDataTypeProp& prop) {
    const double resolution = std::ldexp(prop.SlopeAdjustmentFactor, prop.FixedExponent);
    std::printf("%-14s %-18s %2d bits, %s, steps of %g\n", fxpDataTypeToIdentifierString(&prop).c_str(),
                fxpDataTypeToConstructorString(prop, FxpDT::PreferFixdt, FxpDT::PreferFractionLength).c_str(),
                prop.WordLength, prop.Signedness == 1 ? "signed" : "unsigned", resolution);
}

} // namespace

int main() {
    std::puts("Read from identifiers:");
    for (const char* text : {"int8", "sfix16_En7", "ufix8_S3p2_B2", "sfix32_E4"})
        show(identifierStringToFxpDataType(text));

    std::puts("\nRead from constructors:");
    for (const char* text : {"fixdt(1,16,7)", "fixdt(0,8,3.2,2)", "fixdt(1,32,-4)", "numerictype('uint16')"})
        show(constructorStringToFxpDataType(text).prop);

    std::puts("\nA record of one's own, checked:");
    const fxpDataTypeProp good = {FXP_DT_FIXPT, 1, 24, 0, -20, 1.0, 0.0, 0};
    fxpDataTypeProp bad = good;
    bad.SlopeAdjustmentFactor = 2.0;
    std::printf("%s: %s\n", fxpDataTypeToIdentifierString(&good).c_str(),
                good.validateFxpDTProp() ? "valid" : "not valid");
    std::printf("a factor of 2: %s\n", bad.validateFxpDTProp() ? "valid" : "not valid");

    std::puts("\nBy the name alone:");
    for (const char* name : {"ufix16_En7", "int8", "Torque"})
        std::printf("%s %s a number type%s\n", name, FXP::isQLTypeNameWithFxpDataTypeProp(name) ? "is" : "is not",
                    FXP::canQLTypeNameContainerStoreNegatives(name) ? " with negative values" : "");

    try {
        identifierStringToFxpDataType("sfix16_E");
    } catch (const foundation::core::except::IException& e) {
        std::printf("\nrefused: %s\n", e.what());
    }
}
