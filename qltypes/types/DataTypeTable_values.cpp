// Operations on values by identifier. Each finds the record and hands on; conversion and comparison also test that the
// type has the function, and pass resolved identifiers.
#include <cstring>

#include "qltypes/host/Failure_internal.h"
#include "qltypes/types/DataTypeTable.h"

namespace QLTypeSys {

namespace {

// Whether any of `count` floating values is not equal to zero; NaN is not, -0.0 is.
template <class T> bool anyNonZero(const void* data, long count) {
    const T* values = static_cast<const T*>(data);
    for (long i = 0; i < count; ++i)
        if (values[i] != T{}) return true;
    return false;
}

} // namespace

bool DataTypeTable::dataConstruct(int id, unsigned long numDims, const unsigned long* dims, unsigned long elementSize,
                                  const void* data, void* dst) const {
    return failure::succeeds([&] { recordAt(id)->dataConstruct(numDims, dims, elementSize, data, dst); });
}

// --- With status: these seven and no others (kept) -------------------------------------------------------------------

bool DataTypeTable::constructWithStatus(int id, void* p) const {
    return failure::succeeds([&] { construct(id, p); });
}
bool DataTypeTable::destructWithStatus(int id, void* p) const {
    return failure::succeeds([&] { destruct(id, p); });
}
bool DataTypeTable::deepCopyWithStatus(int id, void* dst, const void* src) const {
    return failure::succeeds([&] { deepCopy(id, dst, src); });
}
bool DataTypeTable::serializeWithStatus(int id, void* dst, const void* src, unsigned long a, unsigned long b) const {
    return failure::succeeds([&] { serialize(id, dst, src, a, b); });
}
bool DataTypeTable::deserializeWithStatus(int id, void* dst, const void* src, unsigned long a, unsigned long b) const {
    return failure::succeeds([&] { deserialize(id, dst, src, a, b); });
}
bool DataTypeTable::convertToUsingSrcIdWithStatus(int dstId, int srcId, int count, const void* src, const void* aux,
                                                  void* dst) const {
    return failure::succeeds([&] { convertToUsingSrcId(dstId, srcId, count, src, aux, dst); });
}
bool DataTypeTable::isPositiveWithStatus(int id, int count, const void* data, const void* aux, void* result) const {
    return failure::succeeds([&] { isPositive(id, count, data, aux, result); });
}

// --- Conversion and comparison ---------------------------------------------------------------------------------------

void DataTypeTable::raiseMissingFcn(const char* name, int id) const {
    failure::raise(QuillaneTypes::general::DataTypeFcnDoesNotExist(name, recordAt(id)->getName()));
}

void DataTypeTable::raiseFailedFcn(const char* operation, int id) const {
    failure::raise(QuillaneTypes::general::DataTypeFcnUnknownError(operation, recordAt(id)->getName()));
}

void DataTypeTable::convert(int chosenId, int dstId, int srcId, int count, const void* src, const void* aux,
                            void* dst) const {
    int resolvedId = chosenId;
    const ConvertBetweenFcn f =
        functionAt(resolvedId, &DataType::convertBetweenFcn_, &DataType::getConvertBetweenFcn, "ConvertBetweenFcn");
    succeeded(f(dataTypeAccess_, nullptr, recordAt(dstId)->getIdAliasedThruTo(), recordAt(srcId)->getIdAliasedThruTo(),
                count, src, aux, dst),
              "ConvertBetween", chosenId);
}

void DataTypeTable::convertToUsingSrcId(int dstId, int srcId, int count, const void* src, const void* aux,
                                        void* dst) const {
    convert(srcId, dstId, srcId, count, src, aux, dst);
}

void DataTypeTable::convertToUsingDstId(int dstId, int srcId, int count, const void* src, const void* aux,
                                        void* dst) const {
    convert(dstId, dstId, srcId, count, src, aux, dst);
}

void DataTypeTable::sign(int id, const void* src, const void* aux, signed char* result) const {
    double value = 0.0;
    convertToUsingSrcId(DATA_TYPE_ID_DOUBLE, id, 1, src, aux, &value);
    *result = value > 0.0 ? 1 : value == 0.0 ? 0 : -1; // kept: NaN is negative
}

void DataTypeTable::isPositive(int id, const void* data, const void* aux, signed char* result) const {
    unsigned long answer = 0; // a type's function may write more than one byte
    isPositive(id, 1, data, aux, &answer);
    *result = answer != 0;
}

bool DataTypeTable::checkIfNonZeroArray(const void* data, int count, int id, bool isComplex) const {
    if (count < 1) return false;
    const long numParts = isComplex ? 2L * count : count;
    if (id == DATA_TYPE_ID_DOUBLE) return anyNonZero<double>(data, numParts);
    if (id == DATA_TYPE_ID_SINGLE) return anyNonZero<float>(data, numParts);
    const DataType* record = recordAt(id);
    const void* ground = record->getGround();
    const auto size = static_cast<std::size_t>(record->getSize());
    const auto* part = static_cast<const unsigned char*>(data);
    for (long i = 0; i < numParts; ++i, part += size)
        if (std::memcmp(part, ground, size) != 0) return true;
    return false;
}

qlsvDiagnosticImpl* DataTypeTable::setDataTypeSize(int id, int size) {
    return failure::diagnosticFrom([&] { recordAt(id)->setSize(size); });
}

} // namespace QLTypeSys
