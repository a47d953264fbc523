// The base of every exception that the type service throws.
#pragma once

#include <exception>

#include "qlplatform/Export.h"

class qlsvDiagnosticImpl;

namespace foundation::core::except {

/// An exception that carries a diagnostic; what() is the diagnostic's English text.
class QL_EXPORT IException : public std::exception {
  public:
    ~IException() override;

    /// The diagnostic that was thrown, owned by the exception; null where a client's own exception carries none.
    virtual const qlsvDiagnosticImpl* diagnostic() const noexcept = 0;
};

} // namespace foundation::core::except
