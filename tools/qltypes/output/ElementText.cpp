#include "output/ElementText.h"

#include <cmath>
#include <functional>
#include <numeric>
#include <vector>

#include <fmt/format.h>
#include <fmt/ranges.h>

namespace inspector {

bool isArray(const ElementLayout& element) { return element.dimensions != std::vector<std::int64_t>{1}; }

std::int64_t numValues(const ElementLayout& element) {
    return std::accumulate(element.dimensions.begin(), element.dimensions.end(), std::int64_t{1}, std::multiplies<>());
}

std::string nameWithDimensions(const ElementLayout& element) {
    std::string text = element.name;
    if (!isArray(element)) return text;
    for (const std::int64_t dimension : element.dimensions)
        text += fmt::format("[{}]", dimension);
    return text;
}

std::string typeText(bool isComplex, const std::string& label) { return (isComplex ? "complex " : "") + label; }

std::string notesOf(const ElementLayout& element) {
    std::vector<std::string> notes;
    if (!element.unit.empty()) notes.push_back(fmt::format("unit {}", element.unit));
    if (std::isfinite(element.min)) notes.push_back(fmt::format("min {}", element.min));
    if (std::isfinite(element.max)) notes.push_back(fmt::format("max {}", element.max));
    if (element.isFrameBased) notes.push_back("frame based");
    if (element.hasVariableDimensions) notes.push_back("variable dimensions");
    if (element.move) notes.push_back(element.move->reason);
    return fmt::format("{}", fmt::join(notes, "; "));
}

} // namespace inspector
