#include "qltypes/date_time/DateTimeType.h"

#include <cstdio>
#include <tuple>

#include "qltypes/date_time/Text_internal.h"

namespace QLDateTime {

namespace {

constexpr fxpDataTypeProp cSignedFixed128 = {FXP_DT_FIXPT, 1, 128, 0, -64, 1.0, 0.0, 0};
constexpr fxpDataTypeProp cUnsignedFixed128 = {FXP_DT_FIXPT, 0, 128, 0, -64, 1.0, 0.0, 0};
constexpr fxpDataTypeProp cPosixCount = {FXP_DT_FIXPT, 0, 32, 0, 0, 1.0, 0.0, 0};
constexpr fxpDataTypeProp cDouble = {FXP_DT_DOUBLE, 1, 64, 11, 0, 1.0, 0.0, 0};

const fxpDataTypeProp& defaultStorage(AbsoluteTimeScale scale) {
    switch (scale) {
    case AbsoluteTimeScale::Posix:
        return cPosixCount;
    case AbsoluteTimeScale::JD_TAI:
    case AbsoluteTimeScale::MJD_TAI:
        return cDouble;
    default: // kept: a scale above MJD_TAI reads as MJD_TAI, yet has no double storage
        return cSignedFixed128;
    }
}

bool isSameStorage(const fxpDataTypeProp& a, const fxpDataTypeProp& b) {
    const auto compared = [](const fxpDataTypeProp& p) {
        return std::tie(p.DataTypeMode, p.Signedness, p.WordLength, p.ExponentLength, p.FixedExponent,
                        p.SlopeAdjustmentFactor, p.Bias); // kept: DataTypeOverrideOff is not compared
    };
    return compared(a) == compared(b);
}

std::string storageText(const fxpDataTypeProp& storage) {
    switch (storage.DataTypeMode) {
    case FXP_DT_FIXPT: {
        char text[40];
        std::snprintf(text, sizeof text, "%s%02de%02ld", storage.Signedness != 0 ? "s" : "", storage.WordLength,
                      -static_cast<long>(storage.FixedExponent));
        return text;
    }
    case FXP_DT_DOUBLE:
        return "double";
    default:
        return "single";
    }
}

} // namespace

DateTimeType::DateTimeType() : TimeSystem(AbsoluteTimeScale::TAI), storage_(cUnsignedFixed128) {}
DateTimeType::DateTimeType(const TimeSystem& system)
    : TimeSystem(system), storage_(defaultStorage(system.getTimeScale())) {}
DateTimeType::DateTimeType(const TimeSystem& system, const fxpDataTypeProp& storage)
    : TimeSystem(system), storage_(storage) {}
DateTimeType::~DateTimeType() = default;

DateTimeType DateTimeType::datetime_t(const AbsoluteTimeScale& scale) { return DateTimeType(TimeSystem(scale)); }

DateTimeType DateTimeType::datetime_t(const AbsoluteTimeScale& scale, const DateTimeStruct& epoch,
                                      const std::pair<DateTimeStruct, DateTimeStruct>& range) {
    return DateTimeType(createTimeSystem(scale, epoch, range));
}

DateTimeType DateTimeType::datetime_t(const AbsoluteTimeScale& scale, const DateTimeStruct& epoch,
                                      const std::pair<DateTimeStruct, DateTimeStruct>& range,
                                      const fxpDataTypeProp& storage) {
    return {createTimeSystem(scale, epoch, range), storage};
}

std::u16string DateTimeType::getDataTypeName() const {
    if (isSameStorage(storage_, defaultStorage(getTimeScale()))) return getTimeSystemStr();
    return getTimeSystemStr() + widened(storageText(storage_));
}

bool DateTimeType::isEqual(const DateTimeType& other) const {
    return TimeSystem::isEqual(other) && isSameStorage(storage_, other.storage_);
}

} // namespace QLDateTime
