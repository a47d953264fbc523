#include <algorithm>
#include <new>
#include <stdexcept>

#include <gtest/gtest.h>

#include "qlplatform/services/Diagnostics.h"
#include "qlplatform/services/HostFunctions.h"
#include "tests/support/FailingAllocations.h"

namespace {

/// A host function that exists for one test.
class Registered {
  public:
    Registered(std::string name, qlsvHostFunction function) : name_(std::move(name)) {
        before_ = qlsvSetHostFunction(name_, std::move(function));
    }
    ~Registered() { qlsvSetHostFunction(name_, std::move(before_)); }

  private:
    std::string name_;
    qlsvHostFunction before_;
};

/// Calls for one output without input; the diagnostic as text.
std::string call(const char* name, txArrayPtr& result) {
    txArray_tag* output = reinterpret_cast<txArray_tag*>(&result); // must be overwritten, also on failure
    qlsvDiagnosticImpl* d = qlsvFEVAL_NoThrow(1, &output, 0, nullptr, name, true, nullptr);
    result.reset(output);
    const std::string text = testsupport::describe(d);
    qlsvDiscardDiagnostic(d);
    return text;
}

TEST(HostFunctions, AFunctionGetsItsInputsAndGivesItsOutputs) {
    const Registered swapped("swap", [](qlsvOutputs outputs, qlsvInputs inputs) {
        EXPECT_EQ(outputs.size(), 2u);
        outputs[0] = TxArrayUtil::SafeCreateSharedCopy(inputs[1]);
        outputs[1] = TxArrayUtil::SafeCreateSharedCopy(inputs[0]);
    });
    const txArrayPtr first(txCreateString("first"));
    const txArrayPtr second(txCreateString("second"));
    txArray_tag* inputs[] = {first.get(), second.get()};
    txArray_tag* outputs[2] = {};
    EXPECT_EQ(qlsvFEVAL_NoThrow(2, outputs, 2, inputs, "swap", true, txDestroyArray), nullptr);
    EXPECT_EQ(txArrayToUTF8StdString(outputs[0]), "second");
    EXPECT_EQ(txArrayToUTF8StdString(outputs[1]), "first");
    txDestroyArray(outputs[0]);
    txDestroyArray(outputs[1]);
}

TEST(HostFunctions, CountsBelowOneMeanNone) {
    const Registered counted("count", [](qlsvOutputs outputs, qlsvInputs inputs) {
        EXPECT_TRUE(outputs.empty());
        EXPECT_TRUE(inputs.empty());
    });
    EXPECT_EQ(qlsvFEVAL_NoThrow(0, nullptr, -1, nullptr, "count", true, nullptr), nullptr);
}

TEST(HostFunctions, AnUnknownNameIsADiagnostic) {
    txArrayPtr result;
    EXPECT_EQ(call("noSuchFunction", result), "Quillane:HostFunctions:UnknownHostFunction('noSuchFunction')");
    EXPECT_EQ(call("", result), "Quillane:HostFunctions:UnknownHostFunction('')");
    EXPECT_EQ(call(nullptr, result), "Quillane:HostFunctions:UnknownHostFunction('')");
    EXPECT_EQ(result, nullptr);
}

TEST(HostFunctions, WhateverIsThrownBecomesADiagnostic) {
    struct Row {
        const char* expected;
        void (*fail)();
    };
    const Row rows[] = {
        {"Quillane:Arrays:NoSuchCell(0, '')", [] { txSetCell(nullptr, 0, nullptr); }},
        {"Quillane:Services:OutOfMemory()", [] { throw std::bad_alloc(); }},
        {"Quillane:HostFunctions:HostFunctionFailed('fail', 'lost')", [] { throw std::runtime_error("lost"); }},
        {"Quillane:HostFunctions:HostFunctionFailed('fail', 'it threw something that is no exception')",
         [] { throw 42; }},
    };
    for (const Row& row : rows) {
        SCOPED_TRACE(row.expected);
        const Registered failing("fail", [&row](qlsvOutputs, qlsvInputs) { row.fail(); });
        txArrayPtr result;
        EXPECT_EQ(call("fail", result), row.expected);
        EXPECT_EQ(result, nullptr);
    }
}

TEST(HostFunctions, AMissingOutputIsADiagnostic) {
    const Registered lazy("lazy", [](qlsvOutputs outputs, qlsvInputs) { outputs[0].reset(txCreateDoubleScalar(1)); });
    txArray_tag* outputs[2] = {};
    const std::size_t before = txGetNumLiveArrays();
    qlsvDiagnosticImpl* d = qlsvFEVAL_NoThrow(2, outputs, 0, nullptr, "lazy", true, nullptr);
    EXPECT_EQ(testsupport::describe(d), "Quillane:HostFunctions:MissingOutput('lazy', 1)");
    qlsvDiscardDiagnostic(d);
    EXPECT_EQ(outputs[0], nullptr);
    EXPECT_EQ(txGetNumLiveArrays(), before);
}

TEST(HostFunctions, WhatAFailedFunctionGaveGoesToTheDeleter) {
    const Registered halfway("halfway", [](qlsvOutputs outputs, qlsvInputs) {
        outputs[0].reset(txCreateDoubleScalar(1));
        throw std::runtime_error("then it broke");
    });
    static int numDeleted;
    numDeleted = 0;
    txArray_tag* output = nullptr;
    const std::size_t before = txGetNumLiveArrays();
    qlsvDiagnosticImpl* d = qlsvFEVAL_NoThrow(1, &output, 0, nullptr, "halfway", true, [](txArray_tag* array) {
        ++numDeleted;
        txDestroyArray(array);
    });
    qlsvDiscardDiagnostic(d);
    EXPECT_EQ(numDeleted, 1);
    EXPECT_EQ(txGetNumLiveArrays(), before);
}

TEST(HostFunctions, SettingReplacesAndEmptyRemoves) {
    const auto giving = [](double value) {
        return [value](qlsvOutputs outputs, qlsvInputs) { outputs[0].reset(txCreateDoubleScalar(value)); };
    };
    EXPECT_FALSE(qlsvSetHostFunction("answer", giving(1)));
    qlsvHostFunction first = qlsvSetHostFunction("answer", giving(2));
    ASSERT_TRUE(first);
    const auto has = [](const std::string& name) {
        const std::vector<std::string> names = qlsvGetHostFunctionNames();
        EXPECT_TRUE(std::is_sorted(names.begin(), names.end()));
        return std::find(names.begin(), names.end(), name) != names.end();
    };
    EXPECT_TRUE(has("answer"));
    EXPECT_TRUE(qlsvSetHostFunction("answer", {}));
    EXPECT_FALSE(has("answer"));
    EXPECT_FALSE(qlsvSetHostFunction("answer", {}));
    txArrayPtr result;
    first({&result, 1}, {});
    EXPECT_EQ(*static_cast<const double*>(txGetData(result.get())), 1);
}

TEST(HostFunctions, AFunctionMayRemoveItselfWhileItRuns) {
    auto alive = std::make_shared<int>(5);
    qlsvSetHostFunction("once", [alive](qlsvOutputs outputs, qlsvInputs) {
        qlsvSetHostFunction("once", {});
        outputs[0].reset(txCreateDoubleScalar(*alive));
    });
    txArrayPtr result;
    EXPECT_EQ(call("once", result), "no diagnostic");
    EXPECT_NE(result, nullptr);
    EXPECT_EQ(call("once", result), "Quillane:HostFunctions:UnknownHostFunction('once')");
    EXPECT_EQ(alive.use_count(), 1);
}

TEST(HostFunctions, TheProvidedOnesExist) {
    const std::vector<std::string> names = qlsvGetHostFunctionNames();
    for (const char* name : {"double", "single", "int8", "uint8", "int16", "uint16", "int32", "uint32", "int64",
                             "uint64", "logical", "boolean", "complex", "real"}) {
        EXPECT_TRUE(std::binary_search(names.begin(), names.end(), name)) << name;
        txArrayPtr result;
        EXPECT_EQ(call(name, result),
                  std::string("Quillane:HostFunctions:WrongNumberOfArguments('") + name + "', 0, 1)");
    }
}

TEST(LocalScope, ArraysGoWithTheirScope) {
    const std::size_t before = txGetNumLiveArrays();
    {
        const qlsvLocalScope outer;
        qlsvSetLocalScope(txCreateDoubleScalar(1));
        {
            const qlsvLocalScope inner;
            qlsvSetLocalScope(txCreateDoubleScalar(2));
            qlsvSetLocalScope(txCreateDoubleScalar(3));
            EXPECT_EQ(txGetNumLiveArrays(), before + 3);
        }
        EXPECT_EQ(txGetNumLiveArrays(), before + 1);
        qlsvSetLocalScope(txCreateDoubleScalar(4));
        EXPECT_EQ(txGetNumLiveArrays(), before + 2);
    }
    EXPECT_EQ(txGetNumLiveArrays(), before);
}

TEST(LocalScope, AHostFunctionHasItsOwn) {
    const Registered scoped("scoped", [](qlsvOutputs outputs, qlsvInputs) {
        qlsvSetLocalScope(txCreateDoubleScalar(1));
        outputs[0].reset(txCreateDoubleScalar(2));
    });
    const std::size_t before = txGetNumLiveArrays();
    txArrayPtr result;
    EXPECT_EQ(call("scoped", result), "no diagnostic");
    EXPECT_EQ(txGetNumLiveArrays(), before + 1);
}

TEST(LocalScope, WithoutOneAnArrayIsRefused) {
    const std::size_t before = txGetNumLiveArrays();
    EXPECT_RAISES(qlsvSetLocalScope(txCreateDoubleScalar(1)), "Quillane:HostFunctions:NoLocalScope");
    EXPECT_EQ(txGetNumLiveArrays(), before);
}

} // namespace
