#include <stdexcept>

#include <gtest/gtest.h>

#include "qltypes/host/Failure_internal.h"
#include "tests/support/Raises.h"

namespace {

using namespace QLTypeSys::failure;
using foundation::core::except::IException;

[[noreturn]] void fail() { raise("QuillaneTypes:general", "InvalidDataTypeSize", "Bus", -3); }

TEST(Failure, AnExceptionCarriesItsMessageAndText) {
    EXPECT_RAISES(fail(), "QuillaneTypes:general:InvalidDataTypeSize", "Bus", -3);
    try {
        fail();
    } catch (const std::exception& e) {
        EXPECT_STREQ(e.what(), "size of 'Bus' cannot be -3: it must be above 0");
    }
}

TEST(Failure, AnExceptionCanBeCopiedAndOutlivesItsThrow) {
    std::exception_ptr kept;
    try {
        fail();
    } catch (...) {
        kept = std::current_exception();
    }
    EXPECT_RAISES(std::rethrow_exception(kept), "QuillaneTypes:general:InvalidDataTypeSize", "Bus", -3);
}

TEST(Failure, DiagnosticFromHandsTheMessageBack) {
    EXPECT_EQ(diagnosticFrom([] {}), nullptr);
    qlsvDiagnosticImpl* d = diagnosticFrom([] { fail(); });
    EXPECT_EQ(testsupport::describe(d), "QuillaneTypes:general:InvalidDataTypeSize('Bus', -3)");
    qlsvDiscardDiagnostic(d);
    EXPECT_EQ(d, nullptr);
}

TEST(Failure, ABlockNameIsTheSecondMessage) {
    for (const char* noName : {static_cast<const char*>(nullptr), ""}) {
        qlsvDiagnosticImpl* d = diagnosticFrom(noName, [] { fail(); });
        EXPECT_EQ(qlsvGetNumItemsInDiagnostic(d), 1);
        qlsvDiscardDiagnostic(d);
    }
    qlsvDiagnosticImpl* d = diagnosticFrom("model/Gain", [] { fail(); });
    EXPECT_EQ(testsupport::describe(d), "QuillaneTypes:general:InvalidDataTypeSize('Bus', -3)\n"
                                        "Quillane:DataType:BlockDataTypeError('model/Gain')");
    EXPECT_EQ(d->text(), "size of 'Bus' cannot be -3: it must be above 0\nthe failure concerns block 'model/Gain'");
    qlsvDiscardDiagnostic(d);
    EXPECT_EQ(diagnosticFrom("model/Gain", [] {}), nullptr);
}

TEST(Failure, SucceedsTellsOnlyWhether) {
    EXPECT_TRUE(succeeds([] {}));
    EXPECT_FALSE(succeeds([] { fail(); }));
}

TEST(Failure, OtherExceptionsPassThroughAllForms) {
    const auto foreign = [] { throw std::runtime_error("foreign"); };
    EXPECT_THROW(diagnosticFrom(foreign), std::runtime_error);
    EXPECT_THROW(diagnosticFrom("block", foreign), std::runtime_error);
    EXPECT_THROW(succeeds(foreign), std::runtime_error);
}

TEST(Failure, OutOfMemoryIsOneSharedDiagnostic) {
    EXPECT_RAISES(raiseOutOfMemory(), "Quillane:Services:OutOfMemory");
    qlsvDiagnosticImpl* d = diagnosticFrom("block", [] { raiseOutOfMemory(); });
    EXPECT_TRUE(d->isOutOfMemory());
    EXPECT_EQ(qlsvGetNumItemsInDiagnostic(d), 1);
    qlsvDiscardDiagnostic(d);
    EXPECT_EQ(d, nullptr);
    EXPECT_EQ(qlsvCreateOutOfMemoryDiagnostic(), qlsvCreateOutOfMemoryDiagnostic());
}

TEST(Failure, ANoArgumentMessageHasAnEmptyVector) {
    EXPECT_TRUE(message("QuillaneTypes:general", "InConsistentTargetToHostFcn").arguments.empty());
    const resource_core::BaseMsgID unassigned("c", "l", 2);
    EXPECT_EQ(testsupport::describe(unassigned), "c:l(0, 0)");
}

TEST(Failure, AForeignIExceptionBecomesItsText) {
    struct Own : IException {
        const char* what() const noexcept override { return "own text"; }
        const qlsvDiagnosticImpl* diagnostic() const noexcept override { return nullptr; }
    };
    qlsvDiagnosticImpl* d = diagnosticFrom([] { throw Own(); });
    EXPECT_EQ(d->text(), "own text");
    qlsvDiscardDiagnostic(d);
}

TEST(Failure, AWarningIsReportedAndConsumed) {
    static std::string seen;
    const qlsvWarningHandler before = qlsvSetWarningHandler([](const qlsvDiagnosticImpl& d) { seen = d.text(); });
    qlsvDiagnosticImpl* d = diagnosticFrom([] { fail(); });
    qlsvReportAsWarning(d);
    qlsvSetWarningHandler(before);
    EXPECT_EQ(d, nullptr);
    EXPECT_EQ(seen, "size of 'Bus' cannot be -3: it must be above 0");
}

TEST(Failure, ConcatenationToNothingTakesTheSecondOver) {
    qlsvDiagnosticImpl* first = nullptr;
    qlsvDiagnosticImpl* second = diagnosticFrom([] { fail(); });
    qlsvConcatenateDiagnosticsNoCheck(first, second, false);
    EXPECT_EQ(qlsvGetNumItemsInDiagnostic(first), 1);
    EXPECT_EQ(second, nullptr);
    qlsvDiscardDiagnostic(first);
}

} // namespace
