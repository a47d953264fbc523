// Ties the references of a description to what they mean, and finds an order in which the types can be registered.
#pragma once

#include <cstddef>
#include <functional>
#include <string>
#include <vector>

#include "description/Description.h"

namespace inspector {

/// The indices of `description.types` in an order in which each type comes after those that it refers to; types that
/// are free to choose keep their order. `isKnown` says of a name that no description has whether it needs none.
///
/// Throws InputError, at the place concerned, for a name that is described twice or that `isKnown` knows, for a
/// reference to a name that is neither described nor known, and for a cycle.
std::vector<std::size_t> registrationOrder(const Description& description,
                                           const std::function<bool(const std::string&)>& isKnown);

} // namespace inspector
