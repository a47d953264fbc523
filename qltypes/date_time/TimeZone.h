// The offset of a time zone, in hours and minutes.
//
//   QLDateTime::TimeZone kathmandu(5, 45);
//   kathmandu.getOffsetSecond(); // 20700
//   kathmandu.getTimeZoneStr();  // u"+05:45"
#pragma once

#include <string>
#include <vector>

#include "qlplatform/Export.h"

namespace QLDateTime {

/// An offset. A plain copyable value; the fields hold whatever was stored and carry one sign together.
struct QL_EXPORT TimeZone {
    /// Hours ahead of (or, negative, behind) the reference.
    signed char hours = 0;
    /// Minutes beyond the hours, of the same sign.
    signed char minutes = 0;

    TimeZone() = default;
    TimeZone(signed char hours, signed char minutes);

    /// Stores both fields unchecked.
    void setTimeZone(signed char hours, signed char minutes);

    /// The offset in seconds.
    int getOffsetSecond() const;

    /// Sign, hours, a colon and minutes: "-" when either field is negative, two digits at least for each.
    std::u16string getTimeZoneStr() const;

    /// Checks two doubles, hours and minutes, and returns them. Accepted are whole hours from -12 to 14 with minutes of
    /// 0, 30, 45, or -30, where the two do not differ in sign. Raises `InvalidTimeZoneValue` for anything else.
    static std::vector<double> validateAndConvertToVector(const double* v);
};

} // namespace QLDateTime
