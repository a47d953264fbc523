// How the elements of a structure enter a checksum, and the checksum that a client keeps with a structure.
//
// Name, type text, dimensions and complexity of each element count, and their order; nothing else does.
//   qlChecksumRec rec;
//   for (const StructElemDesc& element : elements) addStructElementToChecksum(rec, element);
//   DtSetStructDataTypeChecksum(&table, id, rec.value());
#pragma once

#include <string>
#include <vector>

#include "qlplatform/Export.h"
#include "qlplatform/checksum/Checksum.h"

namespace QLTypeSys {
class DataTypeTable;
class SymbolicDimsTable;
} // namespace QLTypeSys

/// What names the type of an element in a checksum. Clients derive from it.
class QL_EXPORT StructElemTypeDesc {
  public:
    virtual ~StructElemTypeDesc();
    /// The type's text, such as "double". Null makes the description of the element empty.
    virtual const char* getText() const = 0;
};

/// One element as it enters a checksum.
struct QL_EXPORT StructElemDesc {
    /// The name of the element.
    std::string name;
    const StructElemTypeDesc* type = nullptr;                        ///< not owned
    const QLTypeSys::SymbolicDimsTable* symbolicDimsTable = nullptr; ///< where `symbDimsId` is resolved; may be null
    /// The symbolic dimensions; 0 is numeric.
    int symbDimsId = 0;
    std::vector<unsigned long> dims; ///< used where `symbDimsId` is no symbolic dimension
    /// Whether the element is complex.
    bool isComplex = false;

    /// The text that enters the checksum, such as "double:pos:[ 3 ];" or "single:iq:[ 1 ]:complex;". Dimensions that
    /// are all 1 are written as one. Unchecked: `type` must not be null.
    std::string genDescription() const;
};

/// Adds the element's description, as an item of the long form when it has more than 65534 bytes.
QL_EXPORT void addStructElementToChecksum(qlChecksumRec& rec, const StructElemDesc& desc);

/// The checksum kept with the structure at the end of the alias chain. Raises `InvalidDataTypeId`. Unchecked: it must
/// be a structure.
QL_EXPORT const qlChecksumValue& DtGetStructDataTypeChecksum(const QLTypeSys::DataTypeTable* table, int id);
/// Replaces it. As the function above.
QL_EXPORT void DtSetStructDataTypeChecksum(QLTypeSys::DataTypeTable* table, int id, const qlChecksumValue& value);
