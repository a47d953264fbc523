// A calendar date with a time of day, in plain fields: the value in which epochs and ranges of time are stated.
//
// Time scales with epoch and range: TimeSystem.h. Offsets: TimeZone.h. No calendar arithmetic is here: fields are held,
// compared and printed.
//   QLDateTime::DateTimeStruct t(2016, 12, 31, 23, 59, 60, 0.25);
//   t.getDateTimeStr(); // u"2016-12-31T23:59:60.250000000"
#pragma once

#include <string>
#include <vector>

#include "qlplatform/Export.h"

namespace QLDateTime {

/// Calendar fields of one moment. A plain copyable value; the fields hold whatever was stored.
struct QL_EXPORT DateTimeStruct {
    unsigned int reserved = 0;  ///< always 0; not compared
    long year = 0;              ///< any sign
    unsigned int month = 1;     ///< 1 to 12; only the low 8 bits count
    unsigned char day = 1;      ///< 1 to 31
    unsigned char hour = 0;     ///< 0 to 23
    unsigned char minute = 0;   ///< 0 to 59
    unsigned char second = 0;   ///< whole seconds, 0 to 60
    unsigned long fraction = 0; ///< fraction of a second in units of 2^-64 s

    /// The first instant of year 0.
    DateTimeStruct() = default;

    /// Stores the fields unchecked. `secondFraction`, in seconds from 0 up to but not including 1, is truncated to the
    /// units of `fraction`; a value outside goes to the nearest end, NaN to 0.
    DateTimeStruct(const long& year, const unsigned char& month, const unsigned char& day, const unsigned char& hour,
                   const unsigned char& minute, const unsigned char& second, const double& secondFraction);

    /// Whether year, month and day are equal.
    bool isSameDate(const DateTimeStruct& other) const;
    /// Whether the date, hour, minute and second are equal: clock fields of different days are not the same time.
    bool isSameTime(const DateTimeStruct& other) const;
    /// Whether all fields but `reserved` are equal.
    bool isEqual(const DateTimeStruct& other) const;
    /// Whether the first field that differs is the lower one here, from the year down to the fraction.
    bool isEarlierThan(const DateTimeStruct& other) const;
    /// Whether this is not later than `other`, by the same order.
    bool isEarlierThanOrEqual(const DateTimeStruct& other) const;
    /// Whether `other` is earlier, by the same order.
    bool isLaterThan(const DateTimeStruct& other) const;
    /// Whether this is not earlier than `other`, by the same order.
    bool isLaterThanOrEqual(const DateTimeStruct& other) const;

    /// Year-month-day: the year unpadded with its sign, month and day with two digits at least.
    std::u16string getDateStr() const;

    /// hour:minute:second, then a point and `digits` digits of the fraction, cut off and never rounded up. No point and
    /// no digits when `digits` is 0 or less, or when the fraction is below 10^-digits. The fraction is read as a
    /// double. Changes the thread's rounding mode for one formatting call and puts it back.
    std::u16string getTimeStr(int digits) const;

    /// The date, "T", and the time to nine digits.
    std::u16string getDateTimeStr() const;

    /// Checks six doubles (year, month, day, hour, minute, second) against the ranges of the fields, and nothing more:
    /// the 31st of February passes. Returns them with the second split into its whole part and the rest: seven values.
    /// Raises `InvalidTimeValue` when one of the first five is no whole number or out of its range (years go to
    /// 145000000000 on both sides), when the second's whole part modulo 256 is above 60, or when no int holds it.
    static std::vector<double> validateAndConvertToTimeVector(const double* v);
};

} // namespace QLDateTime
