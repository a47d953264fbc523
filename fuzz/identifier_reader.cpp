// The reader of identifier texts: never crashes, agrees with the slow reader, and reads back what is written.
#include "fuzz/Fuzz.h"
#include "fuzz/NumberTexts.h"
#include "qltypes/fixed_point/IdentifierString.h"
#include "qltypes/fixed_point/TypeNames.h"

extern "C" int LLVMFuzzerTestOneInput(const std::uint8_t* data, std::size_t size) {
    using reference::Ending;
    const std::string text(reinterpret_cast<const char*>(data), size);
    const fxpDataTypeProp* prop = nullptr;
    const Ending ending = fuzz::endingOf([&] { prop = &identifierStringToFxpDataType(text); });

    const reference::Reading expected = reference::readIdentifier(text);
    fuzz::claim(ending == expected.ending, "the slow reader ends the same way");
    if (text.find('\0') == std::string::npos) {
        fuzz::claim(ending == Ending::invalid || FXP::isQLTypeNameWithFxpDataTypeProp(text.c_str()),
                    "what is not refused has the shape of a number type");
    }
    if (ending != Ending::read) return 0;

    fuzz::claim(*prop == expected.prop, "the slow reader reads the same record");
    fuzz::claim(&identifierStringToFxpDataType(std::string_view(text)) == prop, "a second reading finds the first");
    const std::string& written = fxpDataTypeToIdentifierString(prop);
    fuzz::claim(written == reference::writeIdentifier(*prop, true), "the slow writer writes the same text");
    if (prop->validateFxpDTProp())
        fuzz::claim(fuzz::cameBack(*prop, identifierStringToFxpDataType(written)), "a written record reads back");
    return 0;
}
