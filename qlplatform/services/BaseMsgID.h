// The record that carries one message: category, leaf and arguments.
//
// Texts are not here: see MessageTexts.h. Diagnostics made from messages: see Diagnostics.h.
#pragma once

#include <cstddef>
#include <string>
#include <utility>
#include <vector>

#include <boost/variant.hpp>

#include "qlplatform/Export.h"

namespace resource_core {

/// One argument of a message: an integer, a narrow text or a wide text.
using MsgArgument = boost::variant<long, std::string, std::u16string>;

/// A message identifier, written "category:leaf", with its arguments in order.
class QL_EXPORT BaseMsgID {
  public:
    /// A message with `numArguments` slots, each of which starts as long 0.
    BaseMsgID(std::string categoryName, std::string leafName, std::size_t numArguments)
        : arguments(numArguments, MsgArgument(0L)), category(std::move(categoryName)), leaf(std::move(leafName)) {}

    /// "category:leaf".
    std::string identifier() const { return category + ":" + leaf; }

    /// The arguments, in the order of the {n} slots of the text.
    std::vector<MsgArgument> arguments;
    /// What the message is about, such as "QuillaneTypes:general".
    std::string category;
    /// Which message of the category it is.
    std::string leaf;
};

} // namespace resource_core
