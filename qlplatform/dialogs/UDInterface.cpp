#include "qlplatform/dialogs/UDInterface.h"

UDInterface::~UDInterface() = default;

const UDInterfaceType* UDInterfaceType::getType() {
    static const UDInterfaceType type;
    return &type;
}

txArray_tag* uddtConvertToTorvex(const UDInterface* object, const UDInterfaceType*) {
    return object ? object->toHostArray().release() : nullptr;
}
