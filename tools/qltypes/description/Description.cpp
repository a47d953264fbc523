#include "description/Description.h"

namespace inspector {

std::string toText(const Place& place) {
    if (place.within.empty()) return place.file;
    return place.file + (place.within.front() == '/' ? ": " : ":") + place.within;
}

InputError::InputError(const Place& place, const std::string& complaint)
    : std::runtime_error(toText(place) + ": " + complaint) {}

bool isWidthInRange(const std::vector<std::int64_t>& dimensions) {
    std::int64_t width = 1;
    for (const std::int64_t dimension : dimensions) {
        if (width > largestWidth / dimension) return false;
        width *= dimension;
    }
    return true;
}

} // namespace inspector
