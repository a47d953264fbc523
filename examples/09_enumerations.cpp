// Enumerations: a class is defined, checked, registered as a data type, and values of the type are read by its id.

#include <cstdint>
#include <cstdio>
#include <map>
#include <string>

#include "qlplatform/arrays/HostElements.h"
#include "qlplatform/classes/DefinedClass.h"
#include "qlplatform/classes/Objects.h"
#include "qlplatform/services/Diagnostics.h"
#include "qltypes/host/ClassIds.h"
#include "qltypes/types/DataTypeTable.h"
#include "qltypes/types/DataTypeTableUtils.h"
#include "qltypes/types/ql_enum_utils.h"

namespace {

/// A table that knows the member names of its enumerations.
class ModelTable : public QLTypeSys::DataTypeTable {
  public:
    /// Registers the class under its name; its values are stored as `storageId`.
    int registerEnumeration(const tcos::COSClass& cls, int storageId) {
        const int id = registerDataType(cls.getName(), dtSourceEnum, nullptr);
        for (tcos::COSIterator members = cls.getEnumerationMembers(); members.hasMoreElements();) {
            const tcos::COSInterfacePtr handle = members.nextElement();
            const tcos::COSEnum* member = tcos::cosiToEnum(handle);
            const txArrayPtr object = member->getValue();
            const txArrayPtr stored = qlGetStoredIntTxArrayFromEnumObject(object.get());
            const int value = DtGetEnumTypeValueFromVoidPtr(this, storageId, txGetData(stored.get()), 0);
            memberNames_[{id, value}] = member->getName();
        }
        DtSetDataTypeStorageId(this, "", id, storageId);
        DtSetDataTypeSize(this, "", id, DtGetDataTypeSize(this, storageId));
        return id;
    }

    const char* getEnumTypeStringFromValue(int id, int value) const override {
        const auto found = memberNames_.find({id, value});
        return found == memberNames_.end() ? nullptr : found->second.c_str();
    }

  private:
    std::map<std::pair<int, int>, std::string> memberNames_;
};

void check(const tcos::COSInterfacePtr& cls) {
    qlsvDiagnosticImpl* fault = qlCheckForValidEnumDataType(cls);
    std::printf("%s: %s\n", tcos::cosiToClass(cls)->getName(), fault ? fault->text().c_str() : "may be a data type");
    qlsvDiscardDiagnostic(fault);
}

txArrayPtr asObjects(txArrayPtr numbers, const char* className) {
    txArray_tag* array = numbers.get();
    QLTypeConv::qlConvertMatrixToEnumObjects(array, className); // replaces the numbers, or throws and leaves them
    (void)numbers.release();
    return txArrayPtr(array);
}

} // namespace

int main() {
    // Classes of the program's own; an engine adds its own source of classes instead.
    const auto gear = std::make_shared<tcos::DefinedClass>("Gear", tcos::ClassKind::enumeration);
    gear->derivesFrom("int8").addMember("Reverse", -1).addMember("Park", 0).addMember("Drive", 1);
    tcos::defineClass(gear);
    const auto light = std::make_shared<tcos::DefinedClass>("Light", tcos::ClassKind::enumeration);
    light->derivesFrom("uint32").addMember("Off", 0);

    std::puts("Checked:");
    check(gear);
    check(light);

    ModelTable table;
    const int id = table.registerEnumeration(*gear, DATA_TYPE_ID_INT8);
    std::printf("\nRegistered:\n%s has id %d and is %san enumeration of %d byte\n", DtGetDataTypeName(&table, id), id,
                DtIsEnumType(&table, id) ? "" : "not ", DtGetDataTypeSize(&table, id));
    int served = 0;
    DtIsValidEnumType(&table, id, "Gear", &served);
    std::printf("id %d serves for Gear\n", served);

    std::puts("\nValues by id:");
    const std::int8_t signal[] = {0, 1, 1, -1, 7};
    for (unsigned long i = 0; i < std::size(signal); ++i) {
        const int value = DtGetEnumTypeValueFromVoidPtr(&table, id, signal, i);
        const char* name = DtGetEnumTypeStringFromValue(&table, id, value);
        std::printf("%2d %s\n", value, name ? name : "(no member)");
    }

    std::puts("\nObjects from numbers:");
    const txArrayPtr objects = asObjects(txArrayPtr(txCreateRow<double>({1, -1})), "Gear");
    std::printf("%zu objects of class %s over %s, valid: %s\n", txGetNumberOfElements(objects.get()),
                txGetClassName(objects.get()), txGetClassName(omGetUnderlyingArray(objects.get())),
                qlIsValidEnumObject(objects.get()) ? "yes" : "no");
    try {
        asObjects(txArrayPtr(txCreateDoubleScalar(7)), "Gear");
    } catch (const foundation::core::except::IException& e) {
        std::printf("refused: %s\n", e.what());
    }
    tcos::removeClass("Gear");
    return 0;
}
