// The text of one robot message definition.
//
// A field is "type name"; a type is a basic type, a message of the same package, "package/Message", or one of these
// with
// "[N]" (N elements) or "[]" (any number) behind it. "type NAME=value" is a constant and skipped, "#" begins a comment.
#pragma once

#include <string>
#include <string_view>
#include <vector>

#include "description/Description.h"

namespace inspector {

struct MessageField {
    ElementDescription element;  ///< its type is named as it is registered
    std::string message;         ///< "package/Message" where the type, or what an array holds, is one
    std::string elementOfMatrix; ///< of an array of any length: the name of what it holds
};

/// The fields of a definition in the given package, in order. int64 and uint64 keep their names, which are those of
/// fixed-point types of 64 bits; bool is boolean. Throws InputError with line and column.
std::vector<MessageField> parseMessage(const std::string& file, std::string_view package, std::string_view text);

/// The name that the structure of "package/Message" is registered under.
std::string registeredMessageName(std::string label);

} // namespace inspector
