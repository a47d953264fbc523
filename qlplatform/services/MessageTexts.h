// English texts of messages. A library that raises messages registers one table of rows; diagnostics then read as text.
//
// A text holds {0}, {1} ... where the arguments go. A message with no registered text reads as its identifier and
// its arguments, so no message is ever silent.
#pragma once

#include <cstddef>
#include <string>

#include "qlplatform/Export.h"
#include "qlplatform/services/BaseMsgID.h"

/// One registered text. All pointers have static storage.
struct MessageText {
    /// The category of the message.
    const char* category;
    /// The leaf of the message.
    const char* leaf;
    /// The English text, with {0}, {1} ... where the arguments go.
    const char* text;
};

/// Registers `numRows` rows that stay where they are for the life of the process, or until they are taken back.
class QL_EXPORT MessageTextTable {
  public:
    MessageTextTable(const MessageText* rows, std::size_t numRows);
    ~MessageTextTable();
    MessageTextTable(const MessageTextTable&) = delete;
    MessageTextTable& operator=(const MessageTextTable&) = delete;

  private:
    friend const char* qlsvFindMessageText(const resource_core::BaseMsgID&);
    const MessageText* rows_;
    std::size_t numRows_;
    MessageTextTable* next_; // the table registered before this one; not owned
};

/// The registered text of a message with its {n} slots as they stand, or null when none is registered.
QL_EXPORT const char* qlsvFindMessageText(const resource_core::BaseMsgID& message);

/// The English text of a message with its arguments filled in; wide arguments are shown as UTF-8.
QL_EXPORT std::string qlsvFormatMessage(const resource_core::BaseMsgID& message);
