// The host functions that exist from the start.
#pragma once

#include <functional>
#include <map>
#include <string>

#include "qlplatform/services/HostFunctions.h"

namespace hostservices {

std::map<std::string, qlsvHostFunction, std::less<>> providedFunctions();

} // namespace hostservices
