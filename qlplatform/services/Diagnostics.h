// Diagnostics: one or more messages that are thrown as an exception or handed back to a caller.
//
//   qlsvDiagnosticImpl* d = DtSetDataTypeSize(table, "model/block", id, -3);
//   if (d) {
//       for (std::size_t i = 0; i < d->numItems(); ++i) puts(d->text(i).c_str());
//       qlsvDiscardDiagnostic(d);
//   }
#pragma once

#include <cstddef>
#include <string>
#include <vector>

#include "qlplatform/Export.h"
#include "qlplatform/services/BaseMsgID.h"
#include "qlplatform/services/IException.h"

/// A diagnostic: a list of messages, read by index. Whoever receives a pointer to one discards it.
class QL_EXPORT qlsvDiagnosticImpl {
  public:
    /// Number of messages, 1 or more.
    std::size_t numItems() const { return items_.size(); }

    /// The message at `index`. Unchecked: `index` must be below numItems().
    const resource_core::BaseMsgID& item(std::size_t index) const { return items_[index]; }

    /// The English text of the message at `index`. Unchecked as item().
    std::string text(std::size_t index) const;

    /// All texts, one a line, without a last newline.
    std::string text() const;

    /// True for the diagnostic that says that memory ran out.
    bool isOutOfMemory() const { return isOutOfMemory_; }

  private:
    friend struct DiagnosticAccess;
    qlsvDiagnosticImpl() = default;
    qlsvDiagnosticImpl(const qlsvDiagnosticImpl&) = default;

    std::vector<resource_core::BaseMsgID> items_;
    bool isOutOfMemory_ = false;
};

/// A new diagnostic that holds `message`. The caller owns it.
QL_EXPORT qlsvDiagnosticImpl* qlsvCreateDiagnosticFromMessageID(const resource_core::BaseMsgID& message);

/// The same; `component` names the reporting component and is not shown.
QL_EXPORT qlsvDiagnosticImpl* qlsvCreateDiagnostic(const resource_core::BaseMsgID& message,
                                                   const std::string& component);

/// The diagnostic that says that memory ran out. Allocates nothing; discarding it is allowed and does nothing.
QL_EXPORT qlsvDiagnosticImpl* qlsvCreateOutOfMemoryDiagnostic();

/// A new diagnostic with the messages that `exception` carries; the caller owns it. The out-of-memory diagnostic when
/// there is no memory for the copy. `keepDetails` is accepted for engines that tell the two forms apart.
QL_EXPORT qlsvDiagnosticImpl* qlsvCreateDiagnosticFromIException(const foundation::core::except::IException& exception,
                                                                 bool keepDetails);

/// Throws an exception derived from IException that takes `diagnostic` over, and nulls the pointer.
[[noreturn]] QL_EXPORT void qlsvThrowIExceptionFromDiagnostic(qlsvDiagnosticImpl*& diagnostic, const char* reserved);

/// Frees the diagnostic and nulls the pointer; a null pointer is allowed.
QL_EXPORT void qlsvDiscardDiagnostic(qlsvDiagnosticImpl*& diagnostic);

/// Appends the messages of `second` to `first`, frees `second` and nulls it. A null `first` takes `second` over as it
/// is. `linked` is accepted for engines that show the two as one report when it is true; the messages are the same.
QL_EXPORT void qlsvConcatenateDiagnosticsNoCheck(qlsvDiagnosticImpl*& first, qlsvDiagnosticImpl*& second, bool linked);

/// Number of messages held; 0 for null.
QL_EXPORT int qlsvGetNumItemsInDiagnostic(const qlsvDiagnosticImpl* diagnostic);

/// Receives what qlsvReportAsWarning reports.
using qlsvWarningHandler = void (*)(const qlsvDiagnosticImpl&);

/// Replaces the receiver of warnings and returns the one before; null restores the default, which writes one line a
/// message to standard error. Process-wide and unlocked.
QL_EXPORT qlsvWarningHandler qlsvSetWarningHandler(qlsvWarningHandler handler);

/// Reports the diagnostic as a warning, frees it and nulls the pointer.
QL_EXPORT void qlsvReportAsWarning(qlsvDiagnosticImpl*& diagnostic);
