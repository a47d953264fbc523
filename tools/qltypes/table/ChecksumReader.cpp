#include "table/ChecksumReader.h"

#include <fmt/format.h>

#include "qltypes/structures/ElementAccess.h"
#include "qltypes/structures/StructChecksum.h"
#include "qltypes/types/DataTypeTableUtils.h"

namespace inspector {
namespace {

class RegisteredName final : public StructElemTypeDesc {
  public:
    explicit RegisteredName(const char* name) : name_(name) {}
    const char* getText() const override { return name_; }

  private:
    const char* name_; // owned by the table
};

} // namespace

ChecksumLayout checksumOf(QLTypeSys::DataTypeTable& table, const std::string& structure) {
    const int id = table.getDataTypeId(structure.c_str());
    const QLTypeSys::ImmediateElementAccess view(&table, id);
    ChecksumLayout checksum;
    qlChecksumRec record;
    for (long i = 0; i < view.getNumElements(); ++i) {
        const RegisteredName type(DtGetDataTypeName(&table, view.getDataTypeId(i)));
        const long* const dimensions = view.getDimensions(i);
        StructElemDesc element;
        element.name = view.getName(i);
        element.type = &type;
        element.dims.assign(dimensions, dimensions + view.getNumDimensions(i));
        element.isComplex = view.getSignalType(i) == 1;
        addStructElementToChecksum(record, element);
        checksum.descriptions.push_back(element.genDescription());
    }
    DtSetStructDataTypeChecksum(&table, id, record.value());
    for (const std::uint32_t word : DtGetStructDataTypeChecksum(&table, id).words)
        checksum.digest += fmt::format("{:08x}", word);
    return checksum;
}

} // namespace inspector
