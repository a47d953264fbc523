// How the stand-ins fail: a message of their own, or memory that ran out.
#pragma once

#include <utility>

#include "qlplatform/services/Diagnostics.h"

namespace hostservices {

template <class... Args> resource_core::BaseMsgID message(const char* category, const char* leaf, Args&&... args) {
    resource_core::BaseMsgID made(category, leaf, 0);
    (made.arguments.emplace_back(std::forward<Args>(args)), ...);
    return made;
}

/// Throws a message; arguments are long or std::string.
template <class... Args> [[noreturn]] void raise(const char* category, const char* leaf, Args&&... args) {
    qlsvDiagnosticImpl* diagnostic =
        qlsvCreateDiagnosticFromMessageID(message(category, leaf, std::forward<Args>(args)...));
    qlsvThrowIExceptionFromDiagnostic(diagnostic, nullptr);
}

[[noreturn]] inline void raiseOutOfMemory() {
    qlsvDiagnosticImpl* diagnostic = qlsvCreateOutOfMemoryDiagnostic();
    qlsvThrowIExceptionFromDiagnostic(diagnostic, nullptr);
}

} // namespace hostservices
