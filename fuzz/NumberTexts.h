// What the two targets of number texts share: how a reading ended, and when two records are the same.
#pragma once

#include <bit>
#include <cmath>
#include <cstdint>
#include <string_view>

#include <boost/lexical_cast/bad_lexical_cast.hpp>

#include "qlplatform/services/IException.h"
#include "tests/fixed_point/Props.h"
#include "tests/fixed_point/Reference.h"

namespace fuzz {

/// How `read` ends; any exception beside the two that readers throw passes.
template <class Read> reference::Ending endingOf(Read read) {
    try {
        read();
        return reference::Ending::read;
    } catch (const foundation::core::except::IException&) {
        return reference::Ending::invalid;
    } catch (const boost::bad_lexical_cast&) {
        return reference::Ending::badCast;
    }
}

/// Whether both text forms can hold the record, so that it comes back the same.
inline bool survivesWriting(const fxpDataTypeProp& prop) {
    return prop.validateFxpDTProp() && !(prop.Bias == 0.0 && std::signbit(prop.Bias));
}

} // namespace fuzz
