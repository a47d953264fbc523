// The type record of a date-time type: what its numbers mean stands in a DateTimeType, which never changes.
//
//   const int id = table.registerDateTimeDataType(DateTimeType::datetime_t(AbsoluteTimeScale::Posix), nullptr);
//   table.getDateTimeType(id).getTimeSystemStr(); // u"posix"
#pragma once

#include <string>

#include "qlplatform/Export.h"
#include "qltypes/date_time/DateTimeType.h"
#include "qltypes/types/DataType.h"

namespace QLTypeSys {

/// The record of a date-time type.
class QL_EXPORT DateTimeDataType : public DataType {
  public:
    DateTimeDataType(const QLDateTime::DateTimeType& type, int id, const std::string& name);
    ~DateTimeDataType() override;

    /// The storage of the type, a number record. Owned by the record.
    const void* getProperties() const override;
    /// Ignored: the type is given at construction.
    void setProperties(const void* properties) override;

    /// The time system with its storage.
    const QLDateTime::DateTimeType& getDateTimeType() const { return type_; }

  private:
    QLDateTime::DateTimeType type_;
};

} // namespace QLTypeSys
