#include "table/TypeLoader.h"

#include <algorithm>
#include <stdexcept>

#include <fmt/format.h>

#include "description/Resolver.h"
#include "qlplatform/services/Diagnostics.h"
#include "qltypes/fixed_point/IdentifierString.h"
#include "qltypes/fixed_point/TypeNames.h"
#include "qltypes/structures/ElementAccess.h"
#include "qltypes/structures/StructDataType.h"
#include "qltypes/structures/StructDataTypeUtils.h"
#include "qltypes/structures/StructElement.h"
#include "qltypes/structures/StructLayout.h"
#include "qltypes/types/DataTypeTableUtils.h"

namespace inspector {
namespace {

constexpr DataTypeSource sourceOfClients = DataTypeSource(2);

bool isNumberTypeName(const std::string& name) { return FXP::isQLTypeNameWithFxpDataTypeProp(name.c_str()); }

// Discards the diagnostic, and complains with its text where there is one.
void check(qlsvDiagnosticImpl* diagnostic, const Place& place) {
    if (!diagnostic) return;
    const std::string text = diagnostic->text(0);
    qlsvDiscardDiagnostic(diagnostic);
    throw InputError(place, text);
}

// Runs `work`, and complains with the text of what it throws.
template <class Work> auto checked(const Place& place, Work work) {
    try {
        return work();
    } catch (const foundation::core::except::IException& e) {
        throw InputError(place, e.what());
    }
}

// Bytes of the integer or float that holds a value: 1, 2, 4, 8, and whole 8-byte words above 64 bits.
int containerSize(const fxpDataTypeProp& prop) {
    if (prop.DataTypeMode == FXP_DT_SCALED_DOUBLE) return 8;
    for (const int size : {1, 2, 4, 8}) {
        if (prop.WordLength <= 8 * size) return size;
    }
    return (prop.WordLength - 1) / 64 * 8 + 8;
}

} // namespace

int TypeLoader::registerNumberType(const TypeReference& reference) {
    fxpDataTypeProp prop;
    try {
        prop = checked(reference.place, [&] { return identifierStringToFxpDataType(reference.name); });
    } catch (const std::bad_cast&) { // the reader lets the exception of its number cast through
        throw InputError(reference.place, fmt::format("the exponent of '{}' does not fit 32 bits", reference.name));
    }
    const Place& place = reference.place;
    int id = DATA_TYPE_ID_INVALID;
    check(DtRegisterDataType(&table_, nullptr, reference.name.c_str(), dtSourceFixpt, &id), place);
    check(DtSetDataTypeSize(&table_, nullptr, id, containerSize(prop)), place);
    check(DtSetDataTypePropertiesSize(&table_, nullptr, id, sizeof prop), place);
    check(DtSetDataTypeProperties(&table_, nullptr, id, &prop), place);
    numberTypes_.push_back(reference.name);
    return id;
}

int TypeLoader::idOf(const TypeReference& reference) {
    const int id = table_.getDataTypeId(reference.name.c_str());
    return id != DATA_TYPE_ID_INVALID ? id : registerNumberType(reference);
}

int TypeLoader::unitIdOf(const std::string& unit) {
    if (unit.empty()) return -1;
    const auto at = std::find(units_.begin(), units_.end(), unit);
    if (at == units_.end()) units_.push_back(unit);
    return static_cast<int>(at - units_.begin());
}

void TypeLoader::registerType(const TypeDescription& type) {
    const char* const name = type.name.c_str();
    labelsByName_.emplace(type.name, type.label);
    if (const auto* alias = std::get_if<AliasDescription>(&type.kind)) {
        const int target = idOf(alias->target);
        checked(type.place, [&] { return table_.registerAliasDataType(name, sourceOfClients, target, nullptr); });
    } else if (const auto* client = std::get_if<ClientTypeDescription>(&type.kind)) {
        int id = DATA_TYPE_ID_INVALID;
        check(DtRegisterDataType(&table_, nullptr, name, sourceOfClients, &id), type.place);
        check(DtSetDataTypeSize(&table_, nullptr, id, client->size), type.place);
    } else {
        registerStructure(type, std::get<StructureDescription>(type.kind));
    }
}

void TypeLoader::registerStructure(const TypeDescription& type, const StructureDescription& structure) {
    const int id =
        checked(type.place, [&] { return table_.registerStructDataType(type.name.c_str(), sourceOfClients, nullptr); });
    const long numElements = static_cast<long>(structure.elements.size());
    check(DtSetDataTypeNumElements(&table_, nullptr, id, numElements), type.place);
    for (long i = 0; i < numElements; ++i)
        fillElement(id, i, structure.elements[static_cast<std::size_t>(i)]);
    check(DtComputeDerivedStructAttributes(&table_, id), type.place);
}

void TypeLoader::fillElement(int structureId, long index, const ElementDescription& element) {
    const Place& place = element.type.place;
    StructElement& record =
        *DtGetStructDataTypeObject(&table_, structureId)->getElements()[static_cast<std::size_t>(index)];
    record.setName(element.name.c_str());
    record.setDataTypeId(idOf(element.type));
    record.setUnitId(unitIdOf(element.unit));
    record.setSignalType(element.isComplex);
    record.setSamplingMode(element.isFrameBased);
    record.setDimensionsMode(element.hasVariableDimensions);
    record.setMin(element.min);
    record.setMax(element.max);
    const int numDimensions = static_cast<int>(element.dimensions.size());
    check(DtSetDataTypeElementNumDimensions(&table_, nullptr, structureId, index, numDimensions), place);
    for (int i = 0; i < numDimensions; ++i) {
        const long dimension = element.dimensions[static_cast<std::size_t>(i)];
        check(DtSetDataTypeElementDimension(&table_, nullptr, structureId, index, i, dimension), place);
    }
}

void TypeLoader::load(const Description& description) {
    for (const std::size_t index : registrationOrder(description, isNumberTypeName))
        registerType(description.types[index]);
}

} // namespace inspector
