#include <set>

#include <gtest/gtest.h>

#include "qlplatform/services/MessageTexts.h"
#include "qltypes/host/MessageCatalogue.h"
#include "qltypes/host/Messages.h"

namespace {

using QLTypeSys::CatalogueRow;
using QLTypeSys::isInCatalogue;
using QLTypeSys::messageCatalogue;

TEST(MessageCatalogue, EveryRowIsUniqueAndNamesItsArguments) {
    std::set<std::string> identifiers;
    for (const CatalogueRow& row : messageCatalogue()) {
        const std::string identifier = std::string(row.category) + ":" + row.leaf;
        SCOPED_TRACE(identifier);
        EXPECT_TRUE(identifiers.insert(identifier).second);
        for (std::size_t i = 0; i < row.argumentKinds.size(); ++i)
            EXPECT_NE(std::string(row.text).find("{" + std::to_string(i) + "}"), std::string::npos) << i;
        EXPECT_EQ(std::string(row.text).find("{" + std::to_string(row.argumentKinds.size()) + "}"), std::string::npos);
        EXPECT_NE(std::string(row.text).back(), '.');
    }
    EXPECT_EQ(identifiers.size(), 64u);
}

TEST(MessageCatalogue, EveryMessageClassHasItsRow) {
    const std::string s = "name";
    const std::u16string w = u"wide";
    using namespace QuillaneTypes;
    EXPECT_TRUE(isInCatalogue(general::InvalidBuiltinDataTypeId(9)));
    EXPECT_TRUE(isInCatalogue(general::CannotSetPropertyOfAliasType("Construct", "name")));
    EXPECT_TRUE(isInCatalogue(general::InconsistentDataTypeFcn("GreaterThan", "name")));
    EXPECT_TRUE(isInCatalogue(general::DataTypeFcnUnknownError("Construct", "name")));
    EXPECT_TRUE(isInCatalogue(general::DataTypeFcnDoesNotExist("IsPositiveFcn", "name")));
    EXPECT_TRUE(isInCatalogue(general::DataTypeErrorFromBlock("block")));
    EXPECT_TRUE(isInCatalogue(general::UndefinedDataTypeToBeAliasedTo("name", 3)));
    EXPECT_TRUE(isInCatalogue(general::InvalidNumericTypeIdentifier(s)));
    EXPECT_TRUE(isInCatalogue(Dimensions::InconsistentSymbolicDimensionGreaterThan(s, s, s)));
    EXPECT_TRUE(isInCatalogue(Dimensions::InconsistentSymbolicDimensionLessThan(s, s, s)));
    EXPECT_TRUE(isInCatalogue(Dimensions::InconsistentSymbolicDimensionNotEqual(s, s, s)));
    namespace DataType = Quillane::DataType;
    EXPECT_TRUE(isInCatalogue(DataType::DataTypeSizeHasNotBeenSet("name")));
    EXPECT_TRUE(isInCatalogue(DataType::BlockDataTypeError("block")));
    EXPECT_TRUE(isInCatalogue(DataType::EnumTypeNotAClass()));
    EXPECT_TRUE(isInCatalogue(DataType::EnumTypeWithNoEnumStrings("name")));
    EXPECT_TRUE(isInCatalogue(DataType::EnumTypeWithInvalidSuperclass("name")));
    EXPECT_TRUE(isInCatalogue(DataType::EnumTypeWithComplexValues("name")));
    EXPECT_TRUE(isInCatalogue(DataType::InvalidImageTypeNumChannels2(0, "RGB")));
    namespace SymbolicDims = Quillane::SymbolicDims;
    EXPECT_TRUE(isInCatalogue(SymbolicDims::DimensionLessThanOne("0", w)));
    EXPECT_TRUE(isInCatalogue(SymbolicDims::InsufficientNumDimensions(w, 2)));
    EXPECT_TRUE(isInCatalogue(SymbolicDims::MatrixInterpretedAs1D(w, w, s, s, s)));
}

TEST(MessageCatalogue, KindsAndCountsAreCompared) {
    using QLTypeSys::failure::message;
    EXPECT_TRUE(isInCatalogue(message("QuillaneTypes:general", "InvalidDataTypeId", 3)));
    EXPECT_FALSE(isInCatalogue(message("QuillaneTypes:general", "InvalidDataTypeId", "3")));
    EXPECT_FALSE(isInCatalogue(message("QuillaneTypes:general", "InvalidDataTypeId")));
    EXPECT_FALSE(isInCatalogue(message("QuillaneTypes:general", "InvalidDataTypeId", 3, 4)));
    EXPECT_FALSE(isInCatalogue(message("QuillaneTypes:general", "NoSuchLeaf", 3)));
    EXPECT_FALSE(isInCatalogue(message("Quillane:Nothing", "InvalidDataTypeId", 3)));
}

TEST(MessageCatalogue, TextsAreFilledIn) {
    EXPECT_EQ(qlsvFormatMessage(QuillaneTypes::general::UndefinedDataTypeToBeAliasedTo("Speed", 99)),
              "alias 'Speed' stands for identifier 99, which is no type of this table");
    const auto unknown = QLTypeSys::failure::message("My:Category", "Leaf", 3, "x");
    EXPECT_EQ(qlsvFormatMessage(unknown), "My:Category:Leaf: 3, x");
}

} // namespace
