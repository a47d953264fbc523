// What the table knows of structures.
#include "qltypes/types/DataTypeTable.h"

namespace QLTypeSys {

void DataTypeTable::clearStructureCaches(DataType*) {}

int DataTypeTable::registerStructDataType(const char*, DataTypeSource, const char*) { return DATA_TYPE_ID_INVALID; }

} // namespace QLTypeSys
