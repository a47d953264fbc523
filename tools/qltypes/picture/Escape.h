// Texts as they must stand inside other formats.
#pragma once

#include <string>
#include <string_view>

namespace inspector {

/// As character data or an attribute's value of XML and HTML: markup is escaped, and characters that XML does not know,
/// as well as bytes that are no UTF-8, become U+FFFD.
std::string escapedForXml(std::string_view text);

} // namespace inspector
