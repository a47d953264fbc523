// The type record of a text signal, and the flat functions about string types.
//
// A value is a slot of one pointer: the handle of a UTF-16 text in the process-wide string pool, or null. The text is
// found by the slot's address, so a slot must not move while it holds a handle. The maximum length belongs to the type;
// no operation here holds a value to it.
//
//   const int id = table.registerStringDataType(32, nullptr); // "str32"
//   void* slot = nullptr;
//   table.construct(id, &slot);
//   StringDataType::writeUStringScalarToVoidPtrOutput(u"on", &slot, 0);
//   table.destruct(id, &slot);
#pragma once

#include <string>

#include "qlplatform/Export.h"
#include "qltypes/types/DataType.h"

namespace QLTypeSys {

class DataTypeTable;

/// The record of a string type.
class QL_EXPORT StringDataType : public DataType {
  public:
    /// `maxStringLength` counts UTF-16 units; 0 makes a dynamic string.
    StringDataType(int id, const std::string& name, unsigned long maxStringLength);
    ~StringDataType() override;

    /// Ignored: texts have no sign.
    void setIsNegativeFcn(IsNegativeFcn f) override;
    /// Ignored: texts have no sign.
    void setIsPositiveFcn(IsPositiveFcn f) override;
    /// Ignored: the length is the only property.
    void setProperties(const void* properties) override;
    /// Copies the text; a null destination is constructed on the way. Unchecked: the source must be constructed.
    void deepCopyScalarElement(const void* src, void* dst) const override;
    /// Puts an empty text under the slot.
    void constructScalarElement(void* slot) const override;
    /// Drops the text and nulls the slot.
    void destroyScalarElement(void* slot) const override;

    /// Whether texts may be of any length.
    bool isDynamic() const { return maxStringLength_ == 0; }
    /// In UTF-16 units; 0 for a dynamic string.
    unsigned long getMaxStringLength() const { return maxStringLength_; }
    /// Sets size and kind, and locks the record against becoming an alias.
    void setupDataTypeProperties();

    /// Bytes of a slot.
    static unsigned long getStorageSize();
    /// The text of a slot. Unchecked: the slot must be constructed.
    static const std::u16string& getUStringScalarFromVoidPtrInput(const void* slot);
    /// Moves the text into a slot, which is constructed first when it is null. The last argument is not used.
    static void writeUStringScalarToVoidPtrOutput(std::u16string&& text, void* slot, unsigned long reserved);
    /// "string" for 0, else "str" and the length.
    static std::string getDataTypeName(unsigned long maxStringLength);
    /// "string" for a dynamic type, else "stringtype(length)". Unchecked: the record at `id` itself must be a string
    /// type, no alias.
    static std::string getDataTypeExpression(const DataTypeTable* table, int id);

  private:
    unsigned long maxStringLength_;
};

} // namespace QLTypeSys

/// The low byte of each unit of a slot's text: for identifiers and diagnostics, not for text beyond ASCII. Unchecked:
/// the slot must be constructed.
QL_EXPORT std::string GetStdStringFromQLStringPointer(const void* slot);

/// Which of two string types can hold the other: the dynamic one, else the longer one, else `a`. Unchecked: both
/// records themselves must be string types, no aliases.
QL_EXPORT int DtGetSaferStringDataType(const QLTypeSys::DataTypeTable* table, int a, int b);

/// Whether any type of a client is a string type.
QL_EXPORT bool DtHasStringDataType(const QLTypeSys::DataTypeTable* table);

/// Whether the maximum length is 0. Unchecked: the record at `id` itself must be a string type, no alias.
QL_EXPORT bool DtIsDynamicStringType(const QLTypeSys::DataTypeTable* table, int id);

/// QLTypeSys::StringDataType::getDataTypeExpression.
QL_EXPORT std::string DtGetStringDataTypeExpression(const QLTypeSys::DataTypeTable* table, int id);

/// Whether the type is a string type or a bus with one in it. False for an invalid id, and for a structure that is no
/// bus.
QL_EXPORT bool DataTypeIsOrContainsString(const QLTypeSys::DataTypeTable* table, int id);
