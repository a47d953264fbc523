// The division probe, apart from what it is measured on.
#pragma once

#include <array>

namespace FXPCORE {

/// Rounding of signed division from nine quotients: six of operands with different signs, whose exact values lie
/// between -2 and -1, then three of operands with the same sign, between 1 and 2.
int roundingFromQuotients(const std::array<int, 9>& quotients);

} // namespace FXPCORE
