#include "description/MsgParser.h"

#include <algorithm>
#include <array>
#include <charconv>
#include <optional>
#include <set>

#include <fmt/format.h>

namespace inspector {
namespace {

struct BasicType {
    std::string_view name;
    std::string_view registeredName;
};

// clang-format off
constexpr std::array<BasicType, 16> basicTypes = {{
    {"bool",     "boolean"},
    {"int8",     "int8"},
    {"uint8",    "uint8"},
    {"byte",     "int8"},  // an old name
    {"char",     "uint8"}, // an old name
    {"int16",    "int16"},
    {"uint16",   "uint16"},
    {"int32",    "int32"},
    {"uint32",   "uint32"},
    {"int64",    "int64"},
    {"uint64",   "uint64"},
    {"float32",  "single"},
    {"float64",  "double"},
    {"time",     "time"},
    {"duration", "duration"},
    {"string",   "string"},
}};
// clang-format on

const BasicType* findBasicType(std::string_view name) {
    const auto at = std::find_if(basicTypes.begin(), basicTypes.end(), [&](auto& type) { return type.name == name; });
    return at == basicTypes.end() ? nullptr : at;
}

bool isWordCharacter(char c, bool isFirst) {
    return (c >= 'a' && c <= 'z') || (c >= 'A' && c <= 'Z') || (!isFirst && (c == '_' || (c >= '0' && c <= '9')));
}

// Reads one line from left to right and knows the place of what it reads.
class LineReader {
  public:
    LineReader(const std::string& file, std::size_t line, std::string_view text)
        : file_(file), line_(line), text_(text) {}

    Place place() const { return {file_, fmt::format("{}:{}", line_, position_ + 1)}; }

    [[noreturn]] void complain(const std::string& complaint) const { throw InputError(place(), complaint); }

    void skipBlanks() {
        while (position_ < text_.size() && (text_[position_] == ' ' || text_[position_] == '\t'))
            ++position_;
    }

    /// Whether nothing but a comment is left.
    bool isAtEnd() const { return position_ == text_.size() || text_[position_] == '#'; }

    bool skip(char c) {
        if (position_ == text_.size() || text_[position_] != c) return false;
        ++position_;
        return true;
    }

    /// A letter, then letters, digits and underscores.
    std::string word(const char* what) {
        const std::size_t start = position_;
        while (position_ < text_.size() && isWordCharacter(text_[position_], position_ == start))
            ++position_;
        if (position_ == start) complain(fmt::format("expected {}", what));
        return std::string(text_.substr(start, position_ - start));
    }

    /// A number of elements.
    std::int64_t count() {
        std::int64_t number = 0;
        const char* const begin = text_.data() + position_;
        const auto [after, error] = std::from_chars(begin, text_.data() + text_.size(), number);
        if (error != std::errc() || number < 1 || number > largestWidth)
            complain(fmt::format("expected ']' or a number of elements from 1 to {}", largestWidth));
        position_ += static_cast<std::size_t>(after - begin);
        return number;
    }

  private:
    const std::string& file_;
    std::size_t line_;
    std::string_view text_;
    std::size_t position_ = 0;
};

// The name that the library gives a matrix of one dimension.
std::string matrixName(const std::string& element) { return fmt::format("dynmat_{}_1d_t", element); }

// Reads the type in front of a field's name.
void readType(LineReader& line, std::string_view package, MessageField& field) {
    field.element.type.place = line.place();
    const std::string first = line.word("a type");
    const BasicType* const basic = findBasicType(first);
    if (line.skip('/'))
        field.message = first + "/" + line.word("the name of a message");
    else if (first == "Header")
        field.message = "std_msgs/Header"; // may be written without its package everywhere
    else if (!basic)
        field.message = std::string(package) + "/" + first;
    field.element.type.name = basic ? std::string(basic->registeredName) : registeredMessageName(field.message);

    if (!line.skip('[')) return;
    if (line.skip(']')) {
        field.elementOfMatrix = field.element.type.name;
        field.element.type.name = matrixName(field.elementOfMatrix);
        return;
    }
    field.element.dimensions = {line.count()};
    if (!line.skip(']')) line.complain("expected ']'");
}

// The field of a line, or nothing where the line is a constant.
std::optional<MessageField> readField(LineReader& line, std::string_view package) {
    MessageField field;
    readType(line, package, field);
    line.skipBlanks();
    field.element.name = line.word("the name of a field");
    line.skipBlanks();
    if (line.skip('=')) return std::nullopt; // a constant: the rest is its value, also where it looks like a comment
    if (!line.isAtEnd()) line.complain("expected the end of the line");
    return field;
}

} // namespace

std::vector<MessageField> parseMessage(const std::string& file, std::string_view package, std::string_view text) {
    std::vector<MessageField> fields;
    std::set<std::string> names;
    for (std::size_t number = 1; !text.empty(); ++number) {
        const std::size_t end = text.find('\n');
        std::string_view lineText = text.substr(0, end);
        text.remove_prefix(end == std::string_view::npos ? text.size() : end + 1);
        if (lineText.ends_with('\r')) lineText.remove_suffix(1);

        LineReader line(file, number, lineText);
        line.skipBlanks();
        if (line.isAtEnd()) continue;
        const Place place = line.place();
        if (std::optional<MessageField> field = readField(line, package)) {
            if (!names.insert(field->element.name).second)
                throw InputError(place, fmt::format("'{}' names an earlier field already", field->element.name));
            fields.push_back(std::move(*field));
        }
    }
    return fields;
}

std::string registeredMessageName(std::string label) {
    std::replace(label.begin(), label.end(), '/', '_');
    return label;
}

} // namespace inspector
