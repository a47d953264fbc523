// Every allocation of reading and writing the texts of number types fails once: nothing is kept that was not finished,
// and the next attempt gives the text, from then on the same one.
#include <functional>

#include "qltypes/fixed_point/ConstructorString.h"
#include "qltypes/fixed_point/IdentifierString.h"
#include "qltypes/fixed_point/TypeNames.h"
#include "tests/support/EachAllocation.h"

namespace {

/// A record, and texts, that nobody used before: what was written or read is kept for good.
struct Unused {
    std::vector<std::string> state() { return {}; }

    int exponent = -200 - numMade++;
    fxpDataTypeProp plain{FXP_DT_FIXPT, 1, 99, 0, exponent, 1.0, 0.0, 0};
    fxpDataTypeProp scaled{FXP_DT_FIXPT, 0, 99, 0, exponent, 1.123456789012345, 0.987654321012345, 0};

    static inline int numMade = 0;
};

using Texts = std::function<std::string(const Unused&)>;

std::string number(const Unused& u) { return std::to_string(-u.exponent); }

const std::pair<const char*, Texts> rows[] = {
    {"identifier", [](const Unused& u) { return fxpDataTypeToIdentifierString(&u.plain); }},
    {"identifier of slope and bias", [](const Unused& u) { return fxpDataTypeToIdentifierString(&u.scaled); }},
    {"constructor",
     [](const Unused& u) {
         return fxpDataTypeToConstructorString(u.plain, FxpDT::PreferNumerictype, FxpDT::PreferSlopeBias);
     }},
    {"constructor of slope and bias",
     [](const Unused& u) {
         return fxpDataTypeToConstructorString(u.scaled, FxpDT::PreferNumerictype, FxpDT::PreferFractionLength);
     }},
    {"read identifier",
     [](const Unused& u) {
         const fxpDataTypeProp& read = identifierStringToFxpDataType("sfix99_S1p123456789en5_B" + number(u) + "p5");
         EXPECT_EQ(&read, &identifierStringToFxpDataType("sfix99_S1p123456789en5_B" + number(u) + "p5"));
         return std::to_string(read.WordLength) + ' ' + std::to_string(read.Bias);
     }},
    {"read constructor",
     [](const Unused& u) {
         const fxpCtorParseResult& read = constructorStringToFxpDataType("fixdt(1,99," + number(u) + ")");
         return std::to_string(read.prop.WordLength) + ' ' + std::to_string(read.prop.FixedExponent);
     }},
    {"name of a type",
     [](const Unused& u) {
         const std::string name = "ufix99_F1p123456789_E" + number(u);
         return std::to_string(FXP::getWordLengthFromTypeName(name.c_str())) + ' ' +
                std::to_string(FXP::canQLTypeNameContainerStoreNegatives(name.c_str()));
     }},
};

TEST(TextMemory, ATextIsWrittenOrRead) {
    for (const auto& [name, text] : rows) {
        SCOPED_TRACE(name);
        const auto twice = [&text = text](Unused& u) {
            const std::string first = text(u);
            const std::string second = text(u);
            EXPECT_EQ(first, second);
            EXPECT_FALSE(first.empty());
        };
        EXPECT_GT(testsupport::failEach<Unused>(twice), 0u);
    }
}

TEST(TextMemory, ATextIsRefused) {
    EXPECT_GT(testsupport::failEach<Unused>([](Unused&) {
                  identifierStringToFxpDataType(std::string("a text that is no identifier of any number type"));
              }),
              2u);
    EXPECT_GT(testsupport::failEach<Unused>([](Unused&) {
                  constructorStringToFxpDataType(std::string("a text that is no constructor of any number type"));
              }),
              2u);
}

} // namespace
