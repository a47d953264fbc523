#include "qlplatform/arrays/HostArray.h"

struct txArray_tag {
    int references = 1;
    bool isTemporary = true;
};

void txDestroyArray(txArray_tag* array) {
    if (array && --array->references == 0) delete array;
}

void txKeepArray(txArray_tag* array) {
    array->isTemporary = false;
    ++array->references;
}
