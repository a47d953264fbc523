#include "qltypes/host/Assert_internal.h"
#include "qltypes/host/Failure_internal.h"
#include "qltypes/host/MessageCatalogue.h"

namespace QLTypeSys::failure {

void raise(const resource_core::BaseMsgID& message) { raise(diagnosticToRaise(message)); }

void raise(qlsvDiagnosticImpl* diagnostic) { qlsvThrowIExceptionFromDiagnostic(diagnostic, nullptr); }

void raiseOutOfMemory() { raise(qlsvCreateOutOfMemoryDiagnostic()); }

qlsvDiagnosticImpl* diagnosticToRaise(const resource_core::BaseMsgID& message) {
    QLTYPES_ASSERT(isInCatalogue(message));
    return qlsvCreateDiagnosticFromMessageID(message);
}

qlsvDiagnosticImpl* diagnosticOf(const resource_core::BaseMsgID& message) {
    QLTYPES_ASSERT(isInCatalogue(message));
    return qlsvCreateDiagnostic(message, "");
}

void append(qlsvDiagnosticImpl*& first, qlsvDiagnosticImpl* behind) {
    if (!behind || qlsvGetNumItemsInDiagnostic(behind) == 0 || behind == first) return;
    try {
        qlsvConcatenateDiagnosticsNoCheck(first, behind, true);
    } catch (...) {
        qlsvDiscardDiagnostic(behind);
        throw;
    }
}

qlsvDiagnosticImpl* withBlockName(qlsvDiagnosticImpl* diagnostic, const char* blockName) {
    if (!blockName || !*blockName) return diagnostic;
    return extended(diagnostic, [&] { return diagnosticOf(Quillane::DataType::BlockDataTypeError(blockName)); });
}

} // namespace QLTypeSys::failure
