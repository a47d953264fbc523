// JSON as the subcommands print it.
#pragma once

#include <string>

#include <nlohmann/json.hpp>

namespace inspector {

/// The document, indented by two, with a line end. Bytes that are no UTF-8 become replacement characters.
std::string jsonText(const nlohmann::ordered_json& document);

} // namespace inspector
