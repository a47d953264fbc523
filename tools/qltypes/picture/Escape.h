// Texts as they must stand inside other formats.
#pragma once

#include <string>
#include <string_view>

#include <nlohmann/json_fwd.hpp>

namespace inspector {

/// As character data or an attribute's value of XML and HTML: markup is escaped, and characters that XML does not know,
/// as well as bytes that are no UTF-8, become U+FFFD.
std::string escapedForXml(std::string_view text);

/// JSON that can stand inside a script element: ASCII without any less-than sign. Bytes that are no UTF-8 become
/// U+FFFD.
std::string jsonForScript(const nlohmann::ordered_json& json);

} // namespace inspector
