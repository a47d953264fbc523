// The reader of JSON type descriptions and what follows it: one line that says what is wrong and where, or a table that
// answers everything about the types.
#include "description/JsonReader.h"

#include "fuzz/Descriptions.h"

extern "C" int LLVMFuzzerTestOneInput(const std::uint8_t* data, std::size_t size) {
    const std::string file = "in.json";
    const std::string text(reinterpret_cast<const char*>(data), size);
    inspector::Description description;
    try {
        description = inspector::readJsonDescription(file, text);
    } catch (const inspector::InputError& e) {
        fuzz::checkComplaint(e.what(), file);
        return 0;
    }
    fuzz::claim(!description.types.empty() && description.refusals.empty(), "what is read has types");
    fuzz::checkLoading(description, file);
    return 0;
}
