#include "qlplatform/services/HostFunctions.h"

#include <algorithm>
#include <map>
#include <new>

#include "qlplatform/services/MessageTexts.h"
#include "qlplatform/services/ProvidedFunctions_internal.h"
#include "qlplatform/services/Raise_internal.h"

namespace {

constexpr const char* category = "Quillane:HostFunctions";
constexpr MessageText texts[] = {
    {category, "UnknownHostFunction", "there is no host function '{0}'"},
    {category, "HostFunctionFailed", "host function '{0}' failed: {1}"},
    {category, "MissingOutput", "host function '{0}' left output {1} empty"},
    {category, "NoLocalScope", "no local scope is open"},
};
const MessageTextTable registeredTexts(texts, std::size(texts));

using FunctionTable = std::map<std::string, qlsvHostFunction, std::less<>>;

// Lives as long as the process, so that functions can be called while it ends.
FunctionTable& functionTable() {
    static auto* const table = new FunctionTable(hostservices::providedFunctions());
    return *table;
}

qlsvLocalScope* innermostScope = nullptr;

void call(const char* name, qlsvOutputs outputs, qlsvInputs inputs) {
    const auto found = functionTable().find(std::string_view(name ? name : ""));
    if (found == functionTable().end())
        hostservices::raise(category, "UnknownHostFunction", std::string(name ? name : ""));
    const qlsvHostFunction function = found->second; // it may take itself out of the table
    const qlsvLocalScope scope;
    function(outputs, inputs);
    const auto missing = std::find(outputs.begin(), outputs.end(), nullptr);
    if (missing != outputs.end())
        hostservices::raise(category, "MissingOutput", std::string(name), static_cast<long>(missing - outputs.begin()));
}

// The diagnostic of the exception that is being handled.
qlsvDiagnosticImpl* diagnosticOfCurrentException(const char* name) {
    try {
        const auto failed = [name](const char* reason) {
            return qlsvCreateDiagnosticFromMessageID(hostservices::message(
                category, "HostFunctionFailed", std::string(name ? name : ""), std::string(reason)));
        };
        try {
            throw;
        } catch (const foundation::core::except::IException& e) {
            return qlsvCreateDiagnosticFromIException(e, true);
        } catch (const std::bad_alloc&) {
            return qlsvCreateOutOfMemoryDiagnostic();
        } catch (const std::exception& e) {
            return failed(e.what());
        } catch (...) {
            return failed("it threw something that is no exception");
        }
    } catch (const std::bad_alloc&) {
        return qlsvCreateOutOfMemoryDiagnostic();
    }
}

} // namespace

qlsvHostFunction qlsvSetHostFunction(const std::string& name, qlsvHostFunction function) {
    FunctionTable& table = functionTable();
    qlsvHostFunction before;
    if (const auto found = table.find(name); found != table.end()) before = std::move(found->second);
    if (function)
        table[name] = std::move(function);
    else
        table.erase(name);
    return before;
}

std::vector<std::string> qlsvGetHostFunctionNames() {
    std::vector<std::string> names;
    for (const auto& [name, function] : functionTable())
        names.push_back(name);
    return names;
}

qlsvDiagnosticImpl* qlsvFEVAL_NoThrow(int outCount, txArray_tag** outputs, int inCount, txArray_tag** inputs,
                                      const char* functionName, bool, void (*deleter)(txArray_tag*)) noexcept {
    const std::size_t numOutputs = outCount > 0 ? static_cast<std::size_t>(outCount) : 0;
    const std::size_t numInputs = inCount > 0 ? static_cast<std::size_t>(inCount) : 0;
    std::fill_n(outputs, numOutputs, nullptr);
    std::vector<txArrayPtr> results;
    try {
        results.resize(numOutputs);
        call(functionName, results, {inputs, numInputs});
    } catch (...) {
        if (deleter)
            for (txArrayPtr& result : results)
                if (result) deleter(result.release());
        return diagnosticOfCurrentException(functionName);
    }
    std::transform(results.begin(), results.end(), outputs, [](txArrayPtr& result) { return result.release(); });
    return nullptr;
}

qlsvLocalScope::qlsvLocalScope() : outer_(innermostScope) { innermostScope = this; }
qlsvLocalScope::~qlsvLocalScope() { innermostScope = outer_; }

void qlsvSetLocalScope(txArray_tag* array) {
    txArrayPtr taken(array);
    if (!innermostScope) hostservices::raise(category, "NoLocalScope");
    innermostScope->arrays_.push_back(std::move(taken));
}
