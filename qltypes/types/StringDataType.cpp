#include "qltypes/types/StringDataType.h"

#include <algorithm>
#include <cstring>
#include <stdexcept>
#include <utility>

#include "qlplatform/strings/DynamicStringPool.h"
#include "qltypes/host/Assert_internal.h"
#include "qltypes/structures/StructDataTypeUtils.h"
#include "qltypes/types/DataTypeTable.h"
#include "qltypes/types/DataTypeTableUtils.h"

namespace QLTypeSys {

namespace {

stringutil::DynamicStringPool& pool() {
    return stringutil::DynamicStringPool::GetPool(stringutil::DynamicStringPool::GlobalPoolName);
}

void* handleIn(const void* slot) {
    void* handle;
    std::memcpy(&handle, slot, sizeof handle);
    return handle;
}

void storeHandle(void* slot, void* handle) { std::memcpy(slot, &handle, sizeof handle); }

void construct(void* slot) { storeHandle(slot, pool().put(slot, std::u16string())); }

const StringDataType* stringRecord(const DataTypeTable* table, int id) {
    const DataType* record = table->getDataTypeAt(static_cast<unsigned long>(id + 1));
    QLTYPES_ASSERT(record->getIsType(dtqString)); // kept: an alias is not walked
    return static_cast<const StringDataType*>(record);
}

} // namespace

StringDataType::StringDataType(int id, const std::string& name, unsigned long maxStringLength)
    : DataType(id, name, dtSourceString), maxStringLength_(maxStringLength) {
    qualifier_ = dtqString;
    plainCopy_ = plainConstruct_ = plainDestroy_ = false;
}

StringDataType::~StringDataType() = default;

void StringDataType::setIsNegativeFcn(IsNegativeFcn) {}
void StringDataType::setIsPositiveFcn(IsPositiveFcn) {}
void StringDataType::setProperties(const void*) {}

void StringDataType::setupDataTypeProperties() {
    setSize(static_cast<int>(getStorageSize()));
    setType(dtqString);
    setIsAliasToLocked(true);
}

void StringDataType::constructScalarElement(void* slot) const { construct(slot); }

void StringDataType::destroyScalarElement(void* slot) const {
    pool().remove(slot);
    storeHandle(slot, nullptr);
}

void StringDataType::deepCopyScalarElement(const void* src, void* dst) const {
    const std::u16string& text = getUStringScalarFromVoidPtrInput(src);
    if (!text.data() && !text.empty()) throw std::logic_error("basic_string::_M_construct null not valid");
    writeUStringScalarToVoidPtrOutput(std::u16string(text), dst, 0);
}

unsigned long StringDataType::getStorageSize() { return sizeof(void*); }

const std::u16string& StringDataType::getUStringScalarFromVoidPtrInput(const void* slot) {
    void* const handle = handleIn(slot);
    QLTYPES_ASSERT(handle);
    return stringutil::voidPtrToUStrRef(handle);
}

void StringDataType::writeUStringScalarToVoidPtrOutput(std::u16string&& text, void* slot, unsigned long) {
    if (!handleIn(slot)) construct(slot);
    stringutil::voidPtrToUStrRef(handleIn(slot)) = std::move(text);
}

std::string StringDataType::getDataTypeName(unsigned long maxStringLength) {
    return maxStringLength == 0 ? "string" : "str" + std::to_string(maxStringLength);
}

std::string StringDataType::getDataTypeExpression(const DataTypeTable* table, int id) {
    const StringDataType* record = stringRecord(table, id);
    return record->isDynamic() ? "string" : "stringtype(" + std::to_string(record->getMaxStringLength()) + ")";
}

} // namespace QLTypeSys

using QLTypeSys::DataTypeTable;
using QLTypeSys::StringDataType;

std::string GetStdStringFromQLStringPointer(const void* slot) {
    const std::u16string& text = StringDataType::getUStringScalarFromVoidPtrInput(slot);
    std::string narrow(text.size(), '\0');
    std::transform(text.begin(), text.end(), narrow.begin(), [](char16_t unit) { return static_cast<char>(unit); });
    return narrow;
}

int DtGetSaferStringDataType(const DataTypeTable* table, int a, int b) {
    if (a == b) return b;
    const StringDataType* first = QLTypeSys::stringRecord(table, a);
    const StringDataType* second = QLTypeSys::stringRecord(table, b);
    if (first->isDynamic()) return a;
    if (second->isDynamic()) return b;
    return first->getMaxStringLength() >= second->getMaxStringLength() ? a : b;
}

bool DtHasStringDataType(const DataTypeTable* table) {
    for (int id = DAGetNumQLDataTypes(); id < QLTypeSys::GetNumDataTypes(table); ++id)
        if (table->IsStringDataType(id)) return true;
    return false;
}

bool DtIsDynamicStringType(const DataTypeTable* table, int id) {
    return QLTypeSys::stringRecord(table, id)->isDynamic();
}

std::string DtGetStringDataTypeExpression(const DataTypeTable* table, int id) {
    return StringDataType::getDataTypeExpression(table, id);
}

bool DataTypeIsOrContainsString(const DataTypeTable* table, int id) {
    if (!table->isDataTypeIdValid(id)) return false;
    if (table->IsStringDataType(id)) return true;
    return DtGetDataTypeIsBus(table, id) && table->doesBusDTHaveStringData(DtGetDataTypeIdAliasedThruTo(table, id));
}
