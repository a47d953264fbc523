#include "qltypes/host/Assert_internal.h"
#include "qltypes/host/Failure_internal.h"
#include "qltypes/host/MessageCatalogue.h"

namespace QLTypeSys::failure {

void raise(const resource_core::BaseMsgID& message) {
    qlsvDiagnosticImpl* diagnostic = diagnosticOf(message);
    qlsvThrowIExceptionFromDiagnostic(diagnostic, nullptr);
}

void raiseOutOfMemory() {
    qlsvDiagnosticImpl* diagnostic = qlsvCreateOutOfMemoryDiagnostic();
    qlsvThrowIExceptionFromDiagnostic(diagnostic, nullptr);
}

qlsvDiagnosticImpl* diagnosticOf(const resource_core::BaseMsgID& message) {
    QLTYPES_ASSERT(isInCatalogue(message));
    return qlsvCreateDiagnosticFromMessageID(message);
}

void append(qlsvDiagnosticImpl*& first, qlsvDiagnosticImpl* behind) {
    if (behind && qlsvGetNumItemsInDiagnostic(behind) > 0 && behind != first)
        qlsvConcatenateDiagnosticsNoCheck(first, behind, true);
}

qlsvDiagnosticImpl* withBlockName(qlsvDiagnosticImpl* diagnostic, const char* blockName) {
    if (diagnostic && blockName && *blockName)
        append(diagnostic, diagnosticOf(Quillane::DataType::BlockDataTypeError(blockName)));
    return diagnostic;
}

} // namespace QLTypeSys::failure
