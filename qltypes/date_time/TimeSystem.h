// Time systems: on which absolute scale a stored time is read, from which epoch, and over which range of dates.
//
// These are descriptions: nothing here converts between scales or counts leap seconds. Number types that store the
// time: DateTimeType.h.
//   auto s = QLDateTime::TimeSystem::createTimeSystem(AbsoluteTimeScale::GPS, epoch, {first, last}); // checked
//   s.getTimeSystemStr();
#pragma once

#include <string>
#include <utility>

#include "qlplatform/Export.h"
#include "qltypes/date_time/DateTimeStruct.h"

namespace QLDateTime {

/// An absolute time scale. Any value above JD_TAI reads as MJD_TAI.
enum class AbsoluteTimeScale : unsigned int {
    TAI = 0,     ///< International Atomic Time, "tai"
    GPS = 1,     ///< GPS time, "gps"
    UTC = 2,     ///< Coordinated Universal Time, "utc"
    Posix = 3,   ///< POSIX time, "posix"
    JD_TAI = 4,  ///< Julian date on TAI, "jd"
    MJD_TAI = 5, ///< modified Julian date on TAI, "mjd"
};

/// A scale with an epoch and a range. A copyable value.
class QL_EXPORT TimeSystem {
  public:
    /// A placeholder to be assigned before use.
    TimeSystem() = default;

    /// The default of the scale.
    explicit TimeSystem(const AbsoluteTimeScale& scale);

    /// Stores the three unchecked. Both ends of `range` belong to it.
    TimeSystem(const AbsoluteTimeScale& scale, const DateTimeStruct& epoch,
               const std::pair<DateTimeStruct, DateTimeStruct>& range);

    /// Copies scale, epoch and range.
    TimeSystem(const TimeSystem&) = default;
    /// Copies scale, epoch and range.
    TimeSystem& operator=(const TimeSystem&) = default;
    virtual ~TimeSystem();

    /// The default of the scale with the epoch and the range set, in this order. Raises what they raise.
    static TimeSystem createTimeSystem(const AbsoluteTimeScale& scale, const DateTimeStruct& epoch,
                                       const std::pair<DateTimeStruct, DateTimeStruct>& range);

    // Defaults: the scale with the epoch and the range that belong to it.
    static TimeSystem getDefaultTAI();
    static TimeSystem getDefaultGPS();
    static TimeSystem getDefaultUTC();
    static TimeSystem getDefaultPosix();
    static TimeSystem getDefaultJD_TAI();
    static TimeSystem getDefaultMJD_TAI();

    /// The scale.
    AbsoluteTimeScale getTimeScale() const { return scale_; }
    /// The moment that values are counted from.
    const DateTimeStruct& getEpoch() const { return epoch_; }
    /// First and last moment; both belong to the range.
    const std::pair<DateTimeStruct, DateTimeStruct>& getRange() const { return range_; }

    /// Checks and stores the epoch. The object is unchanged when the check raises.
    void setEpoch(const DateTimeStruct& epoch);
    /// Checks and stores the range. The object is unchanged when the check raises.
    void setRange(const std::pair<DateTimeStruct, DateTimeStruct>& range);

    /// Raises `InvalidTimeEpoch` when the epoch lies outside the default range of this object's scale. The range that
    /// the object holds plays no part.
    void checkEpoch(const DateTimeStruct& epoch) const;

    /// Raises `InvalidRange` when the range ends before it starts, and `InvalidTimeRange` when an end lies outside the
    /// default range of this object's scale. The epoch plays no part.
    void checkRange(const std::pair<DateTimeStruct, DateTimeStruct>& range) const;

    /// Whether scale, epoch and both ends of the range are equal.
    bool isEqual(const TimeSystem& other) const;

    /// The epoch as date and time.
    std::u16string getEpochStr() const;
    /// Both ends of the range as date and time.
    std::pair<std::u16string, std::u16string> getRangeStr() const;
    /// "tai", "gps", "utc", "posix", "jd" or "mjd".
    std::u16string getTimeScaleStr() const;
    /// The text of the scale; when this is not the default of the scale, then "e", the epoch, "L", the start and "H",
    /// the end of the range.
    std::u16string getTimeSystemStr() const;

  private:
    AbsoluteTimeScale scale_ = AbsoluteTimeScale::TAI;
    DateTimeStruct epoch_;
    std::pair<DateTimeStruct, DateTimeStruct> range_;
};

} // namespace QLDateTime
