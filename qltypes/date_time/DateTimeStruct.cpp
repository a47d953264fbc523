#include "qltypes/date_time/DateTimeStruct.h"

#include <algorithm>
#include <cfenv>
#include <limits>
#include <locale>
#include <sstream>
#include <tuple>

#include "qltypes/date_time/Text_internal.h"
#include "qltypes/host/Failure_internal.h"

namespace failure = QLTypeSys::failure;

namespace QLDateTime {

namespace {

constexpr double cTwoTo64 = 18446744073709551616.0;

unsigned long fractionOf(double seconds) {
    if (!(seconds > 0.0)) return 0;
    if (seconds >= 1.0) return std::numeric_limits<unsigned long>::max();
    return static_cast<unsigned long>(seconds * cTwoTo64);
}

unsigned int monthOf(const DateTimeStruct& t) { return t.month & 0xFFu; }

auto dateFields(const DateTimeStruct& t) { return std::make_tuple(t.year, monthOf(t), t.day); }
auto timeFields(const DateTimeStruct& t) { return std::tuple_cat(dateFields(t), std::tie(t.hour, t.minute, t.second)); }
auto allFields(const DateTimeStruct& t) { return std::tuple_cat(timeFields(t), std::tie(t.fraction)); }

class DownwardRounding {
  public:
    DownwardRounding() { std::fesetround(FE_DOWNWARD); }
    ~DownwardRounding() { std::fesetround(before_); }
    DownwardRounding(const DownwardRounding&) = delete;
    DownwardRounding& operator=(const DownwardRounding&) = delete;

  private:
    const int before_ = std::fegetround();
};

// "0." and the digits; the formatting of streams honours the rounding mode.
std::string fixedDownward(double value, int digits) {
    std::ostringstream text;
    text.imbue(std::locale::classic());
    text.setf(std::ios_base::fixed, std::ios_base::floatfield);
    text.precision(digits);
    const DownwardRounding downward;
    text << value;
    return text.str();
}

struct FieldRange {
    double least;
    double greatest;
};
constexpr FieldRange cFieldRanges[] = {
    {-145000000000.0, 145000000000.0}, // year
    {1, 12},                           // month
    {1, 31},                           // day
    {0, 23},                           // hour
    {0, 59},                           // minute
};
constexpr unsigned char cGreatestSecond = 60;

[[noreturn]] void raiseInvalidTimeValue() {
    failure::raise(failure::diagnosticOf(failure::message("Quillane:DateTime", "InvalidTimeValue")));
}

} // namespace

DateTimeStruct::DateTimeStruct(const long& year_, const unsigned char& month_, const unsigned char& day_,
                               const unsigned char& hour_, const unsigned char& minute_, const unsigned char& second_,
                               const double& secondFraction)
    : year(year_), month(month_), day(day_), hour(hour_), minute(minute_), second(second_),
      fraction(fractionOf(secondFraction)) {}

bool DateTimeStruct::isSameDate(const DateTimeStruct& other) const { return dateFields(*this) == dateFields(other); }
bool DateTimeStruct::isSameTime(const DateTimeStruct& other) const { return timeFields(*this) == timeFields(other); }
bool DateTimeStruct::isEqual(const DateTimeStruct& other) const { return allFields(*this) == allFields(other); }
bool DateTimeStruct::isEarlierThan(const DateTimeStruct& other) const { return allFields(*this) < allFields(other); }
bool DateTimeStruct::isEarlierThanOrEqual(const DateTimeStruct& other) const {
    return allFields(*this) <= allFields(other);
}
bool DateTimeStruct::isLaterThan(const DateTimeStruct& other) const { return other.isEarlierThan(*this); }
bool DateTimeStruct::isLaterThanOrEqual(const DateTimeStruct& other) const { return other.isEarlierThanOrEqual(*this); }

std::u16string DateTimeStruct::getDateStr() const {
    return widened(std::to_string(year) + "-" + twoDigits(monthOf(*this)) + "-" + twoDigits(day));
}

std::u16string DateTimeStruct::getTimeStr(int digits) const {
    std::string text = twoDigits(hour) + ":" + twoDigits(minute) + ":" + twoDigits(second);
    if (digits <= 0) return widened(text);

    const double f = static_cast<double>(fraction) / cTwoTo64; // 1.0 for the last 1024 values
    const double lastPlace = std::pow(10.0, -digits);
    if (f < lastPlace) return widened(text);
    if (f > 1.0 - lastPlace)
        text += "." + std::string(static_cast<std::size_t>(digits), '9'); // no carry into the seconds
    else
        text +=
            fixedDownward(f, digits).substr(1); // kept: a 1.0 that no digit count tells from 1 - lastPlace gives zeros
    return widened(text);
}

std::u16string DateTimeStruct::getDateTimeStr() const { return getDateStr() + u"T" + getTimeStr(9); }

std::vector<double> DateTimeStruct::validateAndConvertToTimeVector(const double* v) {
    constexpr std::size_t numWhole = std::size(cFieldRanges);
    if (!std::all_of(v, v + numWhole, isWholeNumber)) raiseInvalidTimeValue();
    for (std::size_t i = 0; i < numWhole; ++i)
        if (v[i] < cFieldRanges[i].least || v[i] > cFieldRanges[i].greatest) raiseInvalidTimeValue();

    const double whole = std::trunc(v[numWhole]);
    if (!(whole >= std::numeric_limits<int>::min() && whole <= std::numeric_limits<int>::max()))
        raiseInvalidTimeValue();
    const auto second = static_cast<unsigned char>(static_cast<int>(whole)); // kept: 256.5 and -0.5 pass as second 0
    if (second > cGreatestSecond) raiseInvalidTimeValue();

    std::vector<double> checked(v, v + numWhole);
    checked.push_back(second);
    checked.push_back(v[numWhole] - second);
    return checked;
}

} // namespace QLDateTime
