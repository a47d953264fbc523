#include "qlplatform/services/Diagnostics.h"

#include <cstdio>
#include <memory>
#include <new>

#include "qlplatform/services/MessageTexts.h"

using foundation::core::except::IException;
using resource_core::BaseMsgID;

/// Makes and edits diagnostics; the class itself can only be read.
struct DiagnosticAccess {
    static qlsvDiagnosticImpl* make(const BaseMsgID& message) {
        std::unique_ptr<qlsvDiagnosticImpl> made(new qlsvDiagnosticImpl);
        made->items_.push_back(message);
        return made.release();
    }
    static qlsvDiagnosticImpl* copy(const qlsvDiagnosticImpl& source) { return new qlsvDiagnosticImpl(source); }
    static std::vector<BaseMsgID>& items(qlsvDiagnosticImpl& d) { return d.items_; }

    // Never destroyed, so that it can be handed out while the process ends.
    static qlsvDiagnosticImpl& outOfMemory() {
        static qlsvDiagnosticImpl* const instance = [] {
            auto* d = new qlsvDiagnosticImpl;
            d->items_.emplace_back("Quillane:Services", "OutOfMemory", 0);
            d->isOutOfMemory_ = true;
            return d;
        }();
        return *instance;
    }
};

namespace {

constexpr MessageText serviceTexts[] = {
    {"Quillane:Services", "OutOfMemory", "memory ran out"},
    {"Quillane:Services", "ForeignException", "{0}"},
};
const MessageTextTable registeredTexts(serviceTexts, std::size(serviceTexts));

// Made while the library loads: handing it out later allocates nothing.
[[maybe_unused]] const qlsvDiagnosticImpl& outOfMemoryMadeAtLoad = DiagnosticAccess::outOfMemory();

void writeToStandardError(const qlsvDiagnosticImpl& d) {
    for (std::size_t i = 0; i < d.numItems(); ++i)
        std::fprintf(stderr, "warning: %s\n", d.text(i).c_str());
}
qlsvWarningHandler warningHandler = writeToStandardError;

class DiagnosticException final : public IException {
  public:
    explicit DiagnosticException(qlsvDiagnosticImpl* taken)
        : diagnostic_(taken, [](qlsvDiagnosticImpl* d) { qlsvDiscardDiagnostic(d); }) {
        if (taken->isOutOfMemory()) return; // its text must not need memory
        try {
            text_ = std::make_shared<const std::string>(taken->text());
        } catch (const std::bad_alloc&) { // what() then answers without a text of its own
        }
    }
    const char* what() const noexcept override { return text_ ? text_->c_str() : "memory ran out"; }
    const qlsvDiagnosticImpl* diagnostic() const noexcept override { return diagnostic_.get(); }

  private:
    std::shared_ptr<qlsvDiagnosticImpl> diagnostic_;
    std::shared_ptr<const std::string> text_;
};

} // namespace

IException::~IException() = default;

std::string qlsvDiagnosticImpl::text(std::size_t index) const { return qlsvFormatMessage(items_[index]); }

std::string qlsvDiagnosticImpl::text() const {
    std::string all;
    for (std::size_t i = 0; i < items_.size(); ++i) {
        if (i) all += '\n';
        all += text(i);
    }
    return all;
}

qlsvDiagnosticImpl* qlsvCreateDiagnosticFromMessageID(const BaseMsgID& message) {
    return DiagnosticAccess::make(message);
}

qlsvDiagnosticImpl* qlsvCreateDiagnostic(const BaseMsgID& message, const std::string&) {
    return DiagnosticAccess::make(message);
}

qlsvDiagnosticImpl* qlsvCreateOutOfMemoryDiagnostic() { return &DiagnosticAccess::outOfMemory(); }

qlsvDiagnosticImpl* qlsvCreateDiagnosticFromIException(const IException& exception, bool) {
    const qlsvDiagnosticImpl* carried = exception.diagnostic();
    if (carried && carried->isOutOfMemory()) return qlsvCreateOutOfMemoryDiagnostic();
    try {
        if (carried) return DiagnosticAccess::copy(*carried);
        BaseMsgID foreign("Quillane:Services", "ForeignException", 1);
        foreign.arguments[0] = std::string(exception.what());
        return DiagnosticAccess::make(foreign);
    } catch (const std::bad_alloc&) {
        return qlsvCreateOutOfMemoryDiagnostic();
    }
}

void qlsvThrowIExceptionFromDiagnostic(qlsvDiagnosticImpl*& diagnostic, const char*) {
    qlsvDiagnosticImpl* const taken = diagnostic;
    diagnostic = nullptr;
    throw DiagnosticException(taken);
}

void qlsvDiscardDiagnostic(qlsvDiagnosticImpl*& diagnostic) {
    if (diagnostic && !diagnostic->isOutOfMemory()) delete diagnostic;
    diagnostic = nullptr;
}

void qlsvConcatenateDiagnosticsNoCheck(qlsvDiagnosticImpl*& first, qlsvDiagnosticImpl*& second, bool) {
    if (!first) {
        first = second;
        second = nullptr;
        return;
    }
    if (!first->isOutOfMemory()) { // the shared one holds its one message for ever
        std::vector<BaseMsgID>& target = DiagnosticAccess::items(*first);
        const std::vector<BaseMsgID>& source = DiagnosticAccess::items(*second);
        target.insert(target.end(), source.begin(), source.end());
    }
    qlsvDiscardDiagnostic(second);
}

int qlsvGetNumItemsInDiagnostic(const qlsvDiagnosticImpl* diagnostic) {
    return diagnostic ? static_cast<int>(diagnostic->numItems()) : 0;
}

qlsvWarningHandler qlsvSetWarningHandler(qlsvWarningHandler handler) {
    const qlsvWarningHandler before = warningHandler;
    warningHandler = handler ? handler : writeToStandardError;
    return before;
}

void qlsvReportAsWarning(qlsvDiagnosticImpl*& diagnostic) {
    if (diagnostic) warningHandler(*diagnostic);
    qlsvDiscardDiagnostic(diagnostic);
}
