// What the two error checkers have in common.
#pragma once

#include "qlplatform/services/Diagnostics.h"
#include "qlplatform/symbolic/QLSymbolicExprErrorChecker.h"
#include "qltypes/host/Assert_internal.h"
#include "qltypes/host/MessageCatalogue.h"
#include "qltypes/host/Messages.h"

namespace QLTypeSys {

/// Discards `diagnostic` when the checker is quiet; otherwise puts it behind the pending one, unless it is that one, is
/// null or has no messages. The pending one is never discarded.
inline void gatherDiagnostic(QL::QLSymbolicExprErrorChecker& checker, qlsvDiagnosticImpl* diagnostic) {
    if (diagnostic == checker.pending()) return;
    if (!checker.isQuiet() && qlsvGetNumItemsInDiagnostic(diagnostic) == 0) return;
    struct Discarding { // when quiet, and when there is no memory to put it behind the others
        qlsvDiagnosticImpl*& diagnostic;
        ~Discarding() { qlsvDiscardDiagnostic(diagnostic); }
    } const discarding{diagnostic};
    if (!checker.isQuiet()) qlsvConcatenateDiagnosticsNoCheck(checker.pending(), diagnostic, false);
}

/// A diagnostic that holds one message of the catalogue.
template <class... Args>
qlsvDiagnosticImpl* dimsDiagnostic(const char* category, const char* leaf, const Args&... args) {
    const resource_core::BaseMsgID message = failure::message(category, leaf, args...);
    QLTYPES_ASSERT(isInCatalogue(message));
    return qlsvCreateDiagnostic(message, "");
}

} // namespace QLTypeSys
