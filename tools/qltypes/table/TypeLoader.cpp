#include "table/TypeLoader.h"

#include <algorithm>
#include <iterator>
#include <map>
#include <memory>
#include <stdexcept>

#include <fmt/format.h>

#include "description/Resolver.h"
#include "qlplatform/classes/DefinedClass.h"
#include "qlplatform/services/Diagnostics.h"
#include "qltypes/date_time/DateTimeType.h"
#include "qltypes/fixed_point/IdentifierString.h"
#include "qltypes/fixed_point/TypeNames.h"
#include "qltypes/image/ImageDataType.h"
#include "qltypes/structures/ElementAccess.h"
#include "qltypes/structures/StructDataType.h"
#include "qltypes/structures/StructDataTypeUtils.h"
#include "qltypes/structures/StructElement.h"
#include "qltypes/structures/StructLayout.h"
#include "qltypes/types/DataTypeTableUtils.h"
#include "qltypes/types/ql_enum_utils.h"
#include "table/CTypes.h"
#include "table/TypeKinds.h"

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

SSImageColorFormat formatOf(const std::string& name) {
    static const std::map<std::string, SSImageColorFormat> formats = {
        {"BGRA", SSImageColorFormat_BGRA},     {"RGB", SSImageColorFormat_RGB},
        {"RGBA", SSImageColorFormat_RGBA},     {"Grayscale", SSImageColorFormat_Grayscale},
        {"CMYK", SSImageColorFormat_CMYK},     {"Spectral", SSImageColorFormat_Spectral},
        {"Lab", SSImageColorFormat_Lab},       {"HSV", SSImageColorFormat_HSV},
        {"YUV444", SSImageColorFormat_YUV444}, {"CFA", SSImageColorFormat_CFA}};
    return formats.at(name);
}

QLDateTime::AbsoluteTimeScale scaleOf(const std::string& name) {
    using QLDateTime::AbsoluteTimeScale;
    static const std::map<std::string, AbsoluteTimeScale> scales = {
        {"tai", AbsoluteTimeScale::TAI},     {"gps", AbsoluteTimeScale::GPS},   {"utc", AbsoluteTimeScale::UTC},
        {"posix", AbsoluteTimeScale::Posix}, {"jd", AbsoluteTimeScale::JD_TAI}, {"mjd", AbsoluteTimeScale::MJD_TAI}};
    return scales.at(name);
}

// Why an element that would begin at `from` begins elsewhere.
Move moveOf(std::int64_t from, int typeSize, bool isBuiltIn) {
    const int alignment = isBuiltIn ? typeSize : typeSize > 7 ? 8 : typeSize > 3 ? 4 : 2;
    const char* const kind = isBuiltIn ? "built-in" : "not built-in";
    return {from, alignment, fmt::format("aligned to {}: {}, size {}", alignment, kind, typeSize)};
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
    const auto id = std::find(units_.begin(), units_.end(), unit) - units_.begin();
    if (id == std::ssize(units_)) units_.push_back(unit);
    return static_cast<int>(id);
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
    } else if (const auto* enumeration = std::get_if<EnumerationDescription>(&type.kind)) {
        registerEnumeration(type, *enumeration);
    } else if (const auto* structure = std::get_if<StructureDescription>(&type.kind)) {
        registerStructure(type, *structure);
    } else {
        registerUnderOwnName(type);
    }
}

// Strings, matrices, images and date-time types: the library makes the name, and the described one becomes an alias of
// it.
void TypeLoader::registerUnderOwnName(const TypeDescription& type) {
    const int id = checked(type.place, [&] {
        if (const auto* string = std::get_if<StringDescription>(&type.kind))
            return table_.registerStringDataType(string->maxLength, nullptr);
        if (const auto* matrix = std::get_if<MatrixDescription>(&type.kind))
            return table_.registerDynamicMatrixDataType(idOf(matrix->element), matrix->rank);
        if (const auto* dateTime = std::get_if<DateTimeDescription>(&type.kind))
            return table_.registerDateTimeDataType(QLDateTime::DateTimeType::datetime_t(scaleOf(dateTime->scale)),
                                                   nullptr);
        const auto& image = std::get<ImageDescription>(type.kind);
        return table_.registerImageDataType(image.numChannels, formatOf(image.format),
                                            image.isRowMajor ? SSImageDataLayout_RowMajorInterleaved
                                                             : SSImageDataLayout_ColumnMajorPlanar,
                                            BuiltInDTypeId(table_.getDataTypeId(image.base.c_str())));
    });
    if (type.name == DtGetDataTypeName(&table_, id)) return;
    checked(type.place, [&] { return table_.registerAliasDataType(type.name.c_str(), sourceOfClients, id, nullptr); });
}

// The class that says what the enumeration is stays out of sight: only the rules are asked of it.
void TypeLoader::registerEnumeration(const TypeDescription& type, const EnumerationDescription& enumeration) {
    const std::string& storage = enumeration.storage;
    const auto definition = std::make_shared<tcos::DefinedClass>(type.name, tcos::ClassKind::enumeration);
    definition->derivesFrom(storage.empty() ? "Quillane.IntEnumType" : storage);
    for (const EnumerationMember& member : enumeration.members)
        definition->addMember(member.name, member.value);
    check(qlCheckForValidEnumDataType(definition), type.place);

    const int storageId = storage.empty() ? DATA_TYPE_ID_INT32 : table_.getDataTypeId(storage.c_str());
    const int id =
        checked(type.place, [&] { return table_.registerDataType(type.name.c_str(), dtSourceEnum, nullptr); });
    check(DtSetDataTypeStorageId(&table_, nullptr, id, storageId), type.place);
    check(DtSetDataTypeSize(&table_, nullptr, id, DtGetDataTypeSize(&table_, storageId)), type.place);
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

// What the table holds of an element, without asking the description.
ElementLayout TypeLoader::elementLayout(const QLTypeSys::ImmediateElementAccess& view, long index,
                                        std::int64_t endOfElementBefore) const {
    const int typeId = view.getDataTypeId(index);
    const int typeSize = DtGetDataTypeSize(&table_, typeId);
    const int unitId = view.getUnitId(index);
    const long* const dimensions = view.getDimensions(index);

    ElementLayout element;
    element.name = view.getName(index);
    element.typeName = DtGetDataTypeName(&table_, typeId);
    element.typeLabel = labelOf(element.typeName);
    element.typeKind = kindOf(table_, typeId);
    element.dimensions.assign(dimensions, dimensions + view.getNumDimensions(index));
    element.isComplex = view.getSignalType(index) == 1;
    element.isFrameBased = view.getSamplingMode(index) == 1;
    element.hasVariableDimensions = view.getDimensionsMode(index) == 1;
    element.min = view.getMin(index);
    element.max = view.getMax(index);
    if (unitId >= 0) element.unit = units_[static_cast<std::size_t>(unitId)];
    element.offset = view.getOffset(index);
    element.size = view.getComplexWidth(index) * typeSize;
    element.padding = view.getPadding(index);
    element.cType = cTypeOf(table_, typeId);
    if (element.offset != endOfElementBefore) {
        const bool isBuiltIn = DtCheckForBuiltInDataType(DtGetDataTypeIdAliasedThruTo(&table_, typeId));
        element.move = moveOf(endOfElementBefore, typeSize, isBuiltIn);
    }
    return element;
}

StructureLayout TypeLoader::structureLayout(const TypeDescription& type) const {
    const int id = table_.getDataTypeId(type.name.c_str());
    const QLTypeSys::ImmediateElementAccess view(&table_, id);
    StructureLayout layout;
    layout.name = type.name;
    layout.label = type.label;
    layout.size = DtGetDataTypeSize(&table_, id);
    layout.numFlatElements = DtGetDataTypeNumFlatElements(&table_, id);
    layout.numRawElements = DtGetDataTypeNumRawElements(&table_, id);
    layout.numDFSElements = DtGetDataTypeNumDFSElements(&table_, id);
    std::int64_t end = 0; // of the element before
    for (long i = 0; i < view.getNumElements(); ++i) {
        layout.elements.push_back(elementLayout(view, i, end));
        end = layout.elements.back().offset + layout.elements.back().size;
        layout.padding += layout.elements.back().padding;
    }
    return layout;
}

OtherType TypeLoader::otherType(const std::string& name, const char* kind) const {
    OtherType type;
    type.name = name;
    type.kind = kind;
    const int id = table_.getDataTypeId(name.c_str());
    type.typeKind = kindOf(table_, id);
    type.size = DtGetDataTypeSize(&table_, id);
    return type;
}

std::string TypeLoader::labelOf(const std::string& name) const {
    const auto at = labelsByName_.find(name);
    return at == labelsByName_.end() ? name : at->second;
}

Layout TypeLoader::layout(const Description& description) const {
    Layout layout;
    for (const std::string& name : numberTypes_)
        layout.otherTypes.push_back(otherType(name, "number"));
    for (const TypeDescription& type : description.types) {
        if (std::holds_alternative<StructureDescription>(type.kind)) {
            layout.structures.push_back(structureLayout(type));
        } else if (const auto* alias = std::get_if<AliasDescription>(&type.kind)) {
            layout.otherTypes.push_back(otherType(type.name, "alias"));
            layout.otherTypes.back().target = labelOf(alias->target.name);
        } else if (const auto* enumeration = std::get_if<EnumerationDescription>(&type.kind)) {
            layout.otherTypes.push_back(otherType(type.name, "enumeration"));
            const int id = table_.getDataTypeId(type.name.c_str());
            layout.otherTypes.back().storage = DtGetDataTypeName(&table_, DtGetDataTypeStorageId(&table_, id));
            layout.otherTypes.back().members = enumeration->members;
        } else if (std::holds_alternative<ClientTypeDescription>(type.kind)) {
            layout.otherTypes.push_back(otherType(type.name, "client"));
        } else {
            const char* const kind = std::holds_alternative<StringDescription>(type.kind)   ? "string"
                                     : std::holds_alternative<MatrixDescription>(type.kind) ? "matrix"
                                     : std::holds_alternative<ImageDescription>(type.kind)  ? "image"
                                                                                            : "date-time";
            layout.otherTypes.push_back(otherType(type.name, kind));
            const int id = table_.getDataTypeId(type.name.c_str());
            const std::string target = DtGetDataTypeName(&table_, DtGetDataTypeIdAliasedThruTo(&table_, id));
            if (target != type.name) layout.otherTypes.back().target = target;
        }
    }
    layout.refusals = description.refusals;
    layout.numMessages = description.numMessages;
    return layout;
}

} // namespace inspector
