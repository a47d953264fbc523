// The table's life cycle, lookups, plain registration and hooks. Aliases and replacement, values, structures and the
// other kinds stand in sources of their own.
#include "qltypes/types/DataTypeTable.h"

#include <algorithm>
#include <climits>
#include <cstdio>
#include <cstring>
#include <ostream>
#include <string_view>

#include "qlplatform/memory/Memory.h"
#include "qlplatform/strings/Strings.h"
#include "qltypes/fixed_point/BuiltInProps.h"
#include "qltypes/fixed_point/TypeNames.h"
#include "qltypes/host/Failure_internal.h"
#include "qltypes/types/BuiltInDataType.h"
#include "qltypes/types/BuiltInTypes_internal.h"
#include "qltypes/types/NameIndex_internal.h"

namespace QLTypeSys {

namespace {

constexpr const char* general = "QuillaneTypes:general";

// Built-in names in the order in which they are tried.
constexpr BuiltInDTypeId namesInOrder[] = {DATA_TYPE_ID_DOUBLE, DATA_TYPE_ID_SINGLE, DATA_TYPE_ID_INT32,
                                           DATA_TYPE_ID_INT16,  DATA_TYPE_ID_INT8,   DATA_TYPE_ID_UINT32,
                                           DATA_TYPE_ID_UINT16, DATA_TYPE_ID_UINT8,  DATA_TYPE_ID_BOOLEAN};

constexpr const char16_t* pseudoBuiltInNames[] = {u"logical", u"half", u"int64", u"uint64"};

// A zeroed block of twice `size` bytes; null only where there is nothing to hold.
unsigned char* newGround(int size) {
    auto* const ground = static_cast<unsigned char*>(utCalloc(2, static_cast<std::size_t>(size)));
    if (!ground && size >= 1) failure::raiseOutOfMemory();
    return ground;
}

} // namespace

ClientDataTypeCheckCallback::~ClientDataTypeCheckCallback() = default;

// --- Life cycle ------------------------------------------------------------------------------------------------------

DataTypeTable::DataTypeTable()
    : dataTypeIdsByName_(std::make_unique<NameIndex>()), customDataTypeCallbacks_(1), customDataTypeHeaderFiles_(1) {
    anonymousTypeName_[0] = '\0';
    dataTypeAccess_ = static_cast<_qlDataTypeAccess_tag*>(utCalloc(1, sizeof(_qlDataTypeAccess_tag)));
    if (!dataTypeAccess_) failure::raiseOutOfMemory();
    dataTypeAccess_->table = this;
    try {
        initialize();
    } catch (...) { // the destructor does not run
        for (DataType* record : dataTypes_)
            delete record;
        utFree(dataTypeAccess_);
        throw;
    }
}

DataTypeTable::~DataTypeTable() {
    for (DataType* record : dataTypes_)
        delete record;
    utFree(dataTypeAccess_);
}

void DataTypeTable::initialize() {
    for (const FixedType& row : fixedTypes())
        registerDataType(row.name, row.source, nullptr);
    const double zero = 0.0;
    const float zeroSingle = 0.0f;
    recordAt(DATA_TYPE_ID_DOUBLE)->setGround(&zero); // these two alone have no default ground
    recordAt(DATA_TYPE_ID_SINGLE)->setGround(&zeroSingle);
}

void DataTypeTable::resetToBuiltin() {
    for (std::size_t i = 0; i < numFixedTypes; ++i) {
        dataTypes_[i]->setCGType(nullptr);
        dataTypes_[i]->targetToHostFcn_ = nullptr;
        dataTypes_[i]->hostToTargetFcn_ = nullptr;
    }
    anonymousTypeCount_ = 0;
    reservedIndex_ = -1;
    for (std::size_t i = numFixedTypes; i < dataTypes_.size(); ++i)
        delete dataTypes_[i];
    dataTypes_.resize(numFixedTypes);
    dataTypeIdsByName_->clear();
    for (const DataType* record : dataTypes_)
        dataTypeIdsByName_->insert(record->getName(), record->getId());
    if (clientDataTypeCheckCallback_) clientDataTypeCheckCallback_->reset();
    customDataTypeCallbacks_.clear();
    customDataTypeCallbacks_.clear(); // kept: twice, and the header files not at all
}

// --- Hooks -----------------------------------------------------------------------------------------------------------

// clang-format off
DataTypeTable* DataTypeTable::CreateDTTable(QLRootBD*) const                        { return nullptr; }
int DataTypeTable::registerBusDataType(const char*, DataTypeSource, const char*)    { return -1; }
bool DataTypeTable::shortCircuitRegistration(DataTypeSource) const                  { return true; }
int DataTypeTable::getParameterUnderflowDiagnostic() const                          { return 1; }
int DataTypeTable::getParameterOverflowDiagnostic() const                           { return 1; }
int DataTypeTable::getParameterPrecisionLossDiagnostic() const                      { return 1; }
int DataTypeTable::getFixptConstUnderflowDiagnostic() const                         { return 0; }
int DataTypeTable::getFixptConstOverflowDiagnostic() const                          { return 0; }
int DataTypeTable::getFixptConstPrecisionLossDiagnostic() const                     { return 0; }
int DataTypeTable::getDataOverflowDiagnostic() const                                { return 1; }
int DataTypeTable::getDataSaturationDiagnostic() const                              { return 1; }
bool DataTypeTable::getUseIntDivNetSlopeOpt() const                                 { return false; }
bool DataTypeTable::isOverriddenObjectName(const std::string&) const                { return false; }
const char* DataTypeTable::getEnumTypeStringFromValue(int, int) const               { return nullptr; }
const char* DataTypeTable::getEnumTypeStringFromIndex(int, int) const               { return nullptr; }
void DataTypeTable::setSkipForCodeGen(int)                                          {}
bool DataTypeTable::getSkipForCodeGen(int) const                                    { return false; }
bool DataTypeTable::getResolvingDataTypeForOverrideUtils() const                    { return false; }
txArrayPtr DataTypeTable::getOrdinalValuesFromEnumObject(const txArray_tag*) const { return {}; }
boost::shared_ptr<OverrideUtils> DataTypeTable::getObjectOverrideUtils(const std::string&) const { return {}; }
void DataTypeTable::addObjectOverrideUtils(const std::string&, boost::shared_ptr<OverrideUtils>) {}
void DataTypeTable::addOverriddenObject(const std::string&, const boost::shared_ptr<OverriddenObject>&) {}
// clang-format on

const void* DataTypeTable::getDataTypeProperties(const char*, int id) const {
    return getDataTypeAliasedThruTo(id)->getProperties();
}

void DataTypeTable::print(std::ostream& os) const {
    os << "DataTypeTable\n"
       << "Number of DataTypes : " << dataTypes_.size() << "\n\n";
    for (const DataType* record : dataTypes_)
        record->print(os);
    os << '\n';
}

std::ostream& operator<<(std::ostream& os, const DataTypeTable& table) {
    table.print(os);
    return os;
}

// --- Records of the fixed types --------------------------------------------------------------------------------------

// What built-in and predefined types have in common. Writes fields, not setters: those of auto have no effect.
void DataTypeTable::fillFromRow(DataType* record, const FixedType& row) {
    record->size_ = row.size;
    record->storageId_ = row.id;
    record->idAliasedTo_ = row.idAliasedTo;
    record->convertBetweenFcn_ = row.convertBetween;
    record->isPositiveFcn_ = row.isPositive;
    record->isNegativeFcn_ = row.isNegative;
    record->greaterThanFcn_ = row.greaterThan;
    record->greaterEqualFcn_ = row.greaterEqual;
    record->constructFcn_ = nullptr;
    record->destructFcn_ = nullptr;
    record->deepCopyFcn_ = nullptr;
    record->serializeFcn_ = nullptr;
    record->deserializeFcn_ = nullptr;
    record->serializeSizeFcn_ = nullptr;
    record->constructFcnName_.clear();
    record->destructFcnName_.clear();
    record->deepCopyFcnName_.clear();
    record->serializeFcnName_.clear();
    record->deserializeFcnName_.clear();
    record->serializeSizeFcnName_.clear();
    utFree(record->ground_);
    record->ground_ = nullptr;
    record->ground_ = newGround(row.size);
}

void DataTypeTable::registerBuiltInDataType(DataType* record, int id) {
    const FixedType& row = fixedType(id);
    fillFromRow(record, row);
    record->groundHasNonZeroStoredValue_ = row.groundHasNonZeroStoredValue;
    record->canContainNegativeNumbers_ = row.canContainNegativeNumbers;
    record->defaultGround_ = true;
    record->constructedGround_ = false;
    if (id != DATA_TYPE_ID_AUTO) {
        utFree(record->properties_);
        record->properties_ = static_cast<unsigned char*>(utMalloc(sizeof(fxpDataTypeProp)));
        if (!record->properties_) failure::raiseOutOfMemory();
        std::memcpy(record->properties_, &getBuiltinDataTypeProperties(id), sizeof(fxpDataTypeProp));
        record->propertiesSize_ = sizeof(fxpDataTypeProp);
    }
    record->aliasedToLocked_ = true;
}

void DataTypeTable::registerInternalExtraDataType(DataType* record, int id) {
    fillFromRow(record, fixedType(id));
    record->setDefaultGround(true);
    record->setConstructedGround(false);
    record->aliasedToLocked_ = true;
    record->setType(dtqPredefined);
}

// --- Lookups ---------------------------------------------------------------------------------------------------------

int DataTypeTable::getDataTypeId(const char* name) const {
    return name ? dataTypeIdsByName_->find(name, DATA_TYPE_ID_INVALID) : DATA_TYPE_ID_INVALID;
}

bool DataTypeTable::isDataTypeIdValid(int id) const {
    return id >= DATA_TYPE_ID_AUTO && id != INT_MAX && id + 1 < getNumDataTypes();
}

bool DataTypeTable::isDataTypeIdValid_NotAuto(int id) const { return id != DATA_TYPE_ID_AUTO && isDataTypeIdValid(id); }

bool DataTypeTable::checkDataTypeId(int id) const {
    if (!isDataTypeIdValid(id)) failure::raise(general, "InvalidDataTypeId", id);
    return true;
}

int DataTypeTable::getDataTypeIdAliasedTo(int id) const {
    return id == DATA_TYPE_ID_INVALID ? id : recordAt(id)->getIdAliasedTo();
}

DataType* DataTypeTable::getDataTypeAliasedThruTo(int id) const {
    checkDataTypeId(id);
    DataType* record = recordAt(id);
    // One step, but for an alias whose end became an alias itself.
    while (record->getIdAliasedTo() != DATA_TYPE_ID_INVALID)
        record = recordAt(record->getIdAliasedThruTo());
    return record;
}

bool DataTypeTable::isContextSensitiveOrDouble(int id) { return id == DATA_TYPE_ID_AUTO || id == DATA_TYPE_ID_DOUBLE; }

int DataTypeTable::getBuiltInDataType(const char* name) {
    const std::string_view text = name ? name : "";
    for (const BuiltInDTypeId id : namesInOrder)
        if (text == fixedType(id).name) return id;
    return DATA_TYPE_ID_INVALID;
}

int DataTypeTable::getBuiltInDataType(const std::u16string& name) {
    for (const BuiltInDTypeId id : namesInOrder)
        if (qlsvStrcmp(name, qlsvUtf16FromUtf8(fixedType(id).name)) == 0) return id;
    return DATA_TYPE_ID_INVALID;
}

bool DataTypeTable::nameOfBuiltInDataType(const char* name) { return getBuiltInDataType(name) != DATA_TYPE_ID_INVALID; }

bool DataTypeTable::nameOfBuiltInDataType(const std::u16string& name) {
    return getBuiltInDataType(name) != DATA_TYPE_ID_INVALID;
}

bool DataTypeTable::nameOfPseudoBuiltInDataType(const char* name) {
    return nameOfPseudoBuiltInDataType(qlsvUtf16FromUtf8(name ? name : ""));
}

bool DataTypeTable::nameOfPseudoBuiltInDataType(const std::u16string& name) {
    for (const char16_t* pseudo : pseudoBuiltInNames)
        if (name == pseudo) return true;
    return false;
}

const char* DataTypeTable::getNameOfBuiltInDataType(int id) { return FXP::getBuiltInName(id); }

int DataTypeTable::getBuiltInDataTypeSize(int id) { return fixedType(id).size; }

const fxpDataTypeProp& DataTypeTable::getBuiltinDataTypeProperties(int id) { return FXP::getBuiltInProps(id); }

int DataTypeTable::getNumBuiltInDataTypes() { return numBuiltInTypes; }

bool DataTypeTable::isPredefinedDataType(int id) { return id >= 9 && id <= 13; }

bool DataTypeTable::isAValidDataType(const char* name) { return name && qlIsValidANSICIdentifier(name, true); }

bool DataTypeTable::IsStringDataType(int id) const {
    return isDataTypeIdValid(id) && getDataTypeAliasedThruTo(id)->getIsType(dtqString);
}

bool DataTypeTable::isEnumType(int id) const {
    return id != DATA_TYPE_ID_INVALID && id != DATA_TYPE_ID_AUTO && getDataTypeAliasedThruTo(id)->getIsType(dtqEnum);
}

bool DataTypeTable::isNumeric(int id, int highestBuiltIn) const {
    if (id != DATA_TYPE_ID_INVALID) {
        id = recordAt(id)->getIdAliasedThruTo();
        if (id >= DATA_TYPE_ID_AUTO && id <= DATA_TYPE_ID_BOOLEAN) return id <= highestBuiltIn;
    }
    return getDataTypeAliasedThruTo(id)->getIsType(dtqFixpt);
}

bool DataTypeTable::IsDataTypeNumericNonBoolean(int id) const { return isNumeric(id, DATA_TYPE_ID_UINT32); }

bool DataTypeTable::IsDataTypeNumericOrBoolean(int id) const { return isNumeric(id, DATA_TYPE_ID_BOOLEAN); }

bool DataTypeTable::IsFixptDTNotScaledDouble(int id) const {
    const DataType* record = getDataTypeAliasedThruTo(id);
    return record->getIsType(dtqFixpt) && std::strncmp(record->getName(), "flt", 3) != 0;
}

bool DataTypeTable::Is64BitType(int id) const {
    const auto* prop = static_cast<const fxpDataTypeProp*>(getDataTypeAliasedThruTo(id)->getProperties());
    return prop && prop->DataTypeMode == FXP_DT_FIXPT && prop->FixedExponent == 0 &&
           prop->SlopeAdjustmentFactor == 1.0 && prop->Bias == 0.0 && prop->WordLength == 64;
}

bool DataTypeTable::IsImplementedAsDynamicMatrixDataType(int id) const {
    if (!isDataTypeIdValid(id)) return false;
    const int storageId = recordAt(id)->getStorageId();
    return isDataTypeIdValid(storageId) && recordAt(storageId)->isDynamicMatrix();
}

int DataTypeTable::getDataTypeLoggingId(int id) const {
    if (id <= DATA_TYPE_ID_BOOLEAN) return id;
    const DataType* record = getDataTypeAliasedThruTo(id);
    return record->getIsType(dtqEnum) ? record->getStorageId() : static_cast<int>(DATA_TYPE_ID_DOUBLE);
}

// --- Registration ----------------------------------------------------------------------------------------------------

void DataTypeTable::validateDataTypeName(const char* name) {
    if (!isAValidDataType(name)) failure::raise(general, "InvalidDataType", name ? name : "");
}

void DataTypeTable::throwDataTypeNameIntrinsicFixptError(const char* name) {
    failure::raise(general, "DataType_WithIntrinsicFixptName", name);
}

bool DataTypeTable::isInstrinsicFixptName(const char* name, int* wordLength) {
    const bool isFixpt = name && FXP::isQLTypeNameNumericNotBuiltInClassic9(name);
    if (isFixpt && wordLength) *wordLength = FXP::getWordLengthFromTypeName(name);
    return isFixpt;
}

void DataTypeTable::verifyDataTypeSourcesMatch(DataTypeSource source, int id) const {
    if (source == dtSourceOpaque) return;
    const DataType* record = recordAt(id);
    const DataTypeSource known = record->getDataTypeSource();
    if (known != dtSourceAnonymous && known != source)
        failure::raise(general, "DataType_SameNameAsExistingType", record->getName());
}

bool DataTypeTable::isRegisteredAlready(const char* name, DataTypeSource source, int& existing) const {
    existing = getDataTypeId(name);
    if (!isDataTypeIdValid(existing) || !shortCircuitRegistration(source)) return false;
    verifyDataTypeSourcesMatch(source, existing);
    return true;
}

int DataTypeTable::registerDataType(const char* name, DataTypeSource source, const char* blockName) {
    validateDataTypeName(name);
    int existing;
    if (isRegisteredAlready(name, source, existing)) return existing;

    const int id = nextId(); // the place decides what kind of record it is, never the name
    std::unique_ptr<DataType> record;
    if (id == DATA_TYPE_ID_AUTO) {
        record = std::make_unique<AutoDataType>();
        registerBuiltInDataType(record.get(), id);
    } else if (id < numBuiltInTypes) {
        record = std::make_unique<BuiltInDataType>(id, name, source);
        registerBuiltInDataType(record.get(), id);
    } else if (isPredefinedDataType(id)) {
        record = std::make_unique<BuiltInDataType>(id, name, source);
        registerInternalExtraDataType(record.get(), id);
    } else {
        record = std::make_unique<DataType>(id, name, source);
        int wordLength = 0;
        if (isInstrinsicFixptName(name, &wordLength)) {
            if (source != dtSourceFixpt) throwDataTypeNameIntrinsicFixptError(name);
            record->setType(dtqFixpt);
            record->setIsAliasToLocked(true);
            initializeFixptDataTypeAtomicity(record.get(), wordLength);
        }
    }
    if (source == dtSourceEnum) record->setType(dtqEnum);
    return enter(std::move(record), existing, blockName);
}

int DataTypeTable::enter(std::unique_ptr<DataType> record, int existing, const char* blockName,
                         const std::function<void()>& complete) {
    DataType* const entered = record.get();
    addDataType(entered);
    record.release();
    try {
        if (complete) complete();
        checkWithClient(entered, blockName);
        if (existing != DATA_TYPE_ID_INVALID) replaceDataType(recordAt(existing), entered);
    } catch (...) {
        if (existing == DATA_TYPE_ID_INVALID) dataTypeIdsByName_->erase(entered->getName());
        delete dataTypes_.back();
        dataTypes_.pop_back();
        noteStructureEdit();
        throw;
    }
    return entered->getId();
}

void DataTypeTable::checkWithClient(DataType* record, const char* blockName) {
    if (!clientDataTypeCheckCallback_) return;
    try {
        clientDataTypeCheckCallback_->check(record, blockName);
    } catch (const foundation::core::except::IException&) {
        // kept: on the way to a replacement this is the name of the old record too
        dataTypeIdsByName_->erase(record->getName());
        throw;
    }
}

void DataTypeTable::addDataType(DataType* record) {
    dataTypes_.push_back(record);
    try {
        dataTypeIdsByName_->insert(record->getName(), record->getId());
    } catch (...) {
        dataTypes_.pop_back();
        throw;
    }
}

void DataTypeTable::removeDataType(DataType* record) {
    dataTypeIdsByName_->erase(record->getName());
    delete dataTypes_.back();
    dataTypes_.pop_back();
    noteStructureEdit(); // the next type under this id may be of another kind
}

qlsvDiagnosticImpl* DataTypeTable::RegisterDataType(DataTypeTable* table, const char* blockName, const char* name,
                                                    DataTypeSource source, int* id) {
    qlsvDiagnosticImpl* diagnostic =
        failure::diagnosticFrom([&] { *id = table->registerDataType(name, source, blockName); });
    if (utStrlen(blockName) == 0) return diagnostic;
    return failure::extended(diagnostic, [&] {
        return failure::diagnosticToRaise(QuillaneTypes::general::DataTypeErrorFromBlock(blockName));
    });
}

void DataTypeTable::initializeFixptDataTypeAtomicity(DataType* record, int wordLength) const {
    if (!record->getIsType(dtqFixpt)) return;
    const auto isAtomicLike = [this](int id) { return recordAt(id)->isAtomic(); };
    bool isAtomic = false;
    if (FXP::doesQLTypeNameMatchIntegerOrFixptPattern(record->getName())) {
        switch (wordLength) {
        case 8:
            isAtomic = isAtomicLike(DATA_TYPE_ID_INT8);
            break;
        case 16:
            isAtomic = isAtomicLike(DATA_TYPE_ID_INT16);
            break;
        case 32:
            isAtomic = isAtomicLike(DATA_TYPE_ID_INT32);
            break;
        default:
            isAtomic = std::find(fixptAtomicWordLengths_.begin(), fixptAtomicWordLengths_.end(), wordLength) !=
                       fixptAtomicWordLengths_.end();
        }
    }
    record->setIsAtomic(isAtomic);
}

int DataTypeTable::getFixptDataTypeAtomicityBits(const char* name) { return FXP::getWordLengthFromTypeName(name); }

const char* DataTypeTable::generateAnonymousTypeName() const {
    std::snprintf(anonymousTypeName_, sizeof anonymousTypeName_, "rtt_%d", anonymousTypeCount_);
    ++anonymousTypeCount_;
    return anonymousTypeName_;
}

} // namespace QLTypeSys
