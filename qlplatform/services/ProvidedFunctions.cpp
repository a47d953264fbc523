#include "qlplatform/services/ProvidedFunctions_internal.h"

#include "qlplatform/arrays/Casts_internal.h"
#include "qlplatform/services/MessageTexts.h"
#include "qlplatform/services/Raise_internal.h"

namespace {

constexpr const char* category = "Quillane:HostFunctions";
constexpr MessageText texts[] = {
    {category, "WrongNumberOfArguments", "host function '{0}' takes 1 input and gives 1 output, not {1} and {2}"},
};
const MessageTextTable registeredTexts(texts, std::size(texts));

template <class Function> qlsvHostFunction oneToOne(const char* name, Function function) {
    return [name, function](qlsvOutputs outputs, qlsvInputs inputs) {
        if (outputs.size() != 1 || inputs.size() != 1)
            hostservices::raise(category, "WrongNumberOfArguments", std::string(name), static_cast<long>(inputs.size()),
                                static_cast<long>(outputs.size()));
        outputs[0] = function(inputs[0]);
    };
}

struct CastRow {
    const char* name;
    txClassID classId;
};
constexpr CastRow castRows[] = {
    {"double", txClassDouble}, {"single", txClassSingle}, {"int8", txClassInt8},       {"uint8", txClassUint8},
    {"int16", txClassInt16},   {"uint16", txClassUint16}, {"int32", txClassInt32},     {"uint32", txClassUint32},
    {"int64", txClassInt64},   {"uint64", txClassUint64}, {"logical", txClassLogical}, {"boolean", txClassLogical},
};

} // namespace

std::map<std::string, qlsvHostFunction, std::less<>> hostservices::providedFunctions() {
    std::map<std::string, qlsvHostFunction, std::less<>> provided;
    for (const CastRow& row : castRows)
        provided[row.name] = oneToOne(
            row.name, [classId = row.classId](const txArray_tag* array) { return hostarray::cast(array, classId); });
    provided["complex"] = oneToOne("complex", hostarray::withImaginaryPart);
    provided["real"] = oneToOne("real", hostarray::realPart);
    return provided;
}
