#include "qltypes/types/DataType.h"

#include <cstring>
#include <initializer_list>
#include <limits>
#include <ostream>
#include <string_view>

#include "qlplatform/arrays/HostArray.h"
#include "qlplatform/memory/Memory.h"
#include "qltypes/fixed_point/TypeNames.h"
#include "qltypes/host/Assert_internal.h"
#include "qltypes/host/Failure_internal.h"

namespace QLTypeSys {

namespace {

constexpr const char* general = "QuillaneTypes:general";

const std::string& textOf(const LazyText& text) {
    static const std::string empty;
    return text.isSet() ? *text : empty;
}

bool isOneOf(int id, int low, int high) { return id >= low && id <= high; }

} // namespace

DataType::DataType(int id, const std::string& name, DataTypeSource source)
    : id_(id), name_(name), source_(source), storageId_(id) {}

DataType::~DataType() {
    // The field and not the virtual getter: a subclass's part is gone already.
    if (constructedGround_ && destructFcn_) destructFcn_(ground_);
    constructedGround_ = false;
    utFree(properties_);
    utFree(ground_);
    txDestroyArray(interface_);
}

// --- Setter families -------------------------------------------------------------------------------------------------

void DataType::refuseOnAlias(const char* property) const {
    if (getIdAliasedTo() != DATA_TYPE_ID_INVALID)
        failure::raise(QuillaneTypes::general::CannotSetPropertyOfAliasType(property, getName()));
}

// Replaceable: the last value stands.
template <class F, class Value> void DataType::define(const char* property, F& field, const Value& value) {
    refuseOnAlias(property);
    field = value;
    setAliasedToLocked(true);
}

// Replaceable, and values of the type are no longer plain bytes in the sense of the flag.
template <class F> void DataType::defineCustom(const char* property, F& field, F value, bool& plainFlag) {
    refuseOnAlias(property);
    field = value;
    plainFlag = false;
    setAliasedToLocked(true);
}

// Write-once: the same value again is no write at all.
template <class F> void DataType::defineOnce(const char* property, F& field, F value) {
    refuseOnAlias(property);
    if (!field) {
        field = value;
        setAliasedToLocked(true);
    } else if (field != value) {
        failure::raise(QuillaneTypes::general::InconsistentDataTypeFcn(property, getName()));
    }
}

// Write-once without alias test or lock; both directions raise the identifier that speaks of target to host (kept).
template <class F> void DataType::defineOnceForTarget(F& field, F value) {
    if (field && field != value) failure::raise(general, "InConsistentTargetToHostFcn");
    field = value;
}

// clang-format off
void DataType::setConstructFcn(ConstructFcn f) { defineCustom("Construct", constructFcn_, f, plainConstruct_); }
void DataType::setConstructFcnName(const std::string& n) { define("ConstructName", constructFcnName_, n); }
void DataType::setDestructFcn(DestructFcn f) { defineCustom("Destruct", destructFcn_, f, plainDestroy_); }
void DataType::setDestructFcnName(const std::string& n) { define("DestructName", destructFcnName_, n); }
void DataType::setDeepCopyFcn(DeepCopyFcn f) { defineCustom("DeepCopy", deepCopyFcn_, f, plainCopy_); }
void DataType::setDeepCopyFcnName(const std::string& n) { define("DeepCopyName", deepCopyFcnName_, n); }
void DataType::setSerializeFcn(SerializeFcn f) { defineCustom("Serialize", serializeFcn_, f, plainCopy_); }
void DataType::setSerializeFcnName(const std::string& n) { define("SerializeName", serializeFcnName_, n); }
void DataType::setDeserializeFcn(DeserializeFcn f) { defineCustom("Deserialize", deserializeFcn_, f, plainCopy_); }
void DataType::setDeserializeFcnName(const std::string& n) { define("DeserializeName", deserializeFcnName_, n); }
void DataType::setSerializeSizeFcn(SerializeSizeFcn f) { defineCustom("SerializeSize", serializeSizeFcn_, f, plainCopy_); }
void DataType::setSerializeSizeFcnName(const std::string& n) { define("SerializeSizeName", serializeSizeFcnName_, n); }
void DataType::setSizeOfFcn(SizeOfFcn f) { defineCustom("SizeOf", sizeOfFcn_, f, plainCopy_); }
void DataType::setSizeOfFcnName(const std::string& n) { define("SizeOfName", sizeOfFcnName_, n); }
void DataType::setContainedDataFcn(ContainedDataFcn f) { defineCustom("ContainedData", containedDataFcn_, f, plainCopy_); }
void DataType::setContainedDataFcnName(const std::string& n) { define("ContainedDataName", containedDataFcnName_, n); }
void DataType::setContainedDataDimsFcn(ContainedDataDimsFcn f) { defineCustom("ContainedDataDims", containedDataDimsFcn_, f, plainCopy_); }
void DataType::setContainedDataDimsFcnName(const std::string& n) { define("ContainedDataDimsName", containedDataDimsFcnName_, n); }
void DataType::setUpdateContainedDataDimsFcn(UpdateContainedDataDimsFcn f) { defineCustom("UpdateContainedDataDims", updateContainedDataDimsFcn_, f, plainCopy_); }
void DataType::setUpdateContainedDataDimsFcnName(const std::string& n) { define("UpdateContainedDataDimsName", updateContainedDataDimsFcnName_, n); }
void DataType::setUpdateContainedDataDimFcn(UpdateContainedDataDimFcn f) { defineCustom("UpdateContainedDataDim", updateContainedDataDimFcn_, f, plainCopy_); }
void DataType::setUpdateContainedDataDimFcnName(const std::string& n) { define("UpdateContainedDataDimName", updateContainedDataDimFcnName_, n); }
void DataType::setCoderPropertiesFcn(CoderPropertiesFcn f) { define("ContainedDataDims", coderPropertiesFcn_, f); } // kept: this literal
void DataType::setCoderPropertiesFcnName(const std::string& n) { define("ContainedDataDimsName", coderPropertiesFcnName_, n); } // kept: this literal
void DataType::setDataConstructFcn(DataConstructFcn f) { defineCustom("DataConstruct", dataConstructFcn_, f, plainCopy_); }
void DataType::setDataConstructFcnName(const std::string& n) { define("DataConstructName", dataConstructFcnName_, n); }
void DataType::setContainedDataType(int id) { define("ContainedDataTypeName", containedDataType_, id); } // kept: this literal
void DataType::setContainedDataNumDims(unsigned long numDims) { define("ContainedDataNumDims", containedDataNumDims_, numDims); }
void DataType::setConvertBetweenFcn(ConvertBetweenFcn f) { defineOnce("ConvertBetween", convertBetweenFcn_, f); }
void DataType::setGreaterThanFcn(GreaterThanFcn f) { defineOnce("GreaterThan", greaterThanFcn_, f); }
void DataType::setGreaterEqualFcn(GreaterEqualFcn f) { defineOnce("GreaterEqual", greaterEqualFcn_, f); }
void DataType::setIsPositiveFcn(IsPositiveFcn f) { defineOnce("IsPositive", isPositiveFcn_, f); }
void DataType::setIsNegativeFcn(IsNegativeFcn f) { defineOnce("IsNegative", isNegativeFcn_, f); }
void DataType::setHostToTargetFcn(HostToTargetFcn f) { defineOnceForTarget(hostToTargetFcn_, f); }
void DataType::setTargetToHostFcn(TargetToHostFcn f) { defineOnceForTarget(targetToHostFcn_, f); }

// --- Plain reads -----------------------------------------------------------------------------------------------------

ConstructFcn DataType::getConstructFcn() const { return constructFcn_; }
const std::string& DataType::getConstructFcnName() const { return textOf(constructFcnName_); }
DestructFcn DataType::getDestructFcn() const { return destructFcn_; }
const std::string& DataType::getDestructFcnName() const { return textOf(destructFcnName_); }
DeepCopyFcn DataType::getDeepCopyFcn() const { return deepCopyFcn_; }
const std::string& DataType::getDeepCopyFcnName() const { return textOf(deepCopyFcnName_); }
SerializeFcn DataType::getSerializeFcn() const { return serializeFcn_; }
const std::string& DataType::getSerializeFcnName() const { return textOf(serializeFcnName_); }
DeserializeFcn DataType::getDeserializeFcn() const { return deserializeFcn_; }
const std::string& DataType::getDeserializeFcnName() const { return textOf(deserializeFcnName_); }
SerializeSizeFcn DataType::getSerializeSizeFcn() const { return serializeSizeFcn_; }
const std::string& DataType::getSerializeSizeFcnName() const { return textOf(serializeSizeFcnName_); }
SizeOfFcn DataType::getSizeOfFcn() const { return sizeOfFcn_; }
const std::string& DataType::getSizeOfFcnName() const { return textOf(sizeOfFcnName_); }
ContainedDataFcn DataType::getContainedDataFcn() const { return containedDataFcn_; }
const std::string& DataType::getContainedDataFcnName() const { return textOf(containedDataFcnName_); }
ContainedDataDimsFcn DataType::getContainedDataDimsFcn() const { return containedDataDimsFcn_; }
const std::string& DataType::getContainedDataDimsFcnName() const { return textOf(containedDataDimsFcnName_); }
UpdateContainedDataDimsFcn DataType::getUpdateContainedDataDimsFcn() const { return updateContainedDataDimsFcn_; }
const std::string& DataType::getUpdateContainedDataDimsFcnName() const { return textOf(updateContainedDataDimsFcnName_); }
UpdateContainedDataDimFcn DataType::getUpdateContainedDataDimFcn() const { return updateContainedDataDimFcn_; }
const std::string& DataType::getUpdateContainedDataDimFcnName() const { return textOf(updateContainedDataDimFcnName_); }
CoderPropertiesFcn DataType::getCoderPropertiesFcn() const { return coderPropertiesFcn_; }
const std::string& DataType::getCoderPropertiesFcnName() const { return textOf(coderPropertiesFcnName_); }
DataConstructFcn DataType::getDataConstructFcn() const { return dataConstructFcn_; }
const std::string& DataType::getDataConstructFcnName() const { return textOf(dataConstructFcnName_); }
ConvertBetweenFcn DataType::getConvertBetweenFcn() const { return convertBetweenFcn_; }
IsPositiveFcn DataType::getIsPositiveFcn() const { return isPositiveFcn_; }
IsNegativeFcn DataType::getIsNegativeFcn() const { return isNegativeFcn_; }
GreaterThanFcn DataType::getGreaterThanFcn() const { return greaterThanFcn_; }
GreaterEqualFcn DataType::getGreaterEqualFcn() const { return greaterEqualFcn_; }
HostToTargetFcn DataType::getHostToTargetFcn() const { return hostToTargetFcn_; }
TargetToHostFcn DataType::getTargetToHostFcn() const { return targetToHostFcn_; }
int DataType::getId() const { return id_; }
const char* DataType::getName() const { return name_.c_str(); }
const char* DataType::getShortName() const { return shortName_.isSet() ? (*shortName_).c_str() : name_.c_str(); }
bool DataType::getIsValidFixptType() const { return isValidFixptType_; }
DataTypeSource DataType::getDataTypeSource() const { return source_; }
bool DataType::getAliasedToLocked() const { return aliasedToLocked_; }
bool DataType::getIsAliasToLocked() const { return aliasedToLocked_; }
int DataType::getContainedDataType() const { return containedDataType_; }
unsigned long DataType::getContainedDataNumDims() const { return containedDataNumDims_; }
bool DataType::getIsPointerType() const { return isPointerType_; }
int DataType::getIdAliasedTo() const { return DATA_TYPE_ID_INVALID; }
int DataType::getIdAliasedThruTo() const { return getId(); }
int DataType::getTargetSize() const { return targetSize_; }
int DataType::getStorageId() const { return storageId_; }
int DataType::getIdAliasedToForTesting() const { return idAliasedTo_; }
const void* DataType::getGround() const { return ground_; }
bool DataType::getDefaultGround() const { return defaultGround_; }
bool DataType::getConstructedGround() const { return constructedGround_; }
const void* DataType::getProperties() const { return properties_; }
int DataType::getPropertiesSize() const { return propertiesSize_; }
CG::Type* DataType::getCGType() const { return cgType_; }
const unsigned int* DataType::getChecksumElements() const { return checksumElements_; }
txArray_tag* DataType::getInterface() const { return interface_; }
DataTypeQualifier DataType::getType() const { return qualifier_; }
bool DataType::isAtomic() const { return isAtomic_; }
bool DataType::groundHasNonZeroStoredValue() const { return groundHasNonZeroStoredValue_; }
bool DataType::canContainNegativeNumbers() const { return canContainNegativeNumbers_; }
bool DataType::getVisitFlag() const { return visitFlag_; }

// --- Plain writes ----------------------------------------------------------------------------------------------------

void DataType::setIsValidFixptType(bool isValid) { isValidFixptType_ = isValid; }
void DataType::setAliasedToLocked(bool locked) { aliasedToLocked_ = locked; }
void DataType::setIsAliasToLocked(bool locked) { aliasedToLocked_ = locked; }
void DataType::setIsPointerType(bool isPointer) { isPointerType_ = isPointer; }
void DataType::setTargetSize(int size) { targetSize_ = size; }
void DataType::setStorageId(int id) { storageId_ = id; }
void DataType::setIdAliasedToForTesting(int id) { idAliasedTo_ = id; }
void DataType::setDefaultGround(bool isDefault) { defaultGround_ = isDefault; }
void DataType::setConstructedGround(bool isConstructed) { constructedGround_ = isConstructed; }
void DataType::setIsAtomic(bool isAtomic) { isAtomic_ = isAtomic; }
void DataType::setGroundHasNonZeroStoredValue(bool hasNonZero) { groundHasNonZeroStoredValue_ = hasNonZero; }
void DataType::setCGType(CG::Type* type) { cgType_ = type; }
void DataType::setType(DataTypeQualifier qualifier) { qualifier_ = qualifier; }
void DataType::setVisitFlag(bool visited) const { visitFlag_ = visited; }
void DataType::updateAliasedToType(DataType*) {}
void DataType::updateAliasedThruToType(DataType*) {}

// --- Classifiers -----------------------------------------------------------------------------------------------------

bool DataType::isImage() const                           { return false; }
bool DataType::isDynamicMatrix() const                   { return false; }
bool DataType::isBool() const                            { return getId() == DATA_TYPE_ID_BOOLEAN; }
bool DataType::isBuiltInClassic9() const                 { return isOneOf(getId(), 0, 8); }
bool DataType::isBuiltInIntClassic6() const              { return isOneOf(getId(), 2, 7); }
bool DataType::isIntDataType() const                     { return isOneOf(getId(), 2, 7); }
bool DataType::isBuiltInIntUnsignedClassic3() const      { return isOneOf(getId(), 2, 7) && getId() % 2 == 1; }
bool DataType::isUnsignedIntDataType() const             { return isOneOf(getId(), 2, 7) && getId() % 2 == 1; }
bool DataType::isBuiltInIntSignedClassic3() const        { return isOneOf(getId(), 2, 7) && getId() % 2 == 0; }
bool DataType::isSignedIntDataType() const               { return isOneOf(getId(), 2, 7) && getId() % 2 == 0; }
bool DataType::isFloatDataType() const                   { return isOneOf(getId(), 0, 1); }
bool DataType::isNumericNotBuiltInClassic9() const       { return getIsType(dtqFixpt); }
bool DataType::isRawNumericNotBuiltInClassic9() const    { return getIsType(dtqFixpt); }
bool DataType::isEnum() const                            { return getIsType(dtqEnum); }
bool DataType::isNumericOrBool() const                   { return isBuiltInClassic9() || isNumericNotBuiltInClassic9(); }
bool DataType::isNumericNotBool() const                  { return !isBool() && isNumericOrBool(); }
bool DataType::hasFxpDataTypeProp() const                { return isNumericOrBool() || isEnum(); }
bool DataType::getIsType(DataTypeQualifier q) const      { return qualifier_ == q; }
// clang-format on

bool DataType::isHalf() const {
    if (!isNumericNotBuiltInClassic9()) return false;
    const fxpDataTypeProp* prop = getFxpDataTypeProp();
    return prop && prop->DataTypeMode == FXP_DT_CUSTOM_FLOAT && prop->ExponentLength == 5 && prop->WordLength == 16;
}

bool DataType::isRawDTypeIdBuiltInClassic9AndContainerCouldStoreNegatives(int id) {
    return id == 0 || id == 1 || id == 2 || id == 4 || id == 6;
}

bool DataType::isRawDTypeIdNumericAndContainerCouldStoreNegatives(const char* name, int id) {
    return isOneOf(id, 0, 8) ? isRawDTypeIdBuiltInClassic9AndContainerCouldStoreNegatives(id)
                             : FXP::canQLTypeNameContainerStoreNegatives(name);
}

bool DataType::isNumericOrBoolAndContainerCouldStoreNegatives() const {
    return isNumericOrBool() && isRawDTypeIdNumericAndContainerCouldStoreNegatives(getName(), getId());
}

bool DataType::isSignedFixptDT() const {
    return isRawDTypeIdNumericAndContainerCouldStoreNegatives(getName(), getId());
}

const fxpDataTypeProp* DataType::getFxpDataTypeProp() const {
    return static_cast<const fxpDataTypeProp*>(getProperties());
}

// --- Size, ground, properties ----------------------------------------------------------------------------------------

void DataType::setSize(int size) {
    const bool isSet = size_ != -1;
    const bool isBoolean = getId() == DATA_TYPE_ID_BOOLEAN;
    if (isSet && size_ != size && !isBoolean) failure::raise(general, "CannotModifyDataTypeSize", getName(), size_);
    if (size <= 0) failure::raise(general, "InvalidDataTypeSize", getName(), size);
    if (!isSet) {
        auto* const ground = static_cast<unsigned char*>(utCalloc(2, static_cast<std::size_t>(size)));
        if (!ground) failure::raiseOutOfMemory();
        ground_ = ground;
    } else if (size_ != size) { // boolean alone: the old ground goes first, so a failure leaves none
        size_ = size;
        utFree(ground_);
        ground_ = static_cast<unsigned char*>(utCalloc(2, static_cast<std::size_t>(size)));
        if (!ground_) failure::raiseOutOfMemory();
    }
    size_ = size;
    setDefaultGround(true); // kept: also where the size did not change
    setIsAliasToLocked(true);
}

void DataType::setGround(const void* ground) {
    refuseOnAlias("Ground");
    if (size_ == -1) failure::raise(general, "CannotSetGroundRepBeforeSettingSize", getName());
    const auto size = static_cast<std::size_t>(size_);
    if (getDefaultGround()) {
        std::memcpy(ground_, ground, size);
        std::memcpy(ground_ + size, ground, size);
        setDefaultGround(false);
        setAliasedToLocked(true);
    } else if (std::memcmp(ground_, ground, size) != 0) {
        failure::raise(general, "CannotModifyDataTypeGroundRepresentation", getName());
    }
}

void DataType::setPropertiesSize(int size) {
    refuseOnAlias("PropertiesSize");
    if (propertiesSize_ != 0 && propertiesSize_ != size)
        failure::raise(general, "CannotModifyDataTypePropertiesSize", getName(), propertiesSize_, size);
    if (size < 0) failure::raise(general, "InvalidDataTypePropertiesSize", getName(), size);
    if (propertiesSize_ == 0) {
        utFree(properties_); // a block of no bytes
        properties_ = nullptr;
        propertiesSize_ = size;
        setAliasedToLocked(true);
    }
}

void DataType::setProperties(const void* properties) {
    refuseOnAlias("Properties");
    if (properties && getPropertiesSize() == 0)
        failure::raise(general, "CannotSetPropertiesBeforeSettingSize", getName());
    const auto size = static_cast<std::size_t>(propertiesSize_);
    QLTYPES_ASSERT(properties || size == 0);
    if (properties_) {
        if (size != 0 && std::memcmp(properties_, properties, size) != 0)
            failure::raise(general, "CannotModifyDataTypeProperties", getName());
        return;
    }
    properties_ = static_cast<unsigned char*>(utMalloc(size));
    if (!properties_ && size != 0) failure::raiseOutOfMemory();
    if (size != 0) std::memcpy(properties_, properties, size);
    setAliasedToLocked(true);
}

// --- Data of clients -------------------------------------------------------------------------------------------------

void DataType::setChecksumElements(const unsigned int* words) {
    std::memcpy(checksumElements_, words, sizeof checksumElements_);
}

void DataType::setInterface(txArray_tag* array) {
    if (array) txKeepArray(array); // before the old one goes: it may be the same
    txDestroyArray(interface_);
    interface_ = array;
}

// --- Names and printing ----------------------------------------------------------------------------------------------

std::string DataType::getNameStripDTOPrefix() const {
    const std::string name = getName();
    if (!getIsType(dtqStruct)) return name;
    // dto(Dbl|Sgl|Scl)(Flt|Fxp)?_
    std::string_view rest = name;
    const auto drop = [&rest](std::initializer_list<std::string_view> words) {
        for (const std::string_view word : words) {
            if (!rest.starts_with(word)) continue;
            rest.remove_prefix(word.size());
            return true;
        }
        return false;
    };
    if (!drop({"dto"}) || !drop({"Dbl", "Sgl", "Scl"})) return name;
    drop({"Flt", "Fxp"});
    return drop({"_"}) ? std::string(rest) : name;
}

void DataType::print(std::ostream& os) const {
    os << "DataType : '";
    if (const char* name = getName())
        os << name;
    else
        os.setstate(std::ios_base::badbit);
    os << "'\n";
    os << "ID : " << getId() << '\n';
    os << "Size : " << size_ << '\n';
    os << "Storage ID : " << getStorageId() << '\n';
    os << "DataTypeQualifier : " << static_cast<int>(getType()) << "\n\n";
}

std::ostream& operator<<(std::ostream& os, const DataType& type) {
    type.print(os);
    return os;
}

// --- One value -------------------------------------------------------------------------------------------------------

void DataType::reportFailedFcn(const char* operation) const {
    failure::raise(QuillaneTypes::general::DataTypeFcnUnknownError(operation, getName()));
}

// The operations by identifier are to cost one virtual call and the function. So a record's own function is asked for
// through its getter only where none was set, and that road is kept out of the short one.

[[gnu::noinline, gnu::cold]] void DataType::deepCopyThroughGetter(const void* src, void* dst) const {
    if (!getDeepCopyFcn()(dst, src)) reportFailedFcn("DeepCopy");
}

[[gnu::noinline, gnu::cold]] void DataType::destroyThroughGetter(void* p) const {
    if (!getDestructFcn()(p)) reportFailedFcn("Destruct");
}

[[gnu::noinline, gnu::cold]] void DataType::constructThroughGetter(void* p) const {
    if (!getConstructFcn()(p, getProperties())) reportFailedFcn("Construct");
}

void DataType::deepCopyScalarElement(const void* src, void* dst) const {
    if (plainCopy_) {
        std::memcpy(dst, src, static_cast<std::size_t>(size_));
        return;
    }
    if (!deepCopyFcn_) [[unlikely]]
        return deepCopyThroughGetter(src, dst);
    if (!deepCopyFcn_(dst, src)) [[unlikely]]
        reportFailedFcn("DeepCopy");
}

void DataType::destroyScalarElement(void* p) const {
    if (plainDestroy_) return;
    if (!destructFcn_) [[unlikely]]
        return destroyThroughGetter(p);
    if (!destructFcn_(p)) [[unlikely]]
        reportFailedFcn("Destruct");
}

void DataType::constructScalarElement(void* p) const {
    if (plainConstruct_) return;
    if (!constructFcn_) [[unlikely]]
        return constructThroughGetter(p);
    if (!constructFcn_(p, getProperties())) [[unlikely]]
        reportFailedFcn("Construct");
}

void DataType::serializeScalarElement(const void* src, void* dst, unsigned long a, unsigned long b) const {
    if (!(serializeFcn_ ? serializeFcn_ : getSerializeFcn())(dst, src, a, b)) [[unlikely]]
        reportFailedFcn("Serialize");
}

void DataType::deserializeScalarElement(const void* src, void* dst, unsigned long a, unsigned long b) const {
    if (!(deserializeFcn_ ? deserializeFcn_ : getDeserializeFcn())(dst, src, a, b)) [[unlikely]]
        reportFailedFcn("Deserialize");
}

unsigned long DataType::serializeSizeScalarElement(const void* src) const {
    return (serializeSizeFcn_ ? serializeSizeFcn_ : getSerializeSizeFcn())(src);
}

void DataType::dataConstruct(unsigned long numDims, const unsigned long* dims, unsigned long elementSize,
                             const void* data, void* dst) const {
    if (!getDataConstructFcn()(numDims, dims, elementSize, data, dst)) reportFailedFcn("DataConstruct");
}

std::vector<int> DataType::dependsOn() const { return {}; }

} // namespace QLTypeSys
