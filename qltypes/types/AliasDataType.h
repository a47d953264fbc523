// The record of an alias: a second name for another type. It answers by asking the record at the end of its chain and
// refuses every write.
//
// A few operations are left to the base class on purpose and speak of the alias itself: its identity (getId, getName,
// getIsType ...), the marks that clients and the table put on it, and the getters of the two update functions.
#pragma once

#include "qltypes/types/DataType.h"

namespace QLTypeSys {

/// An alias. Both targets are owned by the table, which keeps the pointers up to date when a record is replaced.
class QL_EXPORT AliasDataType : public DataType {
  public:
    /// Size and plain flags are copied from `aliasedThruTo` now and never again.
    AliasDataType(int id, const std::string& name, DataTypeSource source, const DataType* aliasedTo,
                  const DataType* aliasedThruTo);
    /// The same with id, name and source of an existing record, which the caller deletes afterwards.
    AliasDataType(DataType* existing, const DataType* aliasedTo, const DataType* aliasedThruTo);
    ~AliasDataType() override;

    // Own answers.
    int getIdAliasedTo() const override;
    int getIdAliasedThruTo() const override;
    std::vector<int> dependsOn() const override;
    /// True: what is an alias already does not become one.
    bool getIsAliasToLocked() const override;
    /// The record that the definition names has become `type`.
    void updateAliasedToType(DataType* type) override;
    /// The record at the end of the chain has become `type`.
    void updateAliasedThruToType(DataType* type) override;

    // Forwarded to the record at the end of the chain.
    ConvertBetweenFcn getConvertBetweenFcn() const override;
    ConstructFcn getConstructFcn() const override;
    const std::string& getConstructFcnName() const override;
    DestructFcn getDestructFcn() const override;
    const std::string& getDestructFcnName() const override;
    DeepCopyFcn getDeepCopyFcn() const override;
    const std::string& getDeepCopyFcnName() const override;
    SerializeFcn getSerializeFcn() const override;
    const std::string& getSerializeFcnName() const override;
    DeserializeFcn getDeserializeFcn() const override;
    const std::string& getDeserializeFcnName() const override;
    SerializeSizeFcn getSerializeSizeFcn() const override;
    const std::string& getSerializeSizeFcnName() const override;
    SizeOfFcn getSizeOfFcn() const override;
    const std::string& getSizeOfFcnName() const override;
    ContainedDataFcn getContainedDataFcn() const override;
    const std::string& getContainedDataFcnName() const override;
    int getContainedDataType() const override;
    unsigned long getContainedDataNumDims() const override;
    ContainedDataDimsFcn getContainedDataDimsFcn() const override;
    const std::string& getContainedDataDimsFcnName() const override;
    CoderPropertiesFcn getCoderPropertiesFcn() const override;
    const std::string& getCoderPropertiesFcnName() const override;
    DataConstructFcn getDataConstructFcn() const override;
    const std::string& getDataConstructFcnName() const override;
    IsPositiveFcn getIsPositiveFcn() const override;
    IsNegativeFcn getIsNegativeFcn() const override;
    GreaterThanFcn getGreaterThanFcn() const override;
    GreaterEqualFcn getGreaterEqualFcn() const override;
    bool getIsPointerType() const override;
    HostToTargetFcn getHostToTargetFcn() const override;
    TargetToHostFcn getTargetToHostFcn() const override;
    int getTargetSize() const override;
    int getStorageId() const override;
    const void* getGround() const override;
    bool getDefaultGround() const override;
    bool getConstructedGround() const override;
    const void* getProperties() const override;
    int getPropertiesSize() const override;
    bool hasFxpDataTypeProp() const override;
    bool isBool() const override;
    bool isNumericOrBool() const override;
    bool isNumericNotBool() const override;
    bool isNumericNotBuiltInClassic9() const override;
    bool isEnum() const override;
    const fxpDataTypeProp* getFxpDataTypeProp() const override;
    bool isHalf() const override;
    bool isImage() const override;
    bool isDynamicMatrix() const override;
    bool isBuiltInClassic9() const override;
    bool isBuiltInIntClassic6() const override;
    bool isBuiltInIntUnsignedClassic3() const override;
    bool isBuiltInIntSignedClassic3() const override;
    bool isNumericOrBoolAndContainerCouldStoreNegatives() const override;
    bool isFloatDataType() const override;
    bool isIntDataType() const override;
    bool isUnsignedIntDataType() const override;
    bool isSignedIntDataType() const override;
    bool isSignedFixptDT() const override;
    bool canContainNegativeNumbers() const override;
    bool isAtomic() const override;
    bool groundHasNonZeroStoredValue() const override;
    void deepCopyScalarElement(const void* src, void* dst) const override;
    void serializeScalarElement(const void* src, void* dst, unsigned long a, unsigned long b) const override;
    void deserializeScalarElement(const void* src, void* dst, unsigned long a, unsigned long b) const override;
    unsigned long serializeSizeScalarElement(const void* src) const override;
    void constructScalarElement(void* p) const override;
    void destroyScalarElement(void* p) const override;

    // Refused: each raises `CannotSetPropertyOfAliasType` with a literal and the alias's name.
    void setSize(int size) override;
    void setConvertBetweenFcn(ConvertBetweenFcn f) override;
    void setConstructFcn(ConstructFcn f) override;
    void setConstructFcnName(const std::string& name) override;
    void setDestructFcn(DestructFcn f) override;
    void setDestructFcnName(const std::string& name) override;
    void setDeepCopyFcn(DeepCopyFcn f) override;
    void setDeepCopyFcnName(const std::string& name) override;
    void setSerializeFcn(SerializeFcn f) override;
    void setSerializeFcnName(const std::string& name) override;
    void setDeserializeFcn(DeserializeFcn f) override;
    void setDeserializeFcnName(const std::string& name) override;
    void setSerializeSizeFcn(SerializeSizeFcn f) override;
    void setSerializeSizeFcnName(const std::string& name) override;
    void setSizeOfFcn(SizeOfFcn f) override;
    void setSizeOfFcnName(const std::string& name) override;
    void setContainedDataFcn(ContainedDataFcn f) override;
    void setContainedDataFcnName(const std::string& name) override;
    void setContainedDataType(int id) override;
    void setContainedDataNumDims(unsigned long numDims) override;
    void setContainedDataDimsFcn(ContainedDataDimsFcn f) override;
    void setContainedDataDimsFcnName(const std::string& name) override;
    void setUpdateContainedDataDimsFcn(UpdateContainedDataDimsFcn f) override;
    void setUpdateContainedDataDimsFcnName(const std::string& name) override;
    void setUpdateContainedDataDimFcn(UpdateContainedDataDimFcn f) override;
    void setUpdateContainedDataDimFcnName(const std::string& name) override;
    void setCoderPropertiesFcn(CoderPropertiesFcn f) override;
    void setCoderPropertiesFcnName(const std::string& name) override;
    void setDataConstructFcn(DataConstructFcn f) override;
    void setDataConstructFcnName(const std::string& name) override;
    void setGreaterThanFcn(GreaterThanFcn f) override;
    void setGreaterEqualFcn(GreaterEqualFcn f) override;
    void setIsNegativeFcn(IsNegativeFcn f) override;
    void setIsPositiveFcn(IsPositiveFcn f) override;
    void setStorageId(int id) override;
    void setGround(const void* ground) override;
    void setProperties(const void* properties) override;
    void setPropertiesSize(int size) override;
    void setIsAtomic(bool isAtomic) override;
    void setGroundHasNonZeroStoredValue(bool hasNonZero) override;

    // Without effect.
    void setIsPointerType(bool isPointer) override;
    void setHostToTargetFcn(HostToTargetFcn f) override;
    void setTargetToHostFcn(TargetToHostFcn f) override;
    void setTargetSize(int size) override;
    void setDefaultGround(bool isDefault) override;
    void setConstructedGround(bool isConstructed) override;
    /// Does nothing: the alias answers by its target.
    virtual void setIdAliasedTo(int id);
    /// Does nothing: the alias answers by its target.
    virtual void setIdAliasedThruTo(int id);

  protected:
    const DataType* aliasedTo_;     // the record that the definition names, possibly an alias; not owned
    const DataType* aliasedThruTo_; // the record at the end of the chain; not owned

  private:
    [[noreturn]] void refuse(const char* property) const;
};

} // namespace QLTypeSys
