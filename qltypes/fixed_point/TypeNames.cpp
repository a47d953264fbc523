#include "qltypes/fixed_point/TypeNames.h"

#include <cstdlib>
#include <cstring>
#include <string_view>

#include "qltypes/fixed_point/IdentifierGrammar_internal.h"
#include "qltypes/fixed_point/IdentifierString.h"

namespace FXP {

namespace {

template <std::size_t count> bool isOneOf(std::string_view name, const std::string_view (&names)[count]) {
    for (const std::string_view one : names)
        if (name == one) return true;
    return false;
}

int intAtPosition(std::size_t position, const char* name) {
    if (std::strlen(name) <= position) return 0;
    return static_cast<int>(std::strtol(name + position, nullptr, 10)); // kept: cut to 32 bits
}

} // namespace

bool doesQLTypeNameMatchFloatPatternNotBuiltinClassic9(const char* name) { return std::string_view(name) == "half"; }

bool isQLTypeNameDoubleSingleBool(const char* name) { return isOneOf(name, {"double", "single", "boolean"}); }

bool isQLTypeNameBuiltInIntegerClassic6(const char* name) {
    return isOneOf(name, {"int8", "uint8", "int16", "uint16", "int32", "uint32"});
}

bool isQLTypeName64BitInteger(const char* name) { return isOneOf(name, {"int64", "uint64", "sfix64", "ufix64"}); }

bool isQLTypeNameBuiltInClassic9(const char* name) {
    return isQLTypeNameDoubleSingleBool(name) || isQLTypeNameBuiltInIntegerClassic6(name);
}

bool doesQLTypeNameMatchIntegerPattern(const char* name) { return matchesIntegerPattern(name); }

bool doesQLTypeNameMatchFixptPattern(const char* name) {
    IdentifierPieces pieces;
    return splitIdentifier(name, pieces);
}

bool doesQLTypeNameMatchIntegerOrFixptPattern(const char* name) {
    return doesQLTypeNameMatchIntegerPattern(name) || doesQLTypeNameMatchFixptPattern(name);
}

bool isQLTypeNameWithFxpDataTypeProp(const char* name) {
    return isQLTypeNameDoubleSingleBool(name) || doesQLTypeNameMatchIntegerOrFixptPattern(name) ||
           doesQLTypeNameMatchFloatPatternNotBuiltinClassic9(name);
}

bool isQLTypeNameNumericNotBuiltInClassic9(const char* name) {
    return !isQLTypeNameBuiltInClassic9(name) && isQLTypeNameWithFxpDataTypeProp(name);
}

int getIntAtPosition3(const char* name) { return intAtPosition(3, name); }
int getIntAtPosition4(const char* name) { return intAtPosition(4, name); }

int getWordLengthFromTypeName(const char* name) {
    if (doesQLTypeNameMatchFloatPatternNotBuiltinClassic9(name)) return 16;
    return identifierStringToFxpDataType(name).WordLength;
}

bool canQLTypeNameContainerStoreNegatives(const char* name) {
    if (!isQLTypeNameWithFxpDataTypeProp(name)) return false;
    const fxpDataTypeProp& prop = identifierStringToFxpDataType(name);
    switch (prop.DataTypeMode) {
    case FXP_DT_FIXPT:
        return prop.Signedness == 1;
    case FXP_DT_BOOLEAN:
        return false;
    default:
        return true; // kept: an unsigned scaled double is stored in a double
    }
}

} // namespace FXP
