// The value behind a date-time type: a time system and the number type that stores the time.
//
// The record in the type table is DateTimeDataType.h.
//   auto t = QLDateTime::DateTimeType::datetime_t(QLDateTime::AbsoluteTimeScale::Posix);
//   t.getDataTypeName(); // u"posix"
#pragma once

#include <string>
#include <utility>

#include "qlplatform/Export.h"
#include "qltypes/date_time/TimeSystem.h"
#include "qltypes/fixed_point/FixPointDefs.h"

namespace QLDateTime {

/// A time system with its storage. A copyable value.
class QL_EXPORT DateTimeType : public TimeSystem {
  public:
    /// The default TAI system in unsigned 128-bit storage with 64 fractional bits; not the default type of that system,
    /// whose storage is signed.
    DateTimeType();

    /// The system in the default storage of its scale.
    explicit DateTimeType(const TimeSystem& system);

    /// The system in the given storage, which is not checked.
    DateTimeType(const TimeSystem& system, const fxpDataTypeProp& storage);
    /// Copies system and storage.
    DateTimeType(const DateTimeType&) = default;
    /// Copies system and storage.
    DateTimeType& operator=(const DateTimeType&) = default;
    ~DateTimeType() override;

    /// The default system and storage of the scale.
    static DateTimeType datetime_t(const AbsoluteTimeScale& scale);
    /// Checked system, default storage of the scale. Raises what TimeSystem::createTimeSystem raises.
    static DateTimeType datetime_t(const AbsoluteTimeScale& scale, const DateTimeStruct& epoch,
                                   const std::pair<DateTimeStruct, DateTimeStruct>& range);
    /// Checked system, given storage. Raises what TimeSystem::createTimeSystem raises.
    static DateTimeType datetime_t(const AbsoluteTimeScale& scale, const DateTimeStruct& epoch,
                                   const std::pair<DateTimeStruct, DateTimeStruct>& range,
                                   const fxpDataTypeProp& storage);

    /// The number type in which values are stored.
    const fxpDataTypeProp& getStorage() const { return storage_; }

    /// The text of the system; when the storage is not the default of the scale, then "s" where it is signed, the word
    /// length, "e" and the negated exponent of a fixed-point storage, or "double" or "single". Slope and bias are not
    /// part of the text.
    std::u16string getDataTypeName() const;

    /// Whether the systems are equal and the storages are, but for the override marker.
    bool isEqual(const DateTimeType& other) const;

  private:
    fxpDataTypeProp storage_;
};

} // namespace QLDateTime
