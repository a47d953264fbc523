// The registry of the data types of one model.
//
// A new table holds fifteen fixed types: auto (-1), nine built-in (0 to 8) and five predefined ones (9 to 13). Types of
// clients follow from 14. An engine derives its own table and overrides the hooks it needs.
//
//   QLTypeSys::DataTypeTable table;
//   const int id = table.registerDataType("Speed", dtSourceFixpt, nullptr);
//   table.getDataTypeId("Speed") == id;
//
// Flat functions over a table pointer, which return diagnostics instead of throwing: DataTypeTableUtils.h and
// ../structures/StructDataTypeUtils.h. One thread at a time uses a table: even reads fill caches.
#pragma once

#include <functional>
#include <iosfwd>
#include <map>
#include <memory>
#include <string>
#include <unordered_map>
#include <vector>

#include <boost/shared_ptr.hpp>

#include "qlplatform/Export.h"
#include "qlplatform/arrays/HostArray.h"
#include "qltypes/types/DataType.h"
#include "qltypes/types/TypeIds.h"

class QLRootBD;
class qlsvDiagnosticImpl;
enum SSImageColorFormat : int;
enum SSImageDataLayout : int;

namespace QLDateTime {
class DateTimeType;
}

namespace QLTypeSys {

class NameIndex;
struct FixedType;
class OverriddenObject;
class OverrideUtils;

/// A client's say in registration.
class QL_EXPORT ClientDataTypeCheckCallback {
  public:
    virtual ~ClientDataTypeCheckCallback();
    /// Called after each registration with the new record and the caller's block name, which may be null. Throwing an
    /// IException vetoes the registration.
    virtual void check(DataType* type, const char* blockName) = 0;
    /// Called when the table comes back to its fixed types.
    virtual void reset() = 0;
};

/// A client's function that registers the custom type of that name and returns its id.
using CustomDataTypeCallback = int (*)(class DataTypeTable*, const char*);

/// The registry. Virtual operations stand in slot order.
class QL_EXPORT DataTypeTable {
  public:
    DataTypeTable();
    DataTypeTable(const DataTypeTable&) = delete;
    DataTypeTable& operator=(const DataTypeTable&) = delete;

    // --- Virtual operations ------------------------------------------------------------------------------------------

    virtual ~DataTypeTable();
    /// Makes a table for a model; null here.
    virtual DataTypeTable* CreateDTTable(QLRootBD* model) const;
    /// Removes all types of clients. Header files of custom types stay, and so do grounds and short names of the fixed
    /// types.
    virtual void resetToBuiltin();

    /// Registers a plain type, or answers the id of the name after a check of who registered it. `blockName` names the
    /// caller for reports and may be null. Raises `InvalidDataType`, `DataType_SameNameAsExistingType`,
    /// `DataType_WithIntrinsicFixptName`, and what the client's check throws.
    virtual int registerDataType(const char* name, DataTypeSource source, const char* blockName);
    /// Registers a second name for the type `aliasedTo`. Raises as registerDataType, and
    /// `UndefinedDataTypeToBeAliasedTo` and `DataTypeAliasLoop`.
    virtual int registerAliasDataType(const char* name, DataTypeSource source, int aliasedTo, const char* blockName);
    /// Registers an empty structure. Raises as registerDataType.
    virtual int registerStructDataType(const char* name, DataTypeSource source, const char* blockName);
    /// Registers a string type of at most `maxLength` UTF-16 units; 0 is dynamic. A null name is made from the length,
    /// and "character" of length 1 is registered before it, which stays when the other one fails. Raises as
    /// registerDataType, and out of memory.
    virtual int registerStringDataType(unsigned long maxLength, const char* name);
    /// Registers a date-time type under the name that the type gives itself; `name` is only passed to the client's
    /// check. Its size is the word length of the storage in bits. Raises as registerDataType, also for a type whose own
    /// name is no identifier, and `InvalidDataTypeSize` for a word length of 0 or less.
    virtual int registerDateTimeDataType(const QLDateTime::DateTimeType& type, const char* name);
    /// Copies a type of another table into this one. Raises as registerDataType.
    virtual int registerOpaqueDataType(const DataType* source, const char* blockName);
    /// Registers a matrix of `elementId` with `numDims` dimensions that change at run time; a matrix of matrices is the
    /// matrix itself. Raises as registerDataType, and `InvalidDataTypeId`.
    virtual int registerDynamicMatrixDataType(int elementId, unsigned long numDims);
    /// Registers an image type, and the type that stores it: a dynamic matrix, or "cv_Mat" when the hook
    /// "ImageTypeImplementation" is 1. The type that stores it stays when the image fails. Raises as registerDataType,
    /// `InvalidImageTypeNumChannels` and `InvalidImageTypeNumChannels2`, out of memory, and `InvalidDataTypeId` when
    /// there is no type to store it.
    virtual int registerImageDataType(unsigned long numChannels, SSImageColorFormat colorFormat,
                                      SSImageDataLayout dataLayout, BuiltInDTypeId baseType);
    /// Buses are a subclass's business: -1 here.
    virtual int registerBusDataType(const char* name, DataTypeSource source, const char* blockName);
    /// Whether registering an existing name answers its id (true here) instead of replacing its record.
    virtual bool shortCircuitRegistration(DataTypeSource source) const;

    // Settings: what the numbers mean is the subclass's business; here they are constants.
    virtual int getParameterUnderflowDiagnostic() const;
    virtual int getParameterOverflowDiagnostic() const;
    virtual int getParameterPrecisionLossDiagnostic() const;
    virtual int getFixptConstUnderflowDiagnostic() const;
    virtual int getFixptConstOverflowDiagnostic() const;
    virtual int getFixptConstPrecisionLossDiagnostic() const;
    virtual int getDataOverflowDiagnostic() const;
    virtual int getDataSaturationDiagnostic() const;
    virtual bool getUseIntDivNetSlopeOpt() const;

    /// Prints the number of types and every record.
    virtual void print(std::ostream& os) const;
    /// The property block at the end of the alias chain; `caller` is not used. Raises `InvalidDataTypeId`.
    virtual const void* getDataTypeProperties(const char* caller, int id) const;

    // Hooks for what only a subclass knows: enumeration objects, the override machinery, code generation. Here they
    // answer null or false and store nothing.
    virtual txArrayPtr getOrdinalValuesFromEnumObject(const txArray_tag* object) const;
    virtual bool isOverriddenObjectName(const std::string& name) const;
    virtual const char* getEnumTypeStringFromValue(int id, int value) const;
    virtual const char* getEnumTypeStringFromIndex(int id, int index) const;
    virtual void setSkipForCodeGen(int id);
    virtual bool getSkipForCodeGen(int id) const;
    virtual bool getResolvingDataTypeForOverrideUtils() const;
    virtual boost::shared_ptr<OverrideUtils> getObjectOverrideUtils(const std::string& name) const;
    virtual void addObjectOverrideUtils(const std::string& name, boost::shared_ptr<OverrideUtils> utils);
    virtual void addOverriddenObject(const std::string& name, const boost::shared_ptr<OverriddenObject>& object);

    /// Fills the record of a built-in type (or auto) from its row. Raises out of memory.
    virtual void registerBuiltInDataType(DataType* record, int id);
    /// Fills the record of a predefined type from its row. Raises out of memory.
    virtual void registerInternalExtraDataType(DataType* record, int id);

    // --- Lookups -----------------------------------------------------------------------------------------------------

    /// The id of a name; -10 when it is unknown or null.
    int getDataTypeId(const char* name) const;
    /// The record at a position, which is id + 1. Unchecked: `index` must be below getNumDataTypes().
    DataType* getDataTypeAt(unsigned long index) const { return dataTypes_[index]; }
    /// Number of records, auto included.
    int getNumDataTypes() const { return static_cast<int>(dataTypes_.size()); }
    /// Whether the id has a record here: -1 up to but not including the first free id.
    bool isDataTypeIdValid(int id) const;
    /// The same, and not -1.
    bool isDataTypeIdValid_NotAuto(int id) const;
    /// True for a valid id. Raises `InvalidDataTypeId` for any other.
    bool checkDataTypeId(int id) const;
    /// -10 for -10; else what the record says. Unchecked otherwise: `id` must be valid.
    int getDataTypeIdAliasedTo(int id) const;
    /// The record that is no alias at the end of the chain. Raises `InvalidDataTypeId`.
    DataType* getDataTypeAliasedThruTo(int id) const;

    /// True for auto and double.
    static bool isContextSensitiveOrDouble(int id);
    /// The id of a built-in name, else -10; null is no name.
    static int getBuiltInDataType(const char* name);
    static int getBuiltInDataType(const std::u16string& name);
    /// Whether the name is that of a built-in type; false for null.
    static bool nameOfBuiltInDataType(const char* name);
    static bool nameOfBuiltInDataType(const std::u16string& name);
    /// True for "logical", "half", "int64" and "uint64", which are treated as built-in by name.
    static bool nameOfPseudoBuiltInDataType(const char* name);
    static bool nameOfPseudoBuiltInDataType(const std::u16string& name);
    /// The name of ids 0 to 8. Raises `InvalidBuiltinDataTypeId`.
    static const char* getNameOfBuiltInDataType(int id);
    /// Bytes of a fixed type. Unchecked: `id` must be -1 to 8.
    static int getBuiltInDataTypeSize(int id);
    /// The number record of ids 0 to 8. Raises `InvalidBuiltinDataTypeId`.
    static const fxpDataTypeProp& getBuiltinDataTypeProperties(int id);
    /// Number of built-in types, 9.
    static int getNumBuiltInDataTypes();
    /// Whether the id is 9 to 13.
    static bool isPredefinedDataType(int id);
    /// Whether the name is an identifier; false for null.
    static bool isAValidDataType(const char* name);

    /// Whether the type at the end of the alias chain is a string; false for an invalid id.
    bool IsStringDataType(int id) const;
    /// Whether the type at the end of the alias chain is an enumeration; false for -10 and -1. Raises
    /// `InvalidDataTypeId` for any other invalid id.
    bool isEnumType(int id) const;
    /// True for auto too. Raises `InvalidDataTypeId` for -10.
    bool IsDataTypeNumericNonBoolean(int id) const;
    /// True for auto too. Raises `InvalidDataTypeId` for -10.
    bool IsDataTypeNumericOrBoolean(int id) const;
    /// Whether the type at the end of the alias chain is of fixed point and not a scaled double. Raises
    /// `InvalidDataTypeId`.
    bool IsFixptDTNotScaledDouble(int id) const;
    /// Whether the type at the end of the alias chain is an integer of 64 bits. Raises `InvalidDataTypeId`.
    bool Is64BitType(int id) const;
    /// Whether values of the type are stored as a dynamic matrix; false for an invalid id.
    bool IsImplementedAsDynamicMatrixDataType(int id) const;
    /// The type under which values are logged: built-ins as they are, enumerations by storage, all else as double.
    int getDataTypeLoggingId(int id) const;
    /// Unchecked: the record at `id` must be a date-time record.
    const QLDateTime::DateTimeType& getDateTimeType(int id) const;

    // --- Registration ------------------------------------------------------------------------------------------------

    /// Appends a record and enters its name; a name that is there keeps its old entry. Takes the record over, unless it
    /// throws for lack of memory.
    void addDataType(DataType* record);
    /// Undoes the registration just made: erases the record's name and deletes the last record, whatever `record` is.
    void removeDataType(DataType* record);
    /// registerDataType for callers that take no exceptions. Null on success; `id` is untouched on failure.
    static qlsvDiagnosticImpl* RegisterDataType(DataTypeTable* table, const char* blockName, const char* name,
                                                DataTypeSource source, int* id);
    /// Raises `InvalidDataType` for a name that is no identifier.
    static void validateDataTypeName(const char* name);
    /// Raises `DataType_WithIntrinsicFixptName`.
    [[noreturn]] static void throwDataTypeNameIntrinsicFixptError(const char* name);
    /// Whether the name has fixed-point shape; then `wordLength`, unless null, receives its word length in bits.
    static bool isInstrinsicFixptName(const char* name, int* wordLength);
    /// Raises `DataType_SameNameAsExistingType` unless the sources agree, the record is anonymous or `source` opaque.
    void verifyDataTypeSourcesMatch(DataTypeSource source, int id) const;
    /// Sets whether a fixed-point record is atomic, by the record of its word length.
    void initializeFixptDataTypeAtomicity(DataType* record, int wordLength) const;
    /// The word length in bits that a fixed-point name stands for.
    static int getFixptDataTypeAtomicityBits(const char* name);
    /// "rtt_0", "rtt_1" ...; good until the next call.
    const char* generateAnonymousTypeName() const;

    // --- Aliases, replacement, custom types --------------------------------------------------------------------------

    /// Puts `replacement`, which is the last record, in the place of `old`, which is deleted. Without memory for that
    /// nothing is changed.
    void replaceDataType(DataType* old, DataType* replacement);
    /// Turns a plain record that is not defined yet into an alias under its identifier. Raises
    /// `UndefinedDataTypeToBeAliasedTo`, `InconsistentDataTypeIdAliasedTo`, `CannotSetAliasForDefinedType` and
    /// `DataTypeAliasLoop`; the table is then unchanged.
    void setDataTypeIdAliasedTo(int id, int target);
    /// Whether the alias chain of `id` passes `target`.
    bool alreadyAliasedToDirectlyOrIndirectly(int id, int target) const;
    /// The first type that both alias chains share, or -10.
    int getDataTypeIdCommonAncestor(int a, int b) const;
    /// Sets the type whose layout values have, once. Raises `CannotSetPropertyOfAliasType`,
    /// `IllegalDataTypeToBeStorageId` and `InconsistentDataTypeStorageId`.
    void setDataTypeStorageId(int id, int storageId);
    /// The type as host-language text, such as "Bus: Engine" or "fixdt('sfix16_En7')".
    std::string getDTACompliantString(int id) const;

    /// Whether the name has a function that registers its type.
    bool hasCustomDataTypeCallback(const char* name) const;
    /// Enters a function under a name; the first one stays.
    void insertCustomDataTypeCallback(const char* name, CustomDataTypeCallback callback);
    /// Calls the function. Unchecked: the name must have one.
    int executeCustomDataTypeCallback(const char* name);
    /// The names that have such a function, in no order.
    std::vector<std::string> getAllCustomDataTypeName() const;
    /// Enters the header file of a custom type; the first one stays, also over resetToBuiltin.
    void insertCustomDataTypeHeaderFilePair(const std::string& type, const std::string& header);
    /// The header file; two double quotes for an unknown type.
    std::string getHeaderFileForCustomType(const std::string& type) const;

    // --- Values by identifier. Unchecked: `id` must be valid. Destination before source. -----------------------------

    // One index, one virtual call and the function, inline so that no more comes between.

    /// Builds a value in the memory at `p`.
    void construct(int id, void* p) const { recordAt(id)->constructScalarElement(p); }
    /// Takes the value at `p` apart; its memory stays.
    void destruct(int id, void* p) const { recordAt(id)->destroyScalarElement(p); }
    /// Copies a value; both must be constructed.
    void deepCopy(int id, void* dst, const void* src) const { recordAt(id)->deepCopyScalarElement(src, dst); }
    /// Writes the value as bytes. `a` and `b` are passed through to the function of the type.
    void serialize(int id, void* dst, const void* src, unsigned long a, unsigned long b) const {
        recordAt(id)->serializeScalarElement(src, dst, a, b);
    }
    /// Reads a value from bytes. `a` and `b` are passed through to the function of the type.
    void deserialize(int id, void* dst, const void* src, unsigned long a, unsigned long b) const {
        recordAt(id)->deserializeScalarElement(src, dst, a, b);
    }
    /// Bytes that serialize() writes.
    unsigned long serializeSize(int id, const void* p) const { return recordAt(id)->serializeSizeScalarElement(p); }
    /// Bytes of a value. Unchecked: the type must have the function.
    unsigned long sizeOf(int id) const { return recordAt(id)->sizeOf(); }
    /// The data inside the value. Unchecked: the type must have the function.
    void* containedData(int id, void* p) const { return recordAt(id)->containedData(p); }
    /// The type of the data inside a value, or -10.
    int containedDataType(int id) const { return recordAt(id)->containedDataType(); }
    /// Number of dimensions of the data inside a value.
    unsigned long containedDataNumDims(int id) const { return recordAt(id)->containedDataNumDims(); }
    /// Stores the dimensions of the data inside the value. Unchecked: the type must have the function.
    void containedDataDims(int id, const void* p, unsigned long* dims) const {
        recordAt(id)->containedDataDims(p, dims);
    }
    /// True on success, false when the function of the type failed.
    bool dataConstruct(int id, unsigned long numDims, const unsigned long* dims, unsigned long elementSize,
                       const void* data, void* dst) const;

    // The same as bool: false when an IException was thrown, which is then discarded.
    bool constructWithStatus(int id, void* p) const;
    bool destructWithStatus(int id, void* p) const;
    bool deepCopyWithStatus(int id, void* dst, const void* src) const;
    bool serializeWithStatus(int id, void* dst, const void* src, unsigned long a, unsigned long b) const;
    bool deserializeWithStatus(int id, void* dst, const void* src, unsigned long a, unsigned long b) const;
    bool convertToUsingSrcIdWithStatus(int dstId, int srcId, int count, const void* src, const void* aux,
                                       void* dst) const;
    bool isPositiveWithStatus(int id, int count, const void* data, const void* aux, void* result) const;

    // Raise `DataTypeFcnDoesNotExist` and `DataTypeFcnUnknownError`. Results are one byte an element; `aux` is handed
    // to the function of the type.

    /// Converts with the source type's function.
    void convertToUsingSrcId(int dstId, int srcId, int count, const void* src, const void* aux, void* dst) const;
    /// Converts with the destination type's function.
    void convertToUsingDstId(int dstId, int srcId, int count, const void* src, const void* aux, void* dst) const;
    /// 1 above zero, 0 for zero, -1 for all else, NaN included.
    void sign(int id, const void* src, const void* aux, signed char* result) const;
    /// Whether each value is above zero.
    void isPositive(int id, int count, const void* data, const void* aux, void* result) const {
        int resolvedId = id;
        const IsPositiveFcn f =
            functionAt(resolvedId, &DataType::isPositiveFcn_, &DataType::getIsPositiveFcn, "IsPositiveFcn");
        succeeded(f(dataTypeAccess_, nullptr, resolvedId, count, data, aux, result), "IsPositive", id);
    }
    /// The same of one value.
    void isPositive(int id, const void* data, const void* aux, signed char* result) const;
    /// Whether each value is below zero.
    void isNegative(int id, int count, const void* data, const void* aux, void* result) const {
        int resolvedId = id;
        const IsNegativeFcn f =
            functionAt(resolvedId, &DataType::isNegativeFcn_, &DataType::getIsNegativeFcn, "IsNegativeFcn");
        succeeded(f(dataTypeAccess_, nullptr, resolvedId, count, data, aux, result), "IsNegative", id);
    }
    /// Whether each left value is greater than the right one. What the type's function answers, which is not 0.
    int greaterThan(int id, int count, const void* left, const void* right, const void* aux, void* result) const {
        int resolvedId = id;
        const GreaterThanFcn f =
            functionAt(resolvedId, &DataType::greaterThanFcn_, &DataType::getGreaterThanFcn, "GreaterThanFcn");
        return succeeded(f(dataTypeAccess_, nullptr, resolvedId, count, left, right, aux, result), "GreaterThan", id);
    }
    /// Whether each left value is at least the right one. What the type's function answers, which is not 0.
    int greaterEqual(int id, int count, const void* left, const void* right, const void* aux, void* result) const {
        int resolvedId = id;
        const GreaterEqualFcn f =
            functionAt(resolvedId, &DataType::greaterEqualFcn_, &DataType::getGreaterEqualFcn, "GreaterEqualFcn");
        return succeeded(f(dataTypeAccess_, nullptr, resolvedId, count, left, right, aux, result), "GreaterEqual", id);
    }
    /// Whether any value differs from the type's ground: doubles and singles by value, all else by bytes.
    bool checkIfNonZeroArray(const void* data, int count, int id, bool isComplex) const;
    /// setSize as a diagnostic. Null on success.
    qlsvDiagnosticImpl* setDataTypeSize(int id, int size);

    // --- Structures. Unchecked: the record at `id` must be a structure. ----------------------------------------------

    bool doesBusDTHaveComplexData(int id) const;
    bool doesBusDTHaveFrameBasedElements(int id) const;
    bool doesBusDTHaveVarDims(int id) const;
    bool doesBusDTHaveAoB(int id) const;
    bool doesBusDTHaveStringData(int id) const;
    bool doesBusDTHaveConstructFcn(int id) const;
    bool doesBusDTHaveDestructFcn(int id) const;
    bool doesBusDTHaveDeepCopyFcn(int id) const;
    bool doesBusDTHaveHalfPrecisionData(int id) const;
    void doesBusDTContainArraysOfBusesOrVarDimsOrFrames(int id, bool* arraysOfBuses, bool* varDims, bool* frames) const;
    long getDataTypeRawElementIdxFromImmediateElementIdx(int id, long index) const;
    double getDataTypeFlatElementMin(int id, long index) const;
    double getDataTypeDFSElementMax(int id, long index) const;
    double getDataTypeDFSElementMin(int id, long index) const;
    double getDataTypeElementMax(int id, long index) const;
    double getDataTypeElementMin(int id, long index) const;

    // --- Data of clients ---------------------------------------------------------------------------------------------

    /// The block handed to type functions; its first word is this table.
    _qlDataTypeAccess_tag* getDataTypeAccess() const { return dataTypeAccess_; }
    /// Takes over a block from utCalloc. The one before is the caller's.
    void setDataTypeAccess(_qlDataTypeAccess_tag* access) { dataTypeAccess_ = access; }
    /// Diagnostics that a client gathers; not owned.
    qlsvDiagnosticImpl* getDtaErrorQueue() const { return dtaErrorQueue_; }
    void setDtaErrorQueue(qlsvDiagnosticImpl* queue) { dtaErrorQueue_ = queue; }

  protected:
    boost::shared_ptr<ClientDataTypeCheckCallback> clientDataTypeCheckCallback_;
    std::map<std::string, boost::shared_ptr<OverriddenObject>> overrideObjects_; // for subclasses
    std::vector<DataType*> dataTypes_;                                           // owned; position is id + 1
    std::unique_ptr<NameIndex> dataTypeIdsByName_;
    mutable int anonymousTypeCount_ = 0;
    mutable char anonymousTypeName_[36];
    _qlDataTypeAccess_tag* dataTypeAccess_ = nullptr; // owned, from utCalloc
    void* reservedPointer_ = nullptr;                 // for subclasses
    int reservedIndex_ = -1;                          // for subclasses; -1 again after resetToBuiltin
    qlsvDiagnosticImpl* dtaErrorQueue_ = nullptr;     // not owned
    void* secondReservedPointer_ = nullptr;           // for subclasses
    std::vector<int> fixptAtomicWordLengths_;         // beyond 8, 16 and 32 bits
    std::unordered_map<std::string, CustomDataTypeCallback> customDataTypeCallbacks_;
    std::unordered_map<std::string, std::string> customDataTypeHeaderFiles_;

  private:
    void initialize();
    static void fillFromRow(DataType* record, const FixedType& row);
    static void clearStructureCaches(DataType* record);
    static void noteStructureEdit();
    DataType* recordAt(int id) const { return dataTypes_[static_cast<std::size_t>(id + 1)]; }
    /// Whether `name` is registered and stands as it is; `existing` is its id in any case.
    bool isRegisteredAlready(const char* name, DataTypeSource source, int& existing) const;
    int nextId() const { return getNumDataTypes() - 1; }
    /// Last steps of every registration: add, complete what needs the record in its place, let the client check,
    /// replace `existing` unless it is -10. What is thrown on the way undoes the registration.
    int enter(std::unique_ptr<DataType> record, int existing, const char* blockName,
              const std::function<void()>& complete = {});
    void checkWithClient(DataType* record, const char* blockName);
    bool isNumeric(int id, int highestBuiltIn) const;
    void convert(int chosenId, int dstId, int srcId, int count, const void* src, const void* aux, void* dst) const;
    [[noreturn]] void raiseMissingFcn(const char* name, int id) const;
    [[noreturn]] void raiseFailedFcn(const char* operation, int id) const;
    /// The function that the record at `id` has, or the failure that says that it has none; `id` becomes the one to
    /// call it with. A record without a function of its own, such as an alias, is asked through its getters.
    template <class F> F functionAt(int& id, F DataType::*own, F (DataType::*getter)() const, const char* name) const {
        const DataType* record = recordAt(id);
        if (record->*own) [[likely]]
            return record->*own;
        const F function = (record->*getter)();
        if (!function) raiseMissingFcn(name, id);
        id = record->getIdAliasedThruTo();
        return function;
    }
    /// A function's answer, or the failure that it stands for when it is 0.
    int succeeded(int answer, const char* operation, int id) const {
        if (!answer) [[unlikely]]
            raiseFailedFcn(operation, id);
        return answer;
    }
};

/// Prints through the table's virtual print().
QL_EXPORT std::ostream& operator<<(std::ostream& os, const DataTypeTable& table);

} // namespace QLTypeSys
