#include "description/MsgReader.h"

#include <algorithm>

#include <fmt/format.h>

#include "description/Files.h"
#include "qlplatform/strings/Strings.h"

namespace inspector {
namespace {

namespace fs = std::filesystem;

std::string packageOf(const std::string& label) { return label.substr(0, label.find('/')); }
std::string nameOf(const std::string& label) { return label.substr(label.find('/') + 1); }

fs::path folderOf(const fs::path& file) { return fs::absolute(file).lexically_normal().parent_path(); }

// The folder of the package that a file belongs to: the one above "msg", or the file's own.
fs::path packageFolderOf(const fs::path& file) {
    const fs::path folder = folderOf(file);
    return folder.filename() == "msg" ? folder.parent_path() : folder;
}

const Place basicTypes{"(basic types of message definitions)", ""};

// The structures that the basic types time and duration stand for.
TypeDescription pairOfIntegers(const std::string& name, const char* integer) {
    StructureDescription structure;
    for (const char* part : {"sec", "nsec"}) {
        structure.elements.emplace_back().name = part;
        structure.elements.back().type = {integer, basicTypes};
    }
    return {name, name, basicTypes, std::move(structure)};
}

std::string reasonOf(RefusalKind kind, const MessageField& field) {
    if (kind == RefusalKind::NoFields) return "it has no fields";
    return fmt::format("field '{}' is {}, which is refused", field.element.name, field.message);
}

} // namespace

void MsgReader::add(const std::string& label, const fs::path& file) {
    indexByLabel_.emplace(label, messages_.size());
    messages_.push_back({label, file, {}, std::nullopt});
}

void MsgReader::addFile(const fs::path& file) {
    const std::string label = packageFolderOf(file).filename().string() + "/" + file.stem().string();
    const Place place{file.string(), ""};
    if (!qlIsValidANSICIdentifier(registeredMessageName(label).c_str(), true))
        throw InputError(place, fmt::format("the package and message '{}' do not make an identifier", label));
    const auto before = indexByLabel_.find(label);
    if (before == indexByLabel_.end()) return add(label, file);
    const fs::path& earlier = messages_[before->second].file;
    std::error_code error;
    if (!fs::equivalent(earlier, file, error))
        throw InputError(place, fmt::format("{} was given already as {}", label, earlier.string()));
}

void MsgReader::addFolder(const fs::path& folder) {
    std::vector<fs::path> files;
    std::error_code error;
    for (fs::directory_iterator at(folder, error), end; !error && at != end; at.increment(error)) {
        if (at->path().extension() == ".msg") files.push_back(at->path());
    }
    if (error) throw InputError({folder.string(), ""}, "cannot be read: " + error.message());
    if (files.empty()) throw InputError({folder.string(), ""}, "the folder has no .msg files");
    std::sort(files.begin(), files.end());
    for (const fs::path& file : files)
        addFile(file);
}

fs::path MsgReader::find(const MessageField& field, const Message& from) const {
    const std::string package = packageOf(field.message);
    const std::string file = nameOf(field.message) + ".msg";
    const fs::path packages = packageFolderOf(from.file).parent_path();
    std::vector<fs::path> folders;
    if (package == packageOf(from.label)) folders.push_back(folderOf(from.file));
    folders.push_back(packages / package / "msg");
    folders.push_back(fs::path("/usr/share") / package / "msg");
    for (const fs::path& folder : folders) {
        std::error_code error;
        if (fs::exists(folder / file, error)) return folder / file;
    }
    throw InputError(field.element.type.place,
                     fmt::format("unknown type '{}': no file {} in {}", field.message, file, folders.front().string()));
}

// Refuses each message without fields, and whatever contains a refused one.
void MsgReader::refuse() {
    std::vector<std::vector<std::pair<std::size_t, const MessageField*>>> uses(messages_.size());
    std::vector<std::size_t> refused;
    const auto refuseFor = [&](std::size_t index, RefusalKind kind, const MessageField* field) {
        Message& message = messages_[index];
        if (message.refusal) return;
        const Place place = field ? field->element.type.place : Place{message.file.string(), ""};
        message.refusal = Refusal{message.label, kind, reasonOf(kind, field ? *field : MessageField{}), place};
        refused.push_back(index);
    };
    for (std::size_t i = 0; i < messages_.size(); ++i) {
        if (messages_[i].fields.empty()) refuseFor(i, RefusalKind::NoFields, nullptr);
        for (const MessageField& field : messages_[i].fields) {
            if (!field.message.empty()) uses[indexByLabel_.at(field.message)].emplace_back(i, &field);
        }
    }
    for (std::size_t i = 0; i < refused.size(); ++i) { // grows while it is walked
        for (const auto& [user, field] : uses[refused[i]])
            refuseFor(user, RefusalKind::UsesRefused, field);
    }
}

// Notes the matrices and basic types that are no built-in ones.
void MsgReader::describe(Message& message, Description& description, Uses& uses) const {
    if (message.refusal) {
        description.refusals.push_back(std::move(*message.refusal));
        return;
    }
    StructureDescription structure;
    for (MessageField& field : message.fields) {
        const bool isMatrix = !field.elementOfMatrix.empty();
        uses.types.insert(isMatrix ? field.elementOfMatrix : field.element.type.name);
        if (isMatrix)
            uses.matrices.emplace(field.element.type.name,
                                  TypeReference{field.elementOfMatrix, field.element.type.place});
        structure.elements.push_back(std::move(field.element));
    }
    description.types.push_back(
        {registeredMessageName(message.label), message.label, Place{message.file.string(), ""}, std::move(structure)});
}

Description MsgReader::read() {
    for (std::size_t i = 0; i < messages_.size(); ++i) { // grows while it is walked: nothing recurses on the depth
        std::vector<MessageField> fields =
            parseMessage(messages_[i].file.string(), packageOf(messages_[i].label), readFileText(messages_[i].file));
        for (const MessageField& field : fields) {
            if (!field.message.empty() && !indexByLabel_.count(field.message))
                add(field.message, find(field, messages_[i]));
        }
        messages_[i].fields = std::move(fields);
    }
    refuse();

    Description description;
    Uses uses;
    description.numMessages = messages_.size();
    for (Message& message : messages_)
        describe(message, description, uses);
    if (uses.types.count("time")) description.types.push_back(pairOfIntegers("time", "uint32"));
    if (uses.types.count("duration")) description.types.push_back(pairOfIntegers("duration", "int32"));
    if (uses.types.count("string")) description.types.push_back({"string", "string", basicTypes, StringDescription{}});
    for (const auto& [name, element] : uses.matrices)
        description.types.push_back({name, name, element.place, MatrixDescription{element, 1}});
    return description;
}

} // namespace inspector
