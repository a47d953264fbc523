#include "qlplatform/services/MessageTexts.h"

#include <string_view>

#include "qlplatform/strings/Strings.h"

namespace {

MessageTextTable* newestTable = nullptr;

struct ArgumentText : boost::static_visitor<std::string> {
    std::string operator()(long value) const { return std::to_string(value); }
    std::string operator()(const std::string& value) const { return value; }
    std::string operator()(const std::u16string& value) const { return qlsvUtf8FromUtf16(value); }
};

std::string argumentText(const resource_core::MsgArgument& argument) {
    return boost::apply_visitor(ArgumentText(), argument);
}

std::string textWithoutCatalogue(const resource_core::BaseMsgID& message) {
    std::string text = message.identifier();
    const char* separator = ": ";
    for (const resource_core::MsgArgument& argument : message.arguments) {
        text += separator;
        text += argumentText(argument);
        separator = ", ";
    }
    return text;
}

} // namespace

MessageTextTable::MessageTextTable(const MessageText* rows, std::size_t numRows)
    : rows_(rows), numRows_(numRows), next_(newestTable) {
    newestTable = this;
}

MessageTextTable::~MessageTextTable() {
    for (MessageTextTable** link = &newestTable; *link; link = &(*link)->next_) {
        if (*link == this) {
            *link = next_;
            return;
        }
    }
}

const char* qlsvFindMessageText(const resource_core::BaseMsgID& message) {
    for (const MessageTextTable* table = newestTable; table; table = table->next_) {
        for (std::size_t i = 0; i < table->numRows_; ++i) {
            const MessageText& row = table->rows_[i];
            if (message.leaf == row.leaf && message.category == row.category) return row.text;
        }
    }
    return nullptr;
}

std::string qlsvFormatMessage(const resource_core::BaseMsgID& message) {
    const char* found = qlsvFindMessageText(message);
    if (!found) return textWithoutCatalogue(message);
    const std::string_view pattern = found;
    std::string text;
    for (std::size_t i = 0; i < pattern.size(); ++i) {
        const bool isSlot = pattern[i] == '{' && i + 2 < pattern.size() && pattern[i + 2] == '}' &&
                            pattern[i + 1] >= '0' && pattern[i + 1] <= '9';
        if (!isSlot) {
            text += pattern[i];
            continue;
        }
        const std::size_t slot = static_cast<std::size_t>(pattern[i + 1] - '0');
        if (slot < message.arguments.size()) text += argumentText(message.arguments[slot]);
        i += 2;
    }
    return text;
}
