#include "qltypes/date_time/TimeZone.h"

#include <cstdlib>

#include "qltypes/date_time/Text_internal.h"
#include "qltypes/host/Failure_internal.h"

namespace failure = QLTypeSys::failure;

namespace QLDateTime {

TimeZone::TimeZone(signed char hours_, signed char minutes_) { setTimeZone(hours_, minutes_); }

void TimeZone::setTimeZone(signed char hours_, signed char minutes_) {
    hours = hours_;
    minutes = minutes_;
}

int TimeZone::getOffsetSecond() const { return hours * 3600 + minutes * 60; }

std::u16string TimeZone::getTimeZoneStr() const {
    const auto field = [](signed char value) { return twoDigits(static_cast<unsigned int>(std::abs(value))); };
    return widened((hours < 0 || minutes < 0 ? "-" : "+") + field(hours) + ":" + field(minutes));
}

std::vector<double> TimeZone::validateAndConvertToVector(const double* v) {
    const double h = v[0];
    const double m = v[1];
    const bool isOffset = isWholeNumber(h) && isWholeNumber(m) && h >= -12 && h <= 14 &&
                          (m == 0 || m == 30 || m == -30 || m == 45) && // kept: there is no -45
                          !(h < 0 && m > 0) && !(m < 0 && h > 0);
    if (!isOffset) failure::raise(failure::diagnosticOf(failure::message("Quillane:DateTime", "InvalidTimeZoneValue")));
    return {h, m};
}

} // namespace QLDateTime
