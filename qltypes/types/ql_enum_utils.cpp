#include "qltypes/types/ql_enum_utils.h"

#include <algorithm>
#include <cstdint>
#include <cstring>
#include <new>
#include <string_view>

#include "qlplatform/classes/Objects.h"
#include "qlplatform/services/HostFunctions.h"
#include "qlplatform/strings/Strings.h"
#include "qltypes/host/Failure_internal.h"
#include "qltypes/host/FeatureFlags_internal.h"
#include "qltypes/types/DataTypeTableUtils.h"

using QLTypeSys::DataTypeTable;
namespace failure = QLTypeSys::failure;

namespace {

constexpr std::string_view intEnumType = "Quillane.IntEnumType";

bool isAllowedSuperclass(const std::string& name) {
    return name == intEnumType || (QLFEAT_ControlStorageTypeForEnums->state() != 0 && qlIsValidEnumStorageType(name));
}

bool hasComplexValue(const tcos::COSInterfacePtr& interface) {
    const tcos::COSEnum* member = tcos::cosiToEnum(interface);
    const txArrayPtr value = member ? member->getValue() : txArrayPtr();
    return txIsComplex(omGetUnderlyingArray(value.get()));
}

// The leaf of the message for the first thing wrong with the class, or null.
const char* firstFault(const tcos::COSClass& cls) {
    if (!cls.isEnumeration()) return "EnumTypeNotAnEnumerationClass";
    const tcos::COSSuperclassList superclasses = cls.getSuperclasses();
    if (!superclasses.hasMoreElements()) return "EnumTypeWithInvalidSuperclass";
    const std::string superclass = superclasses.nextElement();
    if (!isAllowedSuperclass(superclass)) return "EnumTypeWithInvalidSuperclass";
    if (superclasses.hasMoreElements()) return "EnumTypeWithMultipleInheritance";
    if (cls.getPackage()) return "EnumTypeInsidePackage";
    const tcos::COSIterator members = cls.getEnumerationMembers();
    if (!members.hasMoreElements()) return "EnumTypeWithNoEnumStrings";
    while (members.hasMoreElements()) {
        const bool isComplex = hasComplexValue(members.nextElement());
        const bool isLetThrough =
            QLTypeSys::preserveEnumsWithDuplicateValues->state() != 0 && superclass == intEnumType;
        if (isComplex && !isLetThrough) return "EnumTypeWithComplexValues";
    }
    return nullptr;
}

qlsvDiagnosticImpl* notAClass() noexcept {
    try {
        return failure::diagnosticOf(Quillane::DataType::EnumTypeNotAClass());
    } catch (const std::bad_alloc&) {
        return qlsvCreateOutOfMemoryDiagnostic();
    }
}

template <class T> int valueAt(const void* data, unsigned long index) {
    T value;
    std::memcpy(&value, static_cast<const char*>(data) + index * sizeof(T), sizeof(T));
    return static_cast<int>(value);
}

} // namespace

qlsvDiagnosticImpl* qlCheckForValidEnumDataType(tcos::COSInterfacePtr interface) noexcept {
    try {
        const tcos::COSClass* cls = tcos::cosiToClass(interface);
        if (!cls) return notAClass();
        const char* name = cls->getName();
        const char* leaf = firstFault(*cls);
        return leaf ? failure::diagnosticOf(failure::message("Quillane:DataType", leaf, name ? name : "")) : nullptr;
    } catch (const foundation::core::except::IException& e) {
        return qlsvCreateDiagnosticFromIException(e, true);
    } catch (...) {
        return notAClass();
    }
}

bool qlIsValidEnumDataType(tcos::COSInterfacePtr interface) noexcept {
    try {
        const tcos::COSClass* cls = tcos::cosiToClass(interface);
        if (!cls || !cls->isEnumeration()) return false;
    } catch (...) {
        return false;
    }
    qlsvDiagnosticImpl* diagnostic = qlCheckForValidEnumDataType(std::move(interface));
    const bool isValid = !diagnostic;
    qlsvDiscardDiagnostic(diagnostic);
    return isValid;
}

bool qlIsValidEnumObject(const txArray_tag* object) noexcept {
    if (txGetClassID(object) != txClassObject) return false;
    try {
        return qlIsValidEnumDataType(
            tcos::COSClass::getClassInterface(tcos::internal::makeInterned(txGetClassName(object))));
    } catch (...) {
        return false;
    }
}

bool txIsValidEnumObject(const txArray_tag* object) noexcept { return qlIsValidEnumObject(object); }

bool qlIsValidEnumStorageType(const std::string& name) {
    static constexpr std::string_view storageTypes[] = {"int8", "int16", "int32", "uint8", "uint16"};
    return std::find(std::begin(storageTypes), std::end(storageTypes), name) != std::end(storageTypes);
}

txArrayPtr qlGetStoredIntTxArrayFromEnumObject(const txArray_tag* object) {
    const txArray_tag* stored = omGetUnderlyingArray(object);
    if (!txIsComplex(stored)) return TxArrayUtil::SafeCreateSharedCopy(stored);
    txArray_tag* input = const_cast<txArray_tag*>(stored); // host functions do not write to their inputs
    txArray_tag* output = nullptr;
    if (qlsvDiagnosticImpl* diagnostic = qlsvFEVAL_NoThrow(1, &output, 1, &input, "real", true, txDestroyArray))
        qlsvThrowIExceptionFromDiagnostic(diagnostic, nullptr);
    return txArrayPtr(output);
}

int DtGetEnumTypeValueFromVoidPtr(const DataTypeTable* table, int id, const void* data, unsigned long index) {
    // clang-format off
    switch (DtGetDataTypeStorageId(table, id)) {
    case DATA_TYPE_ID_INT8:   return valueAt<std::int8_t>(data, index);
    case DATA_TYPE_ID_UINT8:  return valueAt<std::uint8_t>(data, index);
    case DATA_TYPE_ID_INT16:  return valueAt<std::int16_t>(data, index);
    case DATA_TYPE_ID_UINT16: return valueAt<std::uint16_t>(data, index);
    case DATA_TYPE_ID_INT32:
    case DATA_TYPE_ID_UINT32: return valueAt<std::int32_t>(data, index);
    default:                  return 0;
    }
    // clang-format on
}

bool DtIsValidEnumType(const DataTypeTable* table, int id, const char* name, int* resultId) {
    *resultId = DATA_TYPE_ID_INVALID;
    if (utIsEmptyString(name)) return false;
    if (DtIsDataTypeIdValid(table, id) && DtIsEnumType(table, id) &&
        std::strcmp(DtGetDataTypeName(table, id), name) == 0)
        *resultId = id;
    return true; // kept: also when the id does not fit
}
