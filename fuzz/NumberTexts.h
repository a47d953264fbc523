// What the two targets of number texts share: how a reading ended, and when two records are the same.
#pragma once

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

/// Whether `again`, read from what was written of `prop`, is the same record. Records that differ only in the sign of a
/// zero bias share their texts, so that sign may come from another record.
inline bool cameBack(const fxpDataTypeProp& prop, fxpDataTypeProp again) {
    if (prop.Bias == 0.0 && again.Bias == 0.0) again.Bias = prop.Bias;
    return again == prop;
}

} // namespace fuzz
