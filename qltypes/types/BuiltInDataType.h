// Records of the fixed types: the nine built-in and five predefined types, and the auto type.
#pragma once

#include "qltypes/types/DataType.h"

namespace QLTypeSys {

/// The record of a built-in or predefined type; its qualifier is dtqBuiltIn until registration says otherwise.
class QL_EXPORT BuiltInDataType : public DataType {
  public:
    BuiltInDataType(int id, const std::string& name, DataTypeSource source);
    ~BuiltInDataType() override;
};

/// The record of the auto type, which compares and converts as a double. Attempts to define it have no effect.
class QL_EXPORT AutoDataType : public BuiltInDataType {
  public:
    AutoDataType();
    ~AutoDataType() override;

    bool getIsPointerType() const override;

    // Without effect.
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
    void setCoderPropertiesFcn(CoderPropertiesFcn f) override;
    void setCoderPropertiesFcnName(const std::string& name) override;
    void setDataConstructFcn(DataConstructFcn f) override;
    void setDataConstructFcnName(const std::string& name) override;
    void setGreaterThanFcn(GreaterThanFcn f) override;
    void setGreaterEqualFcn(GreaterEqualFcn f) override;
    void setIsNegativeFcn(IsNegativeFcn f) override;
    void setIsPositiveFcn(IsPositiveFcn f) override;
    void setIsPointerType(bool isPointer) override;
    void setStorageId(int id) override;
    void setGround(const void* ground) override;
    void setDefaultGround(bool isDefault) override;
    void setConstructedGround(bool isConstructed) override;
    void setProperties(const void* properties) override;
    void setPropertiesSize(int size) override;
    void setCGType(CG::Type* type) override;
};

} // namespace QLTypeSys
