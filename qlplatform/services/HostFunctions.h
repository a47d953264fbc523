// Functions of the host language, called by name.
//
//   qlsvSetHostFunction("twice", [](qlsvOutputs outputs, qlsvInputs inputs) { outputs[0] = ...; });
//   txArray_tag* result = nullptr;
//   if (qlsvDiagnosticImpl* d = qlsvFEVAL_NoThrow(1, &result, 1, &argument, "twice", true, txDestroyArray)) ...
//
// Provided from the start, each with one input and one output: the casts "double", "single", "int8", "uint8", "int16",
// "uint16", "int32", "uint32", "int64", "uint64", "logical" (also "boolean"), and "complex" and "real". Casts to
// integers round halves away from zero and saturate, and NaN becomes 0. Objects are cast by their underlying values.
//
// The table of functions and the local scopes are process-wide and unlocked.
#pragma once

#include <functional>
#include <span>
#include <string>
#include <vector>

#include "qlplatform/Export.h"
#include "qlplatform/arrays/HostArray.h"

class qlsvDiagnosticImpl;

/// Slots for the results that the caller asked for.
using qlsvOutputs = std::span<txArrayPtr>;
/// Arguments, owned by the caller; may hold null.
using qlsvInputs = std::span<const txArray_tag* const>;

/// A host function: fills the output slots, or throws.
using qlsvHostFunction = std::function<void(qlsvOutputs, qlsvInputs)>;

/// Puts a function under a name and returns the one before, empty for none; an empty function removes the name.
QL_EXPORT qlsvHostFunction qlsvSetHostFunction(const std::string& name, qlsvHostFunction function);

/// Names of all functions, sorted.
QL_EXPORT std::vector<std::string> qlsvGetHostFunctionNames();

/// Calls a host function inside a local scope of its own. On success stores `outCount` arrays, which the caller owns,
/// and returns null. Otherwise stores nulls and returns a diagnostic that the caller owns: what the function threw,
/// `UnknownHostFunction`, or `MissingOutput` when it left a slot empty. What it gave before it failed is handed to
/// `deleter`, to txDestroyArray when that is null. Throws nothing. `isTopLevel` is accepted for engines that tell calls
/// from compiled code apart.
QL_EXPORT qlsvDiagnosticImpl* qlsvFEVAL_NoThrow(int outCount, txArray_tag** outputs, int inCount, txArray_tag** inputs,
                                                const char* functionName, bool isTopLevel,
                                                void (*deleter)(txArray_tag*)) noexcept;

/// Arrays that go with a piece of work: those put into the scope are destroyed with it. Scopes nest.
class QL_EXPORT qlsvLocalScope {
  public:
    qlsvLocalScope();
    ~qlsvLocalScope();
    qlsvLocalScope(const qlsvLocalScope&) = delete;
    qlsvLocalScope& operator=(const qlsvLocalScope&) = delete;

  private:
    friend QL_EXPORT void qlsvSetLocalScope(txArray_tag*);
    std::vector<txArrayPtr> arrays_;
    qlsvLocalScope* outer_; // not owned
};

/// Hands one reference of an array to the innermost scope. Raises `NoLocalScope`, and destroys the array, when none is
/// open.
QL_EXPORT void qlsvSetLocalScope(txArray_tag* array);
