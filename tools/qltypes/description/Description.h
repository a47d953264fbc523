// What the readers make of their input: types by name, each with the place that it was read from.
//
// Readers: JsonReader.h, MsgReader.h. Names are still texts here: Resolver.h ties them together and finds the order in
// which the types can be registered.
//
//   Description description = readJsonDescription("types.json", text);
//   const std::vector<std::size_t> order = registrationOrder(description);
#pragma once

#include <cstddef>
#include <cstdint>
#include <limits>
#include <stdexcept>
#include <string>
#include <variant>
#include <vector>

namespace inspector {

/// Where something stands in an input.
struct Place {
    std::string file;
    std::string within; ///< "line:column", a JSON pointer, or empty for the file as a whole
};

/// "file:line:column", "file: /pointer" or "file".
std::string toText(const Place& place);

/// Bad input. The text is one line that begins with the place.
class InputError : public std::runtime_error {
  public:
    InputError(const Place& place, const std::string& complaint);
};

/// A type that is meant by its name.
struct TypeReference {
    std::string name;
    Place place;
};

struct ElementDescription {
    std::string name;
    TypeReference type;
    std::vector<std::int64_t> dimensions{1};
    bool isComplex = false;
    bool isFrameBased = false;
    bool hasVariableDimensions = false;
    double min = -std::numeric_limits<double>::infinity();
    double max = std::numeric_limits<double>::infinity();
    std::string unit;
};

/// Another name for a type.
struct AliasDescription {
    TypeReference target;
};

/// A type of which only the size in bytes is known.
struct ClientTypeDescription {
    int size = 0;
};

struct StructureDescription {
    std::vector<ElementDescription> elements;
};

/// Texts. The library names the type; the described name is another one for it, here and for the next three.
struct StringDescription {
    unsigned long maxLength = 0; ///< in UTF-16 units; 0 where there is no limit
};

/// A matrix whose dimensions change at run time.
struct MatrixDescription {
    TypeReference element;
    unsigned long rank = 1;
};

struct ImageDescription {
    std::string format;
    bool isRowMajor = false;
    std::string base;
    unsigned long numChannels = 0;
};

/// A moment on a scale of time, with the scale's own epoch, range and storage.
struct DateTimeDescription {
    std::string scale;
};

struct EnumerationMember {
    std::string name;
    std::int32_t value = 0;
};

/// Names for integers.
struct EnumerationDescription {
    std::string storage; ///< the name of an integer type; empty for that of enumerations that ask for none
    std::vector<EnumerationMember> members;
};

struct TypeDescription {
    std::string name;  ///< the registered name, an identifier
    std::string label; ///< the name as its input writes it, for people
    Place place;
    std::variant<AliasDescription, ClientTypeDescription, StructureDescription, EnumerationDescription,
                 StringDescription, MatrixDescription, ImageDescription, DateTimeDescription>
        kind;
};

enum class RefusalKind { NoFields, UsesRefused };

/// A message definition that is well-formed but that the type system cannot express.
struct Refusal {
    std::string label;
    RefusalKind kind;
    std::string reason;
    Place place; ///< of the field that stands in the way
};

struct Description {
    std::vector<TypeDescription> types;
    std::vector<Refusal> refusals;
    std::size_t numMessages = 0; ///< message definitions read, the refused ones included
};

/// The largest dimension, and the largest product of the dimensions of one element: what keeps a layout's arithmetic
/// within 64 bits.
constexpr std::int64_t largestWidth = std::numeric_limits<std::int32_t>::max();

/// Whether the product of the dimensions, each from 1 to `largestWidth`, is at most `largestWidth`.
bool isWidthInRange(const std::vector<std::int64_t>& dimensions);

} // namespace inspector
