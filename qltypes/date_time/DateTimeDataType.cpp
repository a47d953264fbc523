#include "qltypes/date_time/DateTimeDataType.h"

namespace QLTypeSys {

DateTimeDataType::DateTimeDataType(const QLDateTime::DateTimeType& type, int id, const std::string& name)
    : DataType(id, name, dtSourceDateTime), type_(type) {}

DateTimeDataType::~DateTimeDataType() = default;

const void* DateTimeDataType::getProperties() const { return &type_.getStorage(); }

void DateTimeDataType::setProperties(const void*) {}

} // namespace QLTypeSys
