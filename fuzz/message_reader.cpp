// The reader of message definitions: fields, or one line that says what is wrong and where; and whole folders of
// definitions that refer to each other, which become a table that answers everything about the types.
//
// The input is up to four definitions, divided by NUL bytes: p/A, p/B, q/A and q/B.
#include "description/MsgReader.h"

#include <array>
#include <filesystem>
#include <fstream>

#include <unistd.h>

#include "description/MsgParser.h"
#include "fuzz/Descriptions.h"

namespace {

namespace fs = std::filesystem;

// Two packages in a folder of this process, removed at the end.
class Packages {
  public:
    Packages() : root_(fs::temp_directory_path() / ("message_reader_" + std::to_string(getpid()))) {
        for (const char* package : {"p", "q"})
            fs::create_directories(root_ / package / "msg");
    }
    ~Packages() {
        std::error_code ignored;
        fs::remove_all(root_, ignored);
    }

    fs::path folder(const std::string& package) const { return root_ / package / "msg"; }
    fs::path file(const std::string& label) const { return folder(label.substr(0, 1)) / (label.substr(2) + ".msg"); }

  private:
    fs::path root_;
};

constexpr std::array<const char*, 4> labels = {"p/A", "p/B", "q/A", "q/B"};

std::vector<std::string> definitionsIn(std::string_view input) {
    std::vector<std::string> definitions;
    while (definitions.size() + 1 < labels.size() && input.find('\0') != std::string_view::npos) {
        definitions.emplace_back(input.substr(0, input.find('\0')));
        input.remove_prefix(definitions.back().size() + 1);
    }
    definitions.emplace_back(input);
    return definitions;
}

// One text alone. Whether it was read.
bool checkParser(const std::string& text) {
    try {
        const auto fields = inspector::parseMessage("in.msg", "p", text);
        const auto numLines = std::count(text.begin(), text.end(), '\n') + 1;
        fuzz::claim(std::ssize(fields) <= numLines, "a line has one field at most");
        for (const inspector::MessageField& field : fields) {
            fuzz::claim(!field.element.name.empty() && !field.element.type.name.empty(), "a field has name and type");
            fuzz::claim(inspector::isWidthInRange(field.element.dimensions), "a field has a width");
        }
        return true;
    } catch (const inspector::InputError& e) {
        fuzz::checkComplaint(e.what(), "in.msg");
        return false;
    }
}

inspector::Description readAll(const Packages& packages) {
    inspector::MsgReader reader;
    for (const char* package : {"p", "q"}) {
        if (!fs::is_empty(packages.folder(package))) reader.addFolder(packages.folder(package));
    }
    return reader.read();
}

} // namespace

extern "C" int LLVMFuzzerTestOneInput(const std::uint8_t* data, std::size_t size) {
    static const Packages packages;
    const std::vector<std::string> definitions =
        definitionsIn(std::string_view(reinterpret_cast<const char*>(data), size));
    bool areRead = true;
    for (const std::string& definition : definitions)
        areRead &= checkParser(definition);
    if (!areRead) return 0;

    for (std::size_t i = 0; i < labels.size(); ++i) {
        if (i < definitions.size())
            std::ofstream(packages.file(labels[i]), std::ios::binary) << definitions[i];
        else
            fs::remove(packages.file(labels[i]));
    }
    inspector::Description description;
    try {
        description = readAll(packages);
    } catch (const inspector::InputError& e) {
        fuzz::checkComplaint(e.what(), "");
        return 0;
    }
    fuzz::claim(description.numMessages >= definitions.size(), "all messages are counted");
    for (const inspector::Refusal& refusal : description.refusals)
        fuzz::claim(!refusal.reason.empty() && !refusal.place.file.empty(), "a refusal says why and where");
    if (!description.types.empty()) fuzz::checkLoading(description, "");
    return 0;
}
