// A table of data types: names become small integers, and the integers answer.
#include <cstdio>

#include "qltypes/types/DataTypeTable.h"
#include "qltypes/types/DataTypeTableUtils.h"

int main() {
    QLTypeSys::DataTypeTable table;
    std::puts("Fixed types, the same in every table:");
    for (int id = -1; id < DAGetNumQLDataTypes(); ++id)
        std::printf("%3d %s\n", id, DtGetDataTypeName(&table, id));

    std::puts("\nTypes of clients:");
    const int torque = table.registerDataType("Torque", DataTypeSource(2), nullptr);
    const int speed = table.registerDataType("sfix16_En7", dtSourceFixpt, nullptr);
    std::printf("%3d %s\n%3d %s\n", torque, DtGetDataTypeName(&table, torque), speed, DtGetDataTypeName(&table, speed));
    std::printf("registering Torque again answers %d\n", table.registerDataType("Torque", DataTypeSource(2), nullptr));

    std::puts("\nLooked up:");
    std::printf("Torque is %d, Force is %d\n", table.getDataTypeId("Torque"), table.getDataTypeId("Force"));
    std::printf("14 is %svalid, 16 is %svalid\n", table.isDataTypeIdValid(14) ? "" : "not ",
                table.isDataTypeIdValid(16) ? "" : "not ");

    std::puts("\nAn identifier belongs to its table:");
    QLTypeSys::DataTypeTable other;
    const int force = other.registerDataType("Force", DataTypeSource(2), nullptr);
    std::printf("%d is %s here and %s there\n", torque, DtGetDataTypeName(&table, torque),
                DtGetDataTypeName(&other, force));
    table.resetToBuiltin();
    std::printf("after a reset there are %d types, and Torque is %d\n", table.getNumDataTypes(),
                table.getDataTypeId("Torque"));
}
