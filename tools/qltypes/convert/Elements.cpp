#include "convert/Elements.h"

#include <charconv>
#include <cmath>
#include <cstdint>
#include <cstring>
#include <limits>
#include <stdexcept>
#include <type_traits>

#include <fmt/format.h>

#include "qltypes/fixed_point/BuiltInProps.h"

namespace inspector {
namespace {

constexpr int idBoolean = 8;

// Calls `work` with a value of the type that stores an element.
template <class Work> auto withElementType(int id, Work work) {
    switch (id) {
    case 0:
        return work(double());
    case 1:
        return work(float());
    case 2:
        return work(std::int8_t());
    case 4:
        return work(std::int16_t());
    case 5:
        return work(std::uint16_t());
    case 6:
        return work(std::int32_t());
    case 7:
        return work(std::uint32_t());
    default:
        return work(std::uint8_t()); // uint8 and boolean
    }
}

template <class T> T loaded(const std::byte* element) {
    T value;
    std::memcpy(&value, element, sizeof value);
    return value;
}

template <class T> T numberIn(int id, std::string_view text) {
    std::string_view digits = text;
    if (digits.size() > 1 && digits[0] == '+' && digits[1] != '-') digits.remove_prefix(1);
    T value{};
    const auto [end, error] = std::from_chars(digits.data(), digits.data() + digits.size(), value);
    if (error == std::errc::result_out_of_range)
        throw std::invalid_argument(fmt::format("'{}' is out of the range of {}", text, FXP::getBuiltInName(id)));
    // A minus sign is nothing that the reader of unsigned types knows.
    const bool isNegative = std::is_unsigned_v<T> && digits.size() > 1 && digits[0] == '-' &&
                            digits.find_first_not_of("0123456789", 1) == std::string_view::npos;
    if (isNegative)
        throw std::invalid_argument(fmt::format("'{}' is out of the range of {}", text, FXP::getBuiltInName(id)));
    if (error != std::errc() || end != digits.data() + digits.size())
        throw std::invalid_argument(fmt::format("'{}' is no value of {}", text, FXP::getBuiltInName(id)));
    return value;
}

std::uint8_t booleanIn(std::string_view text) {
    if (text == "1" || text == "true") return 1;
    if (text == "0" || text == "false") return 0;
    throw std::invalid_argument(fmt::format("'{}' is no value of boolean", text));
}

} // namespace

int builtInIdOf(std::string_view name) {
    for (int id = 0; id < FXP::numBuiltInProps; ++id) {
        if (name == FXP::getBuiltInName(id)) return id;
    }
    return -1;
}

std::size_t elementSize(int id) {
    return withElementType(id, [](auto value) { return sizeof value; });
}

void readElement(int id, std::string_view text, std::byte* dst) {
    withElementType(id, [&](auto value) {
        if (id == idBoolean)
            std::memset(dst, booleanIn(text), 1);
        else
            std::memcpy(dst, &(value = numberIn<decltype(value)>(id, text)), sizeof value);
    });
}

std::string elementText(int id, const std::byte* element) {
    return withElementType(id, [&](auto type) {
        const auto value = loaded<decltype(type)>(element);
        if constexpr (std::is_floating_point_v<decltype(type)>) {
            if (std::isnan(value)) return std::string("nan"); // the sign of no number says nothing
        }
        return fmt::format("{}", value);
    });
}

bool isNaN(int id, const std::byte* element) {
    return withElementType(id, [&](auto type) {
        if constexpr (std::is_floating_point_v<decltype(type)>)
            return std::isnan(loaded<decltype(type)>(element));
        else
            return false;
    });
}

bool isFinite(int id, const std::byte* element) {
    return withElementType(id, [&](auto type) {
        if constexpr (std::is_floating_point_v<decltype(type)>)
            return static_cast<bool>(std::isfinite(loaded<decltype(type)>(element)));
        else
            return true;
    });
}

} // namespace inspector
