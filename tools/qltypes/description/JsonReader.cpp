#include "description/JsonReader.h"

#include <algorithm>
#include <array>
#include <cmath>
#include <initializer_list>
#include <set>
#include <string_view>

#include <fmt/format.h>
#include <fmt/ranges.h>
#include <nlohmann/json.hpp>

#include "qlplatform/strings/Strings.h"

namespace inspector {
namespace {

using Json = nlohmann::json;

// Complains of a value by its pointer, which is empty for the document as a whole.
[[noreturn]] void complainOf(const Place& place, const std::string& complaint) {
    throw InputError(place, place.within.empty() ? "the document " + complaint : complaint);
}

// A value of the document with the way that leads to it.
class Node {
  public:
    Node(const Json& json, const std::string& file, std::string pointer)
        : json_(json), place_{file, std::move(pointer)} {}

    const Place& place() const { return place_; }

    [[noreturn]] void complain(const std::string& complaint) const { complainOf(place_, complaint); }

    /// Complains unless this is an object whose keys are all known.
    const Node& asObject(std::initializer_list<std::string_view> knownKeys) const {
        if (!json_.is_object()) complain(wanted("an object"));
        for (const auto& [key, value] : json_.items()) {
            if (std::find(knownKeys.begin(), knownKeys.end(), key) == knownKeys.end())
                complain(
                    fmt::format("must not have the key {} (known: {})", Json(key).dump(), fmt::join(knownKeys, ", ")));
        }
        return *this;
    }

    bool has(const char* key) const { return json_.contains(key); }

    Node at(const char* key) const {
        if (!has(key)) complain(fmt::format("must have the key '{}'", key));
        return {json_[key], place_.file, place_.within + "/" + key};
    }

    /// Complains unless this is an array of at least one item.
    std::size_t numItems() const {
        if (!json_.is_array()) complain(wanted("an array"));
        if (json_.empty()) complain("must have at least one item");
        return json_.size();
    }

    Node item(std::size_t index) const {
        return {json_[index], place_.file, place_.within + "/" + std::to_string(index)};
    }

    bool isText() const { return json_.is_string(); }

    const std::string& asText() const {
        if (!json_.is_string()) complain(wanted("a string"));
        return json_.get_ref<const std::string&>();
    }

    const std::string& asIdentifier() const {
        const std::string& text = asText();
        if (!qlIsValidANSICIdentifier(text.c_str(), true) || text.find('\0') != std::string::npos)
            complain(fmt::format("must be an identifier, not {}", json_.dump()));
        return text;
    }

    bool asBool() const {
        if (!json_.is_boolean()) complain(wanted("true or false"));
        return json_.get<bool>();
    }

    double asNumber() const {
        if (!json_.is_number()) complain(wanted("a number"));
        return json_.get<double>();
    }

    /// A number without a fraction, however it is written (4, 4.0), from 1 to the largest 32-bit integer.
    std::int32_t asCount() const { return asWhole(1, std::numeric_limits<std::int32_t>::max()); }

    /// A number without a fraction, within the bounds.
    std::int32_t asWhole(std::int32_t smallest, std::int32_t largest) const {
        const double number = asNumber();
        if (!(number >= smallest && number <= largest) || number != std::floor(number))
            complain(fmt::format("must be a whole number from {} to {}, not {}", smallest, largest, json_.dump()));
        return static_cast<std::int32_t>(number);
    }

    /// True for the second of two words, false for the first.
    bool asSecondOf(std::string_view first, std::string_view second) const {
        const std::string& word = asText();
        if (word != first && word != second)
            complain(fmt::format("must be \"{}\" or \"{}\", not {}", first, second, json_.dump()));
        return word == second;
    }

  private:
    std::string wanted(const char* what) const {
        const char* const article = json_.is_null() ? "" : json_.is_array() || json_.is_object() ? "an " : "a ";
        return fmt::format("must be {}, not {}{}", what, article, json_.type_name());
    }

    const Json& json_;
    Place place_;
};

ElementDescription readElement(const Node& node) {
    node.asObject({"name", "type", "dimensions", "complex", "min", "max", "unit", "sampling", "dimensionsMode"});
    ElementDescription element;
    element.name = node.at("name").asIdentifier();
    element.type = {node.at("type").asIdentifier(), node.at("type").place()};
    if (node.has("dimensions")) {
        const Node dimensions = node.at("dimensions");
        element.dimensions.clear();
        for (std::size_t i = 0; i < dimensions.numItems(); ++i)
            element.dimensions.push_back(dimensions.item(i).asCount());
        if (!isWidthInRange(element.dimensions))
            dimensions.complain(fmt::format("multiply to more than {}", largestWidth));
    }
    if (node.has("complex")) element.isComplex = node.at("complex").asBool();
    if (node.has("min")) element.min = node.at("min").asNumber();
    if (node.has("max")) element.max = node.at("max").asNumber();
    if (node.has("unit")) element.unit = node.at("unit").asText();
    if (node.has("sampling")) element.isFrameBased = node.at("sampling").asSecondOf("sample", "frame");
    if (node.has("dimensionsMode"))
        element.hasVariableDimensions = node.at("dimensionsMode").asSecondOf("fixed", "variable");
    return element;
}

StructureDescription readStructure(const Node& elements) {
    StructureDescription structure;
    std::set<std::string_view> names;
    const std::size_t numElements = elements.numItems();
    structure.elements.reserve(numElements);
    for (std::size_t i = 0; i < numElements; ++i) {
        structure.elements.push_back(readElement(elements.item(i)));
        const std::string& name = structure.elements.back().name;
        if (!names.insert(name).second)
            elements.item(i).at("name").complain(fmt::format("'{}' names an earlier element already", name));
    }
    return structure;
}

struct StorageRange {
    std::string_view storage;
    std::int32_t smallest;
    std::int32_t largest;
};

// The values that a storage type holds; whether it may be one is asked of the library when the type is registered.
StorageRange rangeOf(std::string_view storage) {
    // clang-format off
    constexpr StorageRange ranges[] = {
        {"int8",   -128,   127},
        {"int16",  -32768, 32767},
        {"uint8",  0,      255},
        {"uint16", 0,      65535},
    };
    // clang-format on
    for (const StorageRange& range : ranges) {
        if (range.storage == storage) return range;
    }
    using Limits = std::numeric_limits<std::int32_t>;
    return {storage, Limits::min(), Limits::max()};
}

EnumerationDescription readEnumeration(const Node& node) {
    EnumerationDescription enumeration;
    if (node.has("storage")) enumeration.storage = node.at("storage").asIdentifier();
    const StorageRange range = rangeOf(enumeration.storage);
    const Node members = node.at("members");
    std::set<std::string> names;
    const std::size_t numMembers = members.numItems();
    for (std::size_t i = 0; i < numMembers; ++i) {
        const Node member = members.item(i);
        member.asObject({"name", "value"});
        const std::string& name = member.at("name").asIdentifier();
        if (!names.insert(name).second)
            member.at("name").complain(fmt::format("'{}' names an earlier member already", name));
        enumeration.members.push_back({name, member.at("value").asWhole(range.smallest, range.largest)});
    }
    return enumeration;
}

// One of some words.
const std::string& readWord(const Node& node, std::initializer_list<std::string_view> words) {
    const std::string& word = node.asText();
    if (std::find(words.begin(), words.end(), word) == words.end())
        node.complain(fmt::format("must be one of {}, not {}", fmt::join(words, ", "), Json(word).dump()));
    return word;
}

StringDescription readString(const Node& node) {
    if (!node.isText()) return {static_cast<unsigned long>(node.asCount())};
    readWord(node, {"dynamic"});
    return {0};
}

ImageDescription readImage(const Node& node) {
    node.asObject({"format", "layout", "base", "channels"});
    ImageDescription image;
    image.format = readWord(node.at("format"),
                            {"BGRA", "RGB", "RGBA", "Grayscale", "CMYK", "Spectral", "Lab", "HSV", "YUV444", "CFA"});
    image.isRowMajor = node.at("layout").asSecondOf("column", "row");
    image.base = readWord(node.at("base"),
                          {"double", "single", "int8", "uint8", "int16", "uint16", "int32", "uint32", "boolean"});
    image.numChannels = static_cast<unsigned long>(node.at("channels").asCount());
    return image;
}

MatrixDescription readMatrix(const Node& node) {
    node.asObject({"of", "rank"});
    const Node element = node.at("of");
    return {{element.asIdentifier(), element.place()}, static_cast<unsigned long>(node.at("rank").asCount())};
}

TypeDescription readType(const Node& node) {
    node.asObject({"name", "alias", "size", "elements", "members", "storage", "string", "matrix", "image", "dateTime"});
    TypeDescription type;
    type.name = node.at("name").asIdentifier();
    type.label = type.name;
    type.place = node.place();
    constexpr std::array<const char*, 8> kinds = {"alias",  "size",   "elements", "members",
                                                  "string", "matrix", "image",    "dateTime"};
    if (std::count_if(kinds.begin(), kinds.end(), [&](const char* kind) { return node.has(kind); }) != 1)
        node.complain(fmt::format("must have exactly one of the keys '{}'", fmt::join(kinds, "', '")));
    if (node.has("storage") && !node.has("members")) node.complain("must have the key 'members' beside 'storage'");
    if (node.has("alias"))
        type.kind = AliasDescription{{node.at("alias").asIdentifier(), node.at("alias").place()}};
    else if (node.has("size"))
        type.kind = ClientTypeDescription{node.at("size").asCount()};
    else if (node.has("members"))
        type.kind = readEnumeration(node);
    else if (node.has("string"))
        type.kind = readString(node.at("string"));
    else if (node.has("matrix"))
        type.kind = readMatrix(node.at("matrix"));
    else if (node.has("image"))
        type.kind = readImage(node.at("image"));
    else if (node.has("dateTime"))
        type.kind = DateTimeDescription{readWord(node.at("dateTime"), {"tai", "gps", "utc", "posix", "jd", "mjd"})};
    else
        type.kind = readStructure(node.at("elements"));
    return type;
}

// A first pass over the text, which finds what the tree of values cannot show any more: where the text is no JSON, and
// keys that stand twice in one object.
class Checker final : public nlohmann::json_sax<Json> {
  public:
    Checker(const std::string& file, std::string_view text) : file_(file), text_(text) {}

    bool null() override { return value(); }
    bool boolean(bool) override { return value(); }
    bool number_integer(number_integer_t) override { return value(); }
    bool number_unsigned(number_unsigned_t) override { return value(); }
    bool number_float(number_float_t, const string_t&) override { return value(); }
    bool string(string_t&) override { return value(); }
    bool binary(binary_t&) override { return value(); }
    bool start_object(std::size_t) override { return open(); }
    bool end_object() override { return close(); }
    bool start_array(std::size_t) override { return open(); }
    bool end_array() override { return close(); }

    bool key(string_t& key) override {
        if (!levels_.back().keys.insert(key).second)
            complainOf({file_, pointer()}, fmt::format("has the key {} twice", Json(key).dump()));
        levels_.back().key = key;
        return true;
    }

    bool parse_error(std::size_t numBytesRead, const std::string&, const Json::exception& error) override {
        throw InputError(placeOf(numBytesRead), "no JSON: " + reasonOf(error));
    }

  private:
    struct Level {
        std::set<std::string> keys; // of an object
        std::string key;            // of an object: the last one
        std::size_t numValues = 0;
    };

    bool value() {
        if (!levels_.empty()) ++levels_.back().numValues;
        return true;
    }
    bool open() {
        value();
        levels_.emplace_back();
        return true;
    }
    bool close() {
        levels_.pop_back();
        return true;
    }

    // Of the innermost value that is open.
    std::string pointer() const {
        std::string pointer;
        for (std::size_t i = 0; i + 1 < levels_.size(); ++i) {
            const Level& level = levels_[i];
            const std::string quotedKey = Json(level.key).dump(); // with control characters escaped
            pointer += "/" + (level.keys.empty() ? std::to_string(level.numValues - 1)
                                                 : quotedKey.substr(1, quotedKey.size() - 2));
        }
        return pointer;
    }

    // Of the last byte read. Columns count bytes from 1.
    Place placeOf(std::size_t numBytesRead) const {
        const std::string_view before = text_.substr(0, numBytesRead > 0 ? numBytesRead - 1 : 0);
        const auto line = 1 + std::count(before.begin(), before.end(), '\n');
        const std::size_t lastBreak = before.rfind('\n');
        const std::size_t column = 1 + before.size() - (lastBreak == std::string_view::npos ? 0 : lastBreak + 1);
        return {file_, fmt::format("{}:{}", line, column)};
    }

    // What the library says between its own identifier and position and the bytes that it read last.
    static std::string reasonOf(const Json::exception& error) {
        std::string_view text = error.what();
        if (const std::size_t at = text.find("] "); at != std::string_view::npos) text.remove_prefix(at + 2);
        if (text.starts_with("parse error")) text.remove_prefix(text.find(": ") + 2);
        return std::string(text.substr(0, text.find("; last read")));
    }

    const std::string& file_;
    std::string_view text_;
    std::vector<Level> levels_;
};

} // namespace

Description readJsonDescription(const std::string& file, const std::string& text) {
    Checker checker(file, text);
    Json::sax_parse(text, &checker);
    const Json json = Json::parse(text);
    const Node document(json, file, "");
    const Node types = document.asObject({"$schema", "types"}).at("types");
    if (document.has("$schema")) document.at("$schema").asText();
    Description description;
    const std::size_t numTypes = types.numItems();
    description.types.reserve(numTypes);
    for (std::size_t i = 0; i < numTypes; ++i)
        description.types.push_back(readType(types.item(i)));
    return description;
}

} // namespace inspector
