#include "output/CHeader.h"

#include <algorithm>
#include <array>
#include <map>
#include <set>
#include <string_view>

#include <fmt/format.h>
#include <fmt/ranges.h>

#include "output/ElementText.h"

namespace inspector {
namespace {

constexpr std::int64_t structureAlignment = 8;

// clang-format off
constexpr std::array<std::string_view, 52> keptNames = {
    "auto", "break", "case", "char", "const", "continue", "default", "do", "double", "else", "enum", "extern", "float",
    "for", "goto", "if", "inline", "int", "long", "register", "restrict", "return", "short", "signed", "sizeof",
    "static", "struct", "switch", "typedef", "union", "unsigned", "void", "volatile", "while",
    "asm", "typeof", "linux", "unix", "NULL", "offsetof", // extensions, and macros without a mark
    "alignas", "alignof", "bool", "constexpr", "false", "nullptr", "static_assert", "thread_local", "true",
    "typeof_unqual", "unreachable",
};
// clang-format on

// Keywords, and names that are macros or may be.
bool isKept(std::string_view name) {
    const auto isUpper = [&](std::size_t at) { return at < name.size() && name[at] >= 'A' && name[at] <= 'Z'; };
    if (name.starts_with("__") || (name[0] == '_' && isUpper(1))) return true;
    constexpr std::array<std::string_view, 4> limits = {"_MIN", "_MAX", "_C", "_WIDTH"};
    const auto isEnd = [&](std::string_view end) { return name.ends_with(end); };
    if (isUpper(0) && std::any_of(limits.begin(), limits.end(), isEnd)) return true;
    return std::find(keptNames.begin(), keptNames.end(), name) != keptNames.end();
}

// Adds to a name until it is neither kept nor taken.
std::string freeName(std::string name, std::set<std::string>& taken) {
    do {
        name = "x_" + name;
    } while (!taken.insert(name).second);
    return name;
}

// Names as C takes them, in the order of `names`, which are all different. Leaves all in `taken`.
std::vector<std::string> cNames(std::vector<std::string> names, std::set<std::string>& taken) {
    taken.insert(names.begin(), names.end());
    for (std::string& name : names) {
        if (isKept(name)) name = freeName(name, taken);
    }
    return names;
}

std::int64_t roundedUp(std::int64_t offset, std::int64_t alignment) {
    return (offset + alignment - 1) / alignment * alignment;
}

// Whether the compiler's own rule gives every offset, and the size, of a structure that is aligned to 8.
bool isNatural(const StructureLayout& structure) {
    std::int64_t end = 0;
    for (const ElementLayout& element : structure.elements) {
        if (roundedUp(end, element.cType.alignment) != element.offset) return false;
        end = element.offset + element.size;
    }
    return roundedUp(end, structureAlignment) == structure.size;
}

class Writer {
  public:
    Writer(const Layout& layout, bool withPadding) : layout_(layout), withPadding_(withPadding) {
        std::vector<std::string> names;
        std::set<std::string> taken;
        for (const StructureLayout& structure : layout.structures)
            names.push_back(structure.name);
        const std::vector<std::string> tags = cNames(names, taken);
        for (std::size_t i = 0; i < names.size(); ++i)
            tags_.emplace(names[i], tags[i]);
    }

    std::string header() {
        text_ = "#pragma once\n\n#include <stddef.h>\n#include <stdint.h>\n";
        for (const Refusal& refusal : layout_.refusals)
            text_ += fmt::format("\n/* {} is left out: {} */\n", refusal.label, refusal.reason);
        for (const StructureLayout& structure : layout_.structures)
            add(structure);
        return std::move(text_);
    }

  private:
    void add(const StructureLayout& structure) {
        const bool isPacked = !isNatural(structure);
        const std::string tag = "struct " + tags_.at(structure.name);
        std::vector<std::string> names;
        for (const ElementLayout& element : structure.elements)
            names.push_back(element.name);
        std::set<std::string> taken;
        const std::vector<std::string> members = cNames(names, taken);

        text_ += fmt::format("\n/* {}: {} bytes */\n{} {{\n", structure.label, structure.size, tag);
        std::int64_t end = 0;
        for (std::size_t i = 0; i < members.size(); ++i) {
            const ElementLayout& element = structure.elements[i];
            addPadding(element.offset - end, end, taken);
            const bool isMoved = element.offset != end && !withPadding_;
            addMember(element, members[i], isPacked && isMoved ? element.move->alignment : 1);
            end = element.offset + element.size;
        }
        addPadding(structure.size - end, end, taken);
        text_ += fmt::format("}} __attribute__(({}aligned({})));\n", isPacked ? "packed, " : "", structureAlignment);
        text_ += fmt::format("_Static_assert(sizeof({0}) == {1}, \"size of {0}\");\n", tag, structure.size);
        for (std::size_t i = 0; i < members.size(); ++i) {
            text_ += fmt::format("_Static_assert(offsetof({0}, {1}) == {2}, \"offset of {1} in {0}\");\n", tag,
                                 members[i], structure.elements[i].offset);
        }
    }

    void addPadding(std::int64_t size, std::int64_t offset, std::set<std::string>& taken) {
        if (!withPadding_ || size == 0) return;
        std::string name = fmt::format("padding_at_{}", offset);
        if (!taken.insert(name).second) name = freeName(name, taken);
        text_ += fmt::format("    unsigned char {}[{}];\n", name, size);
    }

    void addMember(const ElementLayout& element, const std::string& name, std::int64_t alignment) {
        const CType& type = element.cType;
        std::string counts;
        if (element.dimensions != std::vector<std::int64_t>{1}) counts += fmt::format("[{}]", numValues(element));
        if (element.isComplex) counts += "[2]";
        if (type.kind == CType::Kind::Bytes) counts += fmt::format("[{}]", type.size);
        const std::string typeText = type.kind == CType::Kind::Structure ? "struct " + tags_.at(type.name) : type.name;
        text_ += fmt::format("    {} {}{}", typeText, name, counts);
        if (alignment > 1) text_ += fmt::format(" __attribute__((aligned({})))", alignment);
        text_ += ';';
        if (element.dimensions.size() > 1) text_ += fmt::format(" /* {} */", fmt::join(element.dimensions, " by "));
        text_ += '\n';
    }

    const Layout& layout_;
    const bool withPadding_;
    std::map<std::string, std::string> tags_; // by the structure's name
    std::string text_;
};

} // namespace

std::string cHeader(const Layout& layout, bool withPadding) { return Writer(layout, withPadding).header(); }

} // namespace inspector
