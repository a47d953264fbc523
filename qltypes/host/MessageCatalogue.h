// The catalogue: every message that the type service can raise, with its argument kinds and its English text.
#pragma once

#include <span>
#include <string_view>

#include "qlplatform/Export.h"
#include "qlplatform/services/BaseMsgID.h"

namespace QLTypeSys {

/// One message of the catalogue.
struct CatalogueRow {
    /// What the message is about.
    const char* category;
    /// Which message of the category it is.
    const char* leaf;
    std::string_view argumentKinds; ///< one letter an argument in order: L integer, S narrow text, W wide text
    const char* text;               ///< English, with {0}, {1} ... where the arguments go
};

/// All messages, grouped by category.
QL_EXPORT std::span<const CatalogueRow> messageCatalogue();

/// Whether the catalogue has a row with the message's category, leaf and argument kinds.
QL_EXPORT bool isInCatalogue(const resource_core::BaseMsgID& message);

} // namespace QLTypeSys
