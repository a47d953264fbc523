// The record of one data type: identity, size, ground, properties, and the functions that handle its values.
//
// Records are made by a table (DataTypeTable.h), which owns them; a plain record describes a type that a client defines
// wholly by its setters. Properties are write-once: setting one again to the same value is allowed where it can be
// compared, another value raises. Any setter call defines the type, and a defined type can no longer become an alias.
//
//   DataType* t = table.getDataTypeAt(id + 1);
//   t->setSize(16);
//   t->setConstructFcn(construct);
//
// Records of the fixed types: BuiltInDataType.h. Aliases: AliasDataType.h. Structures: ../structures/StructDataType.h.
#pragma once

#include <iosfwd>
#include <string>
#include <vector>

#include "qlplatform/Export.h"
#include "qltypes/types/FunctionTypes.h"
#include "qltypes/types/LazyText.h"
#include "qltypes/types/TypeIds.h"

struct txArray_tag;

namespace CG {
class Type;
}

namespace QLTypeSys {

/// The record of one data type. Virtual operations stand in slot order, fields in their order: both are the binary
/// interface. A pointer to a record is good until the record is replaced, becomes an alias, or its table is reset.
class QL_EXPORT DataType {
  public:
    /// A record without size, ground or properties. Id and name are taken as storage id and short name too.
    DataType(int id, const std::string& name, DataTypeSource source);
    DataType(const DataType&) = delete;
    DataType& operator=(const DataType&) = delete;

    virtual ~DataType();
    /// The identifier, valid in the table that owns the record.
    virtual int getId() const;
    /// The registered name.
    virtual const char* getName() const;
    /// The name for display.
    virtual const char* getShortName() const;
    /// A marker that clients set; nothing here reads it.
    virtual void setIsValidFixptType(bool isValid);
    virtual bool getIsValidFixptType() const;
    /// Who registered the type.
    virtual DataTypeSource getDataTypeSource() const;
    /// Sets the bytes of one value and makes a zero-filled ground. Only boolean may change its size.
    /// Raises `CannotModifyDataTypeSize`, `InvalidDataTypeSize`, and out of memory.
    virtual void setSize(int size);
    /// Locks the record against becoming an alias (or unlocks it).
    virtual void setAliasedToLocked(bool locked);
    virtual bool getAliasedToLocked() const;

    // Functions and their names. A getter answers null, or the empty name, where nothing is set. Signatures:
    // FunctionTypes.h.
    virtual ConvertBetweenFcn getConvertBetweenFcn() const;
    virtual ConstructFcn getConstructFcn() const;
    virtual const std::string& getConstructFcnName() const;
    virtual DestructFcn getDestructFcn() const;
    virtual const std::string& getDestructFcnName() const;
    virtual DeepCopyFcn getDeepCopyFcn() const;
    virtual const std::string& getDeepCopyFcnName() const;
    virtual SerializeFcn getSerializeFcn() const;
    virtual const std::string& getSerializeFcnName() const;
    virtual DeserializeFcn getDeserializeFcn() const;
    virtual const std::string& getDeserializeFcnName() const;
    virtual SerializeSizeFcn getSerializeSizeFcn() const;
    virtual const std::string& getSerializeSizeFcnName() const;
    virtual SizeOfFcn getSizeOfFcn() const;
    virtual const std::string& getSizeOfFcnName() const;
    virtual ContainedDataFcn getContainedDataFcn() const;
    virtual const std::string& getContainedDataFcnName() const;
    /// Id of the data held inside a value, or -10.
    virtual int getContainedDataType() const;
    /// Number of dimensions of the data held inside a value.
    virtual unsigned long getContainedDataNumDims() const;
    virtual ContainedDataDimsFcn getContainedDataDimsFcn() const;
    virtual const std::string& getContainedDataDimsFcnName() const;
    virtual UpdateContainedDataDimsFcn getUpdateContainedDataDimsFcn() const;
    virtual const std::string& getUpdateContainedDataDimsFcnName() const;
    virtual UpdateContainedDataDimFcn getUpdateContainedDataDimFcn() const;
    virtual const std::string& getUpdateContainedDataDimFcnName() const;
    virtual CoderPropertiesFcn getCoderPropertiesFcn() const;
    virtual const std::string& getCoderPropertiesFcnName() const;
    virtual DataConstructFcn getDataConstructFcn() const;
    virtual const std::string& getDataConstructFcnName() const;
    virtual IsPositiveFcn getIsPositiveFcn() const;
    virtual IsNegativeFcn getIsNegativeFcn() const;
    virtual GreaterThanFcn getGreaterThanFcn() const;
    virtual GreaterEqualFcn getGreaterEqualFcn() const;

    // Setters. Each locks the record against becoming an alias and, on an alias, raises `CannotSetPropertyOfAliasType`.
    // The comparison functions and ConvertBetween are write-once: another function raises `InconsistentDataTypeFcn`.
    virtual void setConvertBetweenFcn(ConvertBetweenFcn f);
    virtual void setConstructFcn(ConstructFcn f);
    virtual void setConstructFcnName(const std::string& name);
    virtual void setDestructFcn(DestructFcn f);
    virtual void setDestructFcnName(const std::string& name);
    virtual void setDeepCopyFcn(DeepCopyFcn f);
    virtual void setDeepCopyFcnName(const std::string& name);
    virtual void setSerializeFcn(SerializeFcn f);
    virtual void setSerializeFcnName(const std::string& name);
    virtual void setDeserializeFcn(DeserializeFcn f);
    virtual void setDeserializeFcnName(const std::string& name);
    virtual void setSerializeSizeFcn(SerializeSizeFcn f);
    virtual void setSerializeSizeFcnName(const std::string& name);
    virtual void setSizeOfFcn(SizeOfFcn f);
    virtual void setSizeOfFcnName(const std::string& name);
    virtual void setContainedDataFcn(ContainedDataFcn f);
    virtual void setContainedDataFcnName(const std::string& name);
    virtual void setContainedDataType(int id);
    virtual void setContainedDataNumDims(unsigned long numDims);
    virtual void setContainedDataDimsFcn(ContainedDataDimsFcn f);
    virtual void setContainedDataDimsFcnName(const std::string& name);
    virtual void setUpdateContainedDataDimsFcn(UpdateContainedDataDimsFcn f);
    virtual void setUpdateContainedDataDimsFcnName(const std::string& name);
    virtual void setUpdateContainedDataDimFcn(UpdateContainedDataDimFcn f);
    virtual void setUpdateContainedDataDimFcnName(const std::string& name);
    virtual void setCoderPropertiesFcn(CoderPropertiesFcn f);
    virtual void setCoderPropertiesFcnName(const std::string& name);
    virtual void setDataConstructFcn(DataConstructFcn f);
    virtual void setDataConstructFcnName(const std::string& name);
    virtual void setGreaterThanFcn(GreaterThanFcn f);
    virtual void setGreaterEqualFcn(GreaterEqualFcn f);
    virtual void setIsNegativeFcn(IsNegativeFcn f);
    virtual void setIsPositiveFcn(IsPositiveFcn f);

    // Further properties.
    /// Whether values are pointers.
    virtual void setIsPointerType(bool isPointer);
    virtual bool getIsPointerType() const;
    /// The id that this alias names in its definition; -10 for a record that is no alias.
    virtual int getIdAliasedTo() const;
    /// The id at the end of the alias chain; the own id for a record that is no alias.
    virtual int getIdAliasedThruTo() const;
    /// Converts values from the layout of the host to that of the target; null while not set.
    virtual HostToTargetFcn getHostToTargetFcn() const;
    /// Converts values from the layout of the target to that of the host; null while not set.
    virtual TargetToHostFcn getTargetToHostFcn() const;
    /// Bytes of one value on the target.
    virtual int getTargetSize() const;
    /// Write-once: another function raises `InConsistentTargetToHostFcn`. Does not lock the record.
    virtual void setHostToTargetFcn(HostToTargetFcn f);
    /// Write-once: another function raises `InConsistentTargetToHostFcn`. Does not lock the record.
    virtual void setTargetToHostFcn(TargetToHostFcn f);
    virtual void setTargetSize(int size);
    /// The type whose layout values of this type have.
    virtual int getStorageId() const;
    virtual void setStorageId(int id);
    /// A word for tests; it says nothing about aliasing.
    virtual int getIdAliasedToForTesting() const;
    virtual void setIdAliasedToForTesting(int id);
    /// The value that zero means for this type: twice `size` bytes, or null before a size is set. Owned by the record.
    virtual const void* getGround() const;
    /// Copies `size` bytes as the ground, once. Raises `CannotSetGroundRepBeforeSettingSize` and
    /// `CannotModifyDataTypeGroundRepresentation`.
    virtual void setGround(const void* ground);
    /// True while the ground is the zero-filled one.
    virtual bool getDefaultGround() const;
    virtual void setDefaultGround(bool isDefault);
    /// True when the ground holds a constructed value, which the destructor destroys.
    virtual bool getConstructedGround() const;
    virtual void setConstructedGround(bool isConstructed);
    /// The property block, or null. Owned by the record.
    virtual const void* getProperties() const;
    /// Copies the property block, once. Raises `CannotSetPropertiesBeforeSettingSize`,
    /// `CannotModifyDataTypeProperties`, and out of memory.
    virtual void setProperties(const void* properties);
    /// Bytes of the property block; 0 for none.
    virtual int getPropertiesSize() const;
    /// Sets the bytes of the property block, once. Raises `CannotModifyDataTypePropertiesSize` and
    /// `InvalidDataTypePropertiesSize`.
    virtual void setPropertiesSize(int size);

    // Classifiers. Classic9 in a name means the nine built-in types, Classic6 their integers, Classic3 those of one
    // sign.
    virtual bool hasFxpDataTypeProp() const;
    virtual bool isBool() const;
    virtual bool isNumericOrBool() const;
    virtual bool isNumericNotBool() const;
    virtual bool isNumericNotBuiltInClassic9() const;
    /// As isNumericNotBuiltInClassic9, but of the record itself, also on an alias.
    virtual bool isRawNumericNotBuiltInClassic9() const;
    virtual bool isEnum() const;
    /// The property block as a number record; meaningful where hasFxpDataTypeProp().
    virtual const fxpDataTypeProp* getFxpDataTypeProp() const;
    virtual bool isHalf() const;
    virtual bool isImage() const;
    virtual bool isDynamicMatrix() const;
    virtual bool isBuiltInClassic9() const;
    virtual bool isBuiltInIntClassic6() const;
    virtual bool isBuiltInIntUnsignedClassic3() const;
    virtual bool isBuiltInIntSignedClassic3() const;
    virtual bool isNumericOrBoolAndContainerCouldStoreNegatives() const;
    virtual bool isFloatDataType() const;
    virtual bool isIntDataType() const;
    virtual bool isUnsignedIntDataType() const;
    virtual bool isSignedIntDataType() const;
    virtual bool isSignedFixptDT() const;
    virtual bool canContainNegativeNumbers() const;

    // Data of clients.
    /// The code generator's type, or null; not owned.
    virtual CG::Type* getCGType() const;
    virtual void setCGType(CG::Type* type);
    /// The four words of the checksum of the type.
    virtual const unsigned int* getChecksumElements() const;
    /// Copies four words.
    virtual void setChecksumElements(const unsigned int* words);
    /// The host object that describes the type, or null; the record holds a reference to it.
    virtual txArray_tag* getInterface() const;
    /// Gives up the array held now and keeps a reference to the new one; null is allowed.
    virtual void setInterface(txArray_tag* array);

    // Kind, printing, flags.
    /// Whether the record itself is of that kind; an alias answers for itself.
    virtual bool getIsType(DataTypeQualifier qualifier) const;
    /// The kind of the record itself.
    virtual DataTypeQualifier getType() const;
    /// Changes the kind of the record itself.
    virtual void setType(DataTypeQualifier qualifier);
    /// Writes name, id, size, storage id and qualifier, a line each, then a blank line.
    virtual void print(std::ostream& os) const;
    /// True when a value is read and written in one step.
    virtual bool isAtomic() const;
    virtual void setIsAtomic(bool isAtomic);
    /// True when the bytes of the ground are not all zero.
    virtual bool groundHasNonZeroStoredValue() const;
    virtual void setGroundHasNonZeroStoredValue(bool hasNonZero);
    /// Ids of the types that this one is made of.
    virtual std::vector<int> dependsOn() const;

    // One value. Raise `DataTypeFcnUnknownError` when the function of the type reports a failure. Source before
    // destination.
    virtual void deepCopyScalarElement(const void* src, void* dst) const;
    virtual void serializeScalarElement(const void* src, void* dst, unsigned long a, unsigned long b) const;
    virtual void deserializeScalarElement(const void* src, void* dst, unsigned long a, unsigned long b) const;
    /// Bytes that serializeScalarElement writes.
    virtual unsigned long serializeSizeScalarElement(const void* src) const;
    /// Builds a value; memory of a type without a construct function is left as it is.
    virtual void constructScalarElement(void* p) const;
    virtual void destroyScalarElement(void* p) const;

    // Upkeep by the table.
    /// A mark for walks over the types.
    virtual bool getVisitFlag() const;
    virtual void setVisitFlag(bool visited) const;
    /// Whether the record may no longer become an alias.
    virtual bool getIsAliasToLocked() const;
    virtual void setIsAliasToLocked(bool locked);
    /// Tells an alias that the record which its definition names has become `type`; nothing happens here.
    virtual void updateAliasedToType(DataType* type);
    /// Tells an alias that the record at the end of its chain has become `type`; nothing happens here.
    virtual void updateAliasedThruToType(DataType* type);

    // Not virtual: the record's own fields, also on an alias.

    /// Bytes of one value; -1 while not set. An alias answers what its target had when the alias was made.
    int getSize() const { return size_; }
    bool getNeedRegisterIdentifier() const { return needRegisterIdentifier_; }
    bool getPlainCopy() const { return plainCopy_; }
    bool getPlainConstruct() const { return plainConstruct_; }
    bool getPlainDestroy() const { return plainDestroy_; }
    void setCanContainNegativeNumbers(bool canContain) { canContainNegativeNumbers_ = canContain; }
    void setShortName(const std::string& name) { shortName_ = name; }

    // Calls of a function property. Unchecked: the function must be set.

    unsigned long sizeOf() const { return getSizeOfFcn()(); }
    void* containedData(void* value) const { return getContainedDataFcn()(value); }
    /// Id of the data held inside a value, or -10.
    int containedDataType() const { return containedDataType_; }
    /// Number of dimensions of the data held inside a value.
    unsigned long containedDataNumDims() const { return containedDataNumDims_; }
    void containedDataDims(const void* value, unsigned long* dims) const { getContainedDataDimsFcn()(value, dims); }
    /// Builds `dst` from initial data. Raises `DataTypeFcnUnknownError` when the function reports a failure.
    void dataConstruct(unsigned long numDims, const unsigned long* dims, unsigned long elementSize, const void* data,
                       void* dst) const;

    /// The name; of a structure, without the prefix that a data type override puts in front.
    std::string getNameStripDTOPrefix() const;

    /// Whether a built-in type with this id holds negative numbers; false for every other id.
    static bool isRawDTypeIdBuiltInClassic9AndContainerCouldStoreNegatives(int id);
    /// The same, and for other ids by the name's number type. May raise what reading the name raises.
    static bool isRawDTypeIdNumericAndContainerCouldStoreNegatives(const char* name, int id);

    /// Whether converting `count` values (pairs when `isComplex`) of built-in type `srcId` to `dstId` would leave the
    /// range of `dstId`. NaN never does. False for identifiers other than 0 to 7 and for a count of 0 or less.
    static bool CheckForOverflowDuringDataTypeConversion(const void* data, int count, int srcId, bool isComplex,
                                                         int dstId, fxpModeRounding_tag rounding);

  protected:
    friend class DataTypeTable; // registration and replacement write fields that no setter may change

    int id_;
    std::string name_;
    LazyText shortName_; // not set: the same as the name
    DataTypeSource source_;
    int size_ = -1;
    bool isAtomic_ = false;
    bool groundHasNonZeroStoredValue_ = true;
    bool needRegisterIdentifier_ = true;
    bool isValidFixptType_ = false;
    bool canContainNegativeNumbers_ = true;
    bool plainCopy_ = true;      // a scalar is copied with memcpy
    bool plainConstruct_ = true; // a scalar needs no construction
    bool plainDestroy_ = true;   // a scalar needs no destruction
    int storageId_;
    int idAliasedTo_ = DATA_TYPE_ID_INVALID; // for tests only; the live answer is getIdAliasedTo()
    unsigned char* ground_ = nullptr;        // owned, from utCalloc
    bool defaultGround_ = false;
    bool constructedGround_ = false;
    unsigned char* properties_ = nullptr; // owned, from utMalloc or utCalloc
    int propertiesSize_ = 0;
    CG::Type* cgType_ = nullptr;       // not owned
    txArray_tag* interface_ = nullptr; // one reference held
    ConvertBetweenFcn convertBetweenFcn_ = nullptr;
    ConstructFcn constructFcn_ = nullptr;
    LazyText constructFcnName_;
    DestructFcn destructFcn_ = nullptr;
    LazyText destructFcnName_;
    DeepCopyFcn deepCopyFcn_ = nullptr;
    LazyText deepCopyFcnName_;
    SerializeFcn serializeFcn_ = nullptr;
    LazyText serializeFcnName_;
    DeserializeFcn deserializeFcn_ = nullptr;
    LazyText deserializeFcnName_;
    SerializeSizeFcn serializeSizeFcn_ = nullptr;
    LazyText serializeSizeFcnName_;
    SizeOfFcn sizeOfFcn_ = nullptr;
    LazyText sizeOfFcnName_;
    ContainedDataFcn containedDataFcn_ = nullptr;
    LazyText containedDataFcnName_;
    int containedDataType_ = DATA_TYPE_ID_INVALID;
    unsigned long containedDataNumDims_ = 0;
    ContainedDataDimsFcn containedDataDimsFcn_ = nullptr;
    LazyText containedDataDimsFcnName_;
    UpdateContainedDataDimsFcn updateContainedDataDimsFcn_ = nullptr;
    LazyText updateContainedDataDimsFcnName_;
    UpdateContainedDataDimFcn updateContainedDataDimFcn_ = nullptr;
    LazyText updateContainedDataDimFcnName_;
    CoderPropertiesFcn coderPropertiesFcn_ = nullptr;
    LazyText coderPropertiesFcnName_;
    DataConstructFcn dataConstructFcn_ = nullptr;
    LazyText dataConstructFcnName_;
    IsPositiveFcn isPositiveFcn_ = nullptr;
    IsNegativeFcn isNegativeFcn_ = nullptr;
    GreaterThanFcn greaterThanFcn_ = nullptr;
    GreaterEqualFcn greaterEqualFcn_ = nullptr;
    unsigned int checksumElements_[4] = {0, 0, 0, 0};
    mutable bool visitFlag_ = false; // scratch mark of getDataTypeIdCommonAncestor
    DataTypeQualifier qualifier_ = dtqUnspecified;
    bool aliasedToLocked_ = false; // the record is defined and can no longer become an alias
    bool isPointerType_ = false;
    TargetToHostFcn targetToHostFcn_ = nullptr;
    HostToTargetFcn hostToTargetFcn_ = nullptr;
    int targetSize_ = 0;

  private:
    void refuseOnAlias(const char* property) const;
    template <class F, class Value> void define(const char* property, F& field, const Value& value);
    template <class F> void defineCustom(const char* property, F& field, F value, bool& plainFlag);
    template <class F> void defineOnce(const char* property, F& field, F value);
    template <class F> void defineOnceForTarget(F& field, F value);
    void deepCopyThroughGetter(const void* src, void* dst) const;
    void destroyThroughGetter(void* p) const;
    void constructThroughGetter(void* p) const;
    [[noreturn]] void reportFailedFcn(const char* operation) const;
};

/// Prints through the record's virtual print().
QL_EXPORT std::ostream& operator<<(std::ostream& os, const DataType& type);

} // namespace QLTypeSys
