// Texts about an element that the table for people and the pictures have in common.
#pragma once

#include <string>

#include "output/Layout.h"

namespace inspector {

/// Whether the element is anything but one value.
bool isArray(const ElementLayout& element);

/// The product of the dimensions.
std::int64_t numValues(const ElementLayout& element);

/// "y[2]", and "x" for one value.
std::string nameWithDimensions(const ElementLayout& element);

/// "complex single".
std::string typeText(bool isComplex, const std::string& label);

/// Unit, bounds, sampling, and why the element was moved; empty where there is nothing to say.
std::string notesOf(const ElementLayout& element);

} // namespace inspector
