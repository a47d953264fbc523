// Single values of the nine built-in types as texts and bytes.
#pragma once

#include <cstddef>
#include <string>
#include <string_view>

namespace inspector {

/// Bytes of the widest built-in type.
inline constexpr std::size_t maxElementSize = 8;

/// Identifier of the built-in type of that name, or -1.
int builtInIdOf(std::string_view name);

/// Bytes of an element. Unchecked: `id` must be 0 to 8.
std::size_t elementSize(int id);

/// Reads a decimal number, "inf" or "nan" for floating types, "true" or "false" for boolean, and writes the element to
/// `dst`. Throws std::invalid_argument, with a line that names the text, when it is no value of the type.
void readElement(int id, std::string_view text, std::byte* dst);

/// The shortest text that reads back as the element.
std::string elementText(int id, const std::byte* element);

/// Whether the element is no number.
bool isNaN(int id, const std::byte* element);

/// Whether the element is a finite number.
bool isFinite(int id, const std::byte* element);

} // namespace inspector
