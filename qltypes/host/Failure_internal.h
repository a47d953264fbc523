// How a failure leaves the library: one way to raise, one way to hand an exception back as a diagnostic.
#pragma once

#include "qlplatform/services/Diagnostics.h"
#include "qltypes/host/Messages.h"

namespace QLTypeSys::failure {

/// Throws the message as an exception derived from IException. The catalogue must have it (asserted in debug builds).
[[noreturn]] void raise(const resource_core::BaseMsgID& message);

/// Builds the message and throws it.
template <class... Args> [[noreturn]] void raise(const char* category, const char* leaf, Args&&... args) {
    raise(message(category, leaf, std::forward<Args>(args)...));
}

/// Throws a diagnostic, which the exception takes over.
[[noreturn]] void raise(qlsvDiagnosticImpl* diagnostic);

/// Throws the out-of-memory diagnostic.
[[noreturn]] void raiseOutOfMemory();

/// Throws a diagnostic that a function returned; nothing for null.
inline void passOn(qlsvDiagnosticImpl* diagnostic) {
    if (diagnostic) raise(diagnostic);
}

// The services make diagnostics in two ways, which a platform may tell apart: those that are raised, and those that
// name the component which returns them. No component has a name here.

/// A diagnostic that holds the message, as raise() makes it.
qlsvDiagnosticImpl* diagnosticToRaise(const resource_core::BaseMsgID& message);

/// A diagnostic that holds the message, for functions that return it instead of throwing.
qlsvDiagnosticImpl* diagnosticOf(const resource_core::BaseMsgID& message);

/// Puts `behind`, which it takes over, behind `first` when it holds a message and is another object.
void append(qlsvDiagnosticImpl*& first, qlsvDiagnosticImpl* behind);

/// Puts what `make` returns, another diagnostic, behind the diagnostic when there is one. When there is no memory for
/// that, the diagnostic is discarded.
template <class Make> qlsvDiagnosticImpl* extended(qlsvDiagnosticImpl* diagnostic, Make&& make) {
    if (!diagnostic) return nullptr;
    try {
        append(diagnostic, make());
    } catch (...) {
        qlsvDiscardDiagnostic(diagnostic);
        throw;
    }
    return diagnostic;
}

/// Puts BlockDataTypeError behind the diagnostic when there is one and `blockName` is neither null nor empty.
qlsvDiagnosticImpl* withBlockName(qlsvDiagnosticImpl* diagnostic, const char* blockName);

/// Runs `work`; null on success, else the diagnostic of the IException that it threw. Other exceptions pass.
template <class Work> qlsvDiagnosticImpl* diagnosticFrom(Work&& work) {
    try {
        work();
        return nullptr;
    } catch (const foundation::core::except::IException& e) {
        return qlsvCreateDiagnosticFromIException(e, true);
    }
}

/// The same with the block's name as second message of a failure.
template <class Work> qlsvDiagnosticImpl* diagnosticFrom(const char* blockName, Work&& work) {
    return withBlockName(diagnosticFrom(std::forward<Work>(work)), blockName);
}

/// Runs `work`; false when it threw an IException, whose diagnostic is discarded. Other exceptions pass.
template <class Work> bool succeeds(Work&& work) {
    qlsvDiagnosticImpl* diagnostic = diagnosticFrom(std::forward<Work>(work));
    const bool succeeded = !diagnostic;
    qlsvDiscardDiagnostic(diagnostic);
    return succeeded;
}

} // namespace QLTypeSys::failure
