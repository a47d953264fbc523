#include <functional>
#include <stdexcept>

#include <gtest/gtest.h>

#include "qlplatform/arrays/HostElements.h"
#include "qlplatform/services/HostFunctions.h"
#include "qltypes/host/AllowedItems.h"
#include "tests/support/FailingAllocations.h"

namespace {

using QLTypeSys::AdditionalType;

constexpr const char* functionName = "Quillane.DataTypePrmWidget.getDataTypeAllowedItems";

txArrayPtr cellsOf(const std::vector<const char*>& texts) {
    txArrayPtr cells(txCreateCellMatrix(1, texts.size()));
    for (std::size_t i = 0; i < texts.size(); ++i)
        txSetCell(cells.get(), i, txCreateString(texts[i]));
    return cells;
}

/// An array as text: 'text', {cell, cell}, true, 1x2 double; unset for null.
std::string shown(const txArray_tag* array) {
    if (!array) return "unset";
    std::string text;
    switch (txGetClassID(array)) {
    case txClassChar:
        return "'" + txArrayToUTF8StdString(array) + "'";
    case txClassLogical:
        return txGetElements<bool>(array)[0] ? "true" : "false";
    case txClassCell:
        text = std::to_string(txGetNumRows(array)) + "x" + std::to_string(txGetNumColumns(array)) + "{";
        for (std::size_t i = 0; i < txGetNumberOfElements(array); ++i)
            text += (i ? ", " : "") + shown(txGetCell(array, i));
        return text + "}";
    default:
        return txGetClassName(array);
    }
}

/// The host function of a test: notes what it is sent, and answers.
class Host : public testing::Test {
  protected:
    Host() {
        qlsvSetHostFunction(functionName, [this](qlsvOutputs outputs, qlsvInputs inputs) {
            ++numCalls;
            EXPECT_EQ(outputs.size(), 1u);
            ASSERT_EQ(inputs.size(), 2u);
            const txArray_tag* question = inputs[0];
            EXPECT_EQ(txGetClassID(question), txClassStruct);
            EXPECT_EQ(txGetNumRows(question), 1u);
            EXPECT_EQ(txGetNumColumns(question), 1u);
            fields.clear();
            for (int field = 0; field < txGetNumberOfFields(question); ++field)
                fields += std::string(txGetFieldNameByNumber(question, field)) + "=" +
                          shown(txGetFieldByNumber(question, 0, field)) + "\n";
            context = shown(inputs[1]);
            if (answer) outputs[0] = answer();
        });
        numArrays_ = txGetNumLiveArrays();
    }
    ~Host() override {
        qlsvSetHostFunction(functionName, {});
        EXPECT_EQ(txGetNumLiveArrays(), numArrays_);
    }

    int numCalls = 0;
    std::string fields;
    std::string context;
    std::function<txArrayPtr()> answer = [] { return cellsOf({"double", "int8"}); };

  private:
    std::size_t numArrays_;
};
using AllowedItems = Host;

std::vector<std::string> texts(const StringVector& items) {
    std::vector<std::string> all;
    for (std::size_t i = 0; i < items.size(); ++i)
        all.emplace_back(items.element(i));
    return all;
}

constexpr const EnumStrs* noEnums = nullptr;
constexpr const StringVector* noTexts = nullptr;
using Texts = std::vector<std::string>;

constexpr const char* nothingAsked = "inheritRules=unset\nbuiltinTypes=unset\nscalingModes=unset\nsignModes=unset\n"
                                     "supportsEnumType=false\nsupportsBusType=false\nsupportsStringType=false\n";

struct Dialog : UDInterface {
    explicit Dialog(const char* given) : text(given) {}
    txArrayPtr toHostArray() const override { return text ? txArrayPtr(txCreateString(text)) : txArrayPtr(); }
    const char* text;
};

TEST_F(AllowedItems, NothingAskedLeavesTheListsUnset) {
    StringVector items;
    GetDataTypeAllowedItems(noEnums, noEnums, noEnums, noEnums, {}, items, nullptr);
    EXPECT_EQ(fields, nothingAsked);
    EXPECT_EQ(context, "unset");
    EXPECT_EQ(texts(items), (Texts{"double", "int8"}));
    GetDataTypeAllowedItems(noTexts, noTexts, noTexts, noTexts, {}, items, nullptr);
    EXPECT_EQ(fields, nothingAsked);
    EXPECT_EQ(texts(items), (Texts{"double", "int8", "double", "int8"})); // appended
    EXPECT_EQ(numCalls, 2);
}

TEST_F(AllowedItems, ListsOfNamesLeaveHiddenEntriesOut) {
    constexpr EnumStr rules[] = {{"Inherit: auto", 1}, {"Inherit: secret", 2, 1}, {"Inherit: same", 3, 2}};
    constexpr EnumStr hidden[] = {{"x", 1, 1}, {"y", 2, 1}};
    const EnumStrs inheritRules = {3, rules};
    const EnumStrs allHidden = {2, hidden};
    const EnumStrs none = {0, nullptr};
    const EnumStrs negative = {-2, rules};
    Dialog dialog("the dialog");
    StringVector items;
    GetDataTypeAllowedItems(&inheritRules, &allHidden, &none, &negative, {}, items, &dialog);
    EXPECT_EQ(fields, "inheritRules=1x2{'Inherit: auto', 'Inherit: same'}\nbuiltinTypes=1x0{}\nscalingModes=1x0{}\n"
                      "signModes=1x0{}\nsupportsEnumType=false\nsupportsBusType=false\nsupportsStringType=false\n");
    EXPECT_EQ(context, "'the dialog'");
}

TEST_F(AllowedItems, ListsOfTextsAreSentAsTheyAre) {
    StringVector some;
    some.addElement("double");
    some.addElement("");
    some.addElement(nullptr);
    some.addElement("größer");
    const StringVector none;
    Dialog dialog(nullptr);
    StringVector items;
    GetDataTypeAllowedItems(noTexts, &some, &none, noTexts, {}, items, &dialog);
    EXPECT_EQ(fields, "inheritRules=unset\nbuiltinTypes=1x4{'double', '', '', 'größer'}\nscalingModes=1x0{}\n"
                      "signModes=unset\nsupportsEnumType=false\nsupportsBusType=false\nsupportsStringType=false\n");
    EXPECT_EQ(context, "unset"); // a dialog without host form
}

TEST_F(AllowedItems, SupportFieldsByValue) {
    struct Row {
        std::vector<AdditionalType> types;
        const char* expected;
    };
    const Row rows[] = {
        {{AdditionalType::supportsEnum}, "supportsEnumType=true\nsupportsBusType=false\nsupportsStringType=false\n"},
        {{static_cast<AdditionalType>(1), static_cast<AdditionalType>(1)},
         "supportsEnumType=false\nsupportsBusType=true\nsupportsStringType=false\n"},
        {{AdditionalType::supportsString, AdditionalType::supportsEnum},
         "supportsEnumType=true\nsupportsBusType=false\nsupportsStringType=true\n"},
        {{static_cast<AdditionalType>(3), static_cast<AdditionalType>(-1)},
         "supportsEnumType=false\nsupportsBusType=false\nsupportsStringType=false\n"},
    };
    for (const Row& row : rows) {
        StringVector items;
        GetDataTypeAllowedItems(noEnums, noEnums, noEnums, noEnums, row.types, items, nullptr);
        EXPECT_EQ(fields.substr(fields.find("supportsEnumType")), row.expected);
    }
}

TEST_F(AllowedItems, TheAliasFormHasAnEighthField) {
    StringVector signModes;
    signModes.addElement("signed");
    const tcos::COSValue value(txArrayPtr(txCreateString("the value")));
    StringVector items;
    GetDataTypeAllowedItems(noTexts, noTexts, noTexts, &signModes, {AdditionalType::supportsBus}, items, "Speed",
                            value);
    EXPECT_EQ(fields, "inheritRules=unset\nbuiltinTypes=unset\nscalingModes=unset\nsignModes=1x1{'signed'}\n"
                      "supportsEnumType=false\nsupportsBusType=true\nsupportsStringType=false\n"
                      "aliasObjectName='Speed'\n");
    EXPECT_EQ(context, "'the value'");
    EXPECT_EQ(texts(items), (Texts{"double", "int8"}));
    GetDataTypeAllowedItems(noTexts, noTexts, noTexts, noTexts, {}, items, "", tcos::COSValue(nullptr));
    EXPECT_EQ(fields, std::string(nothingAsked) + "aliasObjectName=''\n");
    EXPECT_EQ(context, "unset");
}

TEST_F(AllowedItems, TheHostArrayStaysTheCallers) {
    const txArrayPtr array(txCreateString("mine"));
    std::vector<std::string> items = {"first"};
    GetDataTypeAllowedItems(noEnums, noEnums, noEnums, noEnums, {}, items, array.get());
    EXPECT_EQ(context, "'mine'");
    EXPECT_EQ(txGetReferenceCount(array.get()), 1u);
    EXPECT_EQ(items, (Texts{"first", "double", "int8"}));
    EXPECT_EQ(fields, nothingAsked);
    GetDataTypeAllowedItems(noEnums, noEnums, noEnums, noEnums, {}, items, static_cast<txArray_tag*>(nullptr));
    EXPECT_EQ(context, "unset");
}

TEST_F(AllowedItems, TemplateEntriesNeverReachTheClient) {
    answer = [] { return cellsOf({"Enum: <class name>", "Bus: <object name>", "<data type expression>"}); };
    StringVector items;
    GetDataTypeAllowedItems(noEnums, noEnums, noEnums, noEnums, {}, items, nullptr);
    EXPECT_EQ(items.size(), 0u);
    answer = [] {
        return cellsOf({"Enum: <class name> ", "<data type expression>", "Bus: <object name>2", "Enum: Gear",
                        "bus: <object name>", ""});
    };
    GetDataTypeAllowedItems(noEnums, noEnums, noEnums, noEnums, {}, items, nullptr);
    EXPECT_EQ(texts(items),
              (Texts{"Enum: <class name> ", "Bus: <object name>2", "Enum: Gear", "bus: <object name>", ""}));
}

TEST_F(AllowedItems, AHostFunctionThatFailsAddsNothing) {
    const std::function<txArrayPtr()> answers[] = {
        []() -> txArrayPtr { throw std::runtime_error("broken"); },
        []() -> txArrayPtr { throw 42; },
        [] { return txArrayPtr(); },
        [] { return txArrayPtr(txCreateString("double")); },
        [] { return txArrayPtr(txCreateStructMatrix(1, 1, 0, nullptr)); },
        [] { return txArrayPtr(txCreateCellMatrix(0, 0)); },
    };
    Dialog dialog("the dialog");
    for (std::size_t i = 0; i < std::size(answers); ++i) {
        SCOPED_TRACE("answer " + std::to_string(i));
        answer = answers[i];
        StringVector items;
        GetDataTypeAllowedItems(noEnums, noEnums, noEnums, noEnums, {}, items, &dialog);
        EXPECT_EQ(items.size(), 0u);
        std::vector<std::string> strings;
        GetDataTypeAllowedItems(noEnums, noEnums, noEnums, noEnums, {}, strings, static_cast<txArray_tag*>(nullptr));
        EXPECT_TRUE(strings.empty());
    }
    qlsvSetHostFunction(functionName, {});
    StringVector items;
    GetDataTypeAllowedItems(noEnums, noEnums, noEnums, noEnums, {}, items, &dialog);
    EXPECT_EQ(items.size(), 0u);
}

TEST_F(AllowedItems, CellsWithoutTextAreSkipped) {
    answer = [] {
        txArrayPtr cells(txCreateCellMatrix(2, 2));
        txSetCell(cells.get(), 0, txCreateString("double"));
        txSetCell(cells.get(), 1, txCreateDoubleScalar(1));
        txSetCell(cells.get(), 3, txCreateString("größer"));
        return cells;
    };
    StringVector items;
    GetDataTypeAllowedItems(noEnums, noEnums, noEnums, noEnums, {}, items, nullptr);
    EXPECT_EQ(texts(items), (Texts{"double", "größer"}));
}

TEST_F(AllowedItems, ADialogThatThrowsLeavesNothingBehind) {
    struct Throwing : UDInterface {
        txArrayPtr toHostArray() const override { throw std::runtime_error("closed"); }
    };
    Throwing dialog;
    StringVector items;
    EXPECT_THROW(GetDataTypeAllowedItems(noEnums, noEnums, noEnums, noEnums, {}, items, &dialog), std::runtime_error);
    EXPECT_EQ(numCalls, 0);
}

TEST_F(AllowedItems, MemoryThatRunsOutLeavesNothingBehind) {
    constexpr EnumStr types[] = {{"double", 0}, {"int8", 2}};
    const EnumStrs builtinTypes = {2, types};
    StringVector modes;
    modes.addElement("signed");
    Dialog dialog("the dialog");
    const tcos::COSValue value(txArrayPtr(txCreateString("the value")));
    // Failures inside the host function end in an empty menu, those before it are raised.
    const auto run = [&](auto&& ask) { return testsupport::failEachAllocation(ask, true); };
    StringVector items;
    EXPECT_GT(run([&] {
                  items = {};
                  GetDataTypeAllowedItems(noEnums, &builtinTypes, noEnums, noEnums, {}, items, &dialog);
                  if (items.size() != 2) {
                      EXPECT_EQ(items.size(), 0u);
                  }
              }),
              20u);
    EXPECT_EQ(items.size(), 2u);
    EXPECT_GT(run([&] {
                  items = {};
                  GetDataTypeAllowedItems(noTexts, noTexts, noTexts, &modes, {}, items, "Speed", value);
              }),
              18u);
    EXPECT_EQ(items.size(), 2u);
}

} // namespace
