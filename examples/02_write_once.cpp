// A type is defined property by property. What is defined stays: the same again is accepted, something else is refused.
#include <cstdio>
#include <cstring>

#include "qlplatform/services/Diagnostics.h"
#include "qltypes/types/DataTypeTable.h"
#include "qltypes/types/DataTypeTableUtils.h"

namespace {

struct Torque {
    double value;
    double sigma;
};

int constructTorque(void* p, const void*) {
    static_cast<Torque*>(p)->value = 0;
    static_cast<Torque*>(p)->sigma = 1;
    return 1;
}

int areTorquesPositive(_qlDataTypeAccess_tag*, const char*, int, int count, const void* data, const void*,
                       void* result) {
    for (int i = 0; i < count; ++i)
        static_cast<signed char*>(result)[i] = static_cast<const Torque*>(data)[i].value > 0;
    return 1;
}

void tell(const char* what, qlsvDiagnosticImpl* failed) {
    std::printf("%-18s %s\n", what, failed ? failed->text().c_str() : "accepted");
    qlsvDiscardDiagnostic(failed);
}

} // namespace

int main() {
    QLTypeSys::DataTypeTable table;
    const int id = table.registerDataType("Torque", DataTypeSource(2), nullptr);

    const Torque ground{0, 1};
    tell("ground, no size", DtSetDataTypeGround(&table, "", id, &ground));
    tell("size 16", DtSetDataTypeSize(&table, "", id, 16));
    tell("size 16 again", DtSetDataTypeSize(&table, "", id, 16));
    tell("size 8", DtSetDataTypeSize(&table, "", id, 8));
    tell("size 8 by a block", DtSetDataTypeSize(&table, "model/Gain", id, 8));

    tell("ground", DtSetDataTypeGround(&table, "", id, &ground));
    const Torque other{0, 2};
    tell("other ground", DtSetDataTypeGround(&table, "", id, &other));

    // Functions: comparisons and conversions are set once, the others may be replaced.
    tell("construct", DtSetConstructFcn(&table, "", id, constructTorque));
    tell("is positive", DtSetIsPositiveFcn(&table, "", id, areTorquesPositive));
    tell("another one", DtSetIsPositiveFcn(&table, "", id, nullptr));

    Torque value{7, 7};
    table.construct(id, &value);
    std::printf("\na new value is the ground: %s\n", std::memcmp(&value, &ground, sizeof value) == 0 ? "yes" : "no");
}
