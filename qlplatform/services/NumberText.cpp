#include "qlplatform/services/NumberText.h"

#include <cerrno>
#include <cfenv>
#include <charconv>
#include <clocale>
#include <cmath>
#include <cstdlib>

class utFpcContext {
  public:
    locale_t plainLocale() const { return plainLocale_; }

  private:
    locale_t plainLocale_ =
        newlocale(LC_ALL_MASK, "C", nullptr); // never freed: the context lives as long as the process
};

namespace {

/// Rounds to nearest for its lifetime.
class NearestRounding {
  public:
    NearestRounding() : before_(std::fegetround()) {
        if (before_ != FE_TONEAREST) std::fesetround(FE_TONEAREST);
    }
    ~NearestRounding() {
        if (before_ != FE_TONEAREST) std::fesetround(before_);
    }
    NearestRounding(const NearestRounding&) = delete;
    NearestRounding& operator=(const NearestRounding&) = delete;

  private:
    int before_;
};

} // namespace

std::string qlsv_dtoa(double value, bool keepPoint) {
    if (std::isnan(value)) return "nan";
    const double magnitude = std::fabs(value);
    const bool isPlain = magnitude == 0.0 || (magnitude >= 1e-4 && magnitude < 1e16);
    char buffer[32];
    const auto written = std::to_chars(buffer, buffer + sizeof buffer, value,
                                       isPlain ? std::chars_format::fixed : std::chars_format::scientific);
    std::string text(buffer, written.ptr);
    if (std::isinf(value)) return text;
    if (isPlain) {
        if (keepPoint && text.find('.') == std::string::npos) text += ".0";
    } else if (const std::size_t firstDigit = text.find('e') + 2; text[firstDigit] == '0') {
        text.erase(firstDigit, 1); // two digits at least are written
    }
    return text;
}

std::string qlsv_dtoa_fitools(double value) { return qlsv_dtoa(value, false); }

const utFpcContext* utGetFpcContext() {
    static const utFpcContext* const context = new utFpcContext;
    return context;
}

double ut_strtod(const utFpcContext* context, const char* text, char** end, int* error) {
    const NearestRounding nearest;
    const int errnoBefore = errno;
    errno = 0;
    char* behind;
    const double value = strtod_l(text, &behind, context->plainLocale());
    if (end) *end = behind;
    if (error) *error = behind == text ? utStrtodNoNumber : errno == ERANGE ? utStrtodOutOfRange : utStrtodOk;
    errno = errnoBefore;
    return value;
}
