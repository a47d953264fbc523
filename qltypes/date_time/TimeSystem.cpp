#include "qltypes/date_time/TimeSystem.h"

#include <algorithm>

#include "qltypes/host/Failure_internal.h"

namespace failure = QLTypeSys::failure;

namespace QLDateTime {

namespace {

struct Moment {
    long year;
    unsigned char month;
    unsigned char day;
    unsigned char second; // after midnight

    DateTimeStruct value() const { return {year, month, day, 0, 0, second, 0.0}; }
};

struct ScaleRow {
    AbsoluteTimeScale scale;
    const char16_t* text;
    Moment epoch;
    Moment first;
    Moment last;
};

constexpr Moment cEarliest = {-145000000000, 1, 1, 0};
constexpr Moment cLatest = {145000000000, 1, 1, 0};
constexpr Moment cLastLeapSecondDay = {2016, 12, 31, 0}; // kept: the day's start, not its end

// clang-format off
constexpr ScaleRow cScales[] = { // position is the scale's value
    {AbsoluteTimeScale::TAI,     u"tai",   {1970, 1, 1, 0},    cEarliest,          cLatest},
    {AbsoluteTimeScale::GPS,     u"gps",   {1980, 1, 6, 19},   {1980, 1, 6, 19},   cLatest},            // kept: 19 s into the day
    {AbsoluteTimeScale::UTC,     u"utc",   {1972, 1, 1, 0},    {1972, 1, 1, 0},    cLastLeapSecondDay},
    {AbsoluteTimeScale::Posix,   u"posix", {1972, 1, 1, 0},    {1970, 1, 1, 0},    cLastLeapSecondDay}, // kept: epoch of 1972
    {AbsoluteTimeScale::JD_TAI,  u"jd",    {1582, 10, 15, 0},  {1582, 10, 15, 0},  cLatest},
    {AbsoluteTimeScale::MJD_TAI, u"mjd",   {1858, 11, 17, 0},  {1858, 11, 17, 0},  cLatest},
};
// clang-format on

const ScaleRow& rowOf(AbsoluteTimeScale scale) {
    return cScales[std::min<std::size_t>(static_cast<unsigned int>(scale), std::size(cScales) - 1)];
}

bool liesOutside(const DateTimeStruct& first, const DateTimeStruct& last,
                 const std::pair<DateTimeStruct, DateTimeStruct>& range) {
    return first.isEarlierThan(range.first) || last.isLaterThan(range.second);
}

} // namespace

TimeSystem::TimeSystem(const AbsoluteTimeScale& scale)
    : scale_(rowOf(scale).scale), epoch_(rowOf(scale).epoch.value()),
      range_(rowOf(scale).first.value(), rowOf(scale).last.value()) {}

TimeSystem::TimeSystem(const AbsoluteTimeScale& scale, const DateTimeStruct& epoch,
                       const std::pair<DateTimeStruct, DateTimeStruct>& range)
    : scale_(scale), epoch_(epoch), range_(range) {}

TimeSystem::~TimeSystem() = default;

TimeSystem TimeSystem::createTimeSystem(const AbsoluteTimeScale& scale, const DateTimeStruct& epoch,
                                        const std::pair<DateTimeStruct, DateTimeStruct>& range) {
    TimeSystem made(scale);
    made.setEpoch(epoch);
    made.setRange(range);
    return made;
}

TimeSystem TimeSystem::getDefaultTAI() { return TimeSystem(AbsoluteTimeScale::TAI); }
TimeSystem TimeSystem::getDefaultGPS() { return TimeSystem(AbsoluteTimeScale::GPS); }
TimeSystem TimeSystem::getDefaultUTC() { return TimeSystem(AbsoluteTimeScale::UTC); }
TimeSystem TimeSystem::getDefaultPosix() { return TimeSystem(AbsoluteTimeScale::Posix); }
TimeSystem TimeSystem::getDefaultJD_TAI() { return TimeSystem(AbsoluteTimeScale::JD_TAI); }
TimeSystem TimeSystem::getDefaultMJD_TAI() { return TimeSystem(AbsoluteTimeScale::MJD_TAI); }

void TimeSystem::setEpoch(const DateTimeStruct& epoch) {
    checkEpoch(epoch);
    epoch_ = epoch;
}

void TimeSystem::setRange(const std::pair<DateTimeStruct, DateTimeStruct>& range) {
    checkRange(range);
    range_ = range;
}

void TimeSystem::checkEpoch(const DateTimeStruct& epoch) const {
    const TimeSystem standard(scale_);
    if (!liesOutside(epoch, epoch, standard.range_)) return;
    const auto [first, last] = standard.getRangeStr();
    failure::raise(failure::diagnosticOf(failure::message("Quillane:DateTime", "InvalidTimeEpoch", getTimeScaleStr(),
                                                          first, last, epoch.getDateTimeStr())));
}

void TimeSystem::checkRange(const std::pair<DateTimeStruct, DateTimeStruct>& range) const {
    if (range.second.isEarlierThan(range.first))
        failure::raise(failure::diagnosticOf(failure::message("Quillane:DateTime", "InvalidRange")));
    const TimeSystem standard(scale_);
    if (!liesOutside(range.first, range.second, standard.range_)) return;
    const auto [first, last] = standard.getRangeStr();
    failure::raise(
        failure::diagnosticOf(failure::message("Quillane:DateTime", "InvalidTimeRange", getTimeScaleStr(), first, last,
                                               range.first.getDateTimeStr(), range.second.getDateTimeStr())));
}

bool TimeSystem::isEqual(const TimeSystem& other) const {
    return scale_ == other.scale_ && epoch_.isEqual(other.epoch_) && range_.first.isEqual(other.range_.first) &&
           range_.second.isEqual(other.range_.second);
}

std::u16string TimeSystem::getEpochStr() const { return epoch_.getDateTimeStr(); }

std::pair<std::u16string, std::u16string> TimeSystem::getRangeStr() const {
    return {range_.first.getDateTimeStr(), range_.second.getDateTimeStr()};
}

std::u16string TimeSystem::getTimeScaleStr() const { return rowOf(scale_).text; }

std::u16string TimeSystem::getTimeSystemStr() const {
    if (isEqual(TimeSystem(scale_))) return getTimeScaleStr();
    const auto [first, last] = getRangeStr();
    return getTimeScaleStr() + u"e" + getEpochStr() + u"L" + first + u"H" + last;
}

} // namespace QLDateTime
