#include "qltypes/host/AllowedItems.h"

#include <algorithm>
#include <array>
#include <string_view>

#include "qlplatform/services/Diagnostics.h"
#include "qlplatform/services/HostFunctions.h"

using QLTypeSys::AdditionalType;

namespace {

// By field number.
constexpr const char* fieldNames[] = {
    "inheritRules",     "builtinTypes",    "scalingModes",       "signModes",
    "supportsEnumType", "supportsBusType", "supportsStringType", "aliasObjectName",
};
constexpr int firstSupportField = 4;
constexpr int numSupportFields = 3;
constexpr int numFieldsWithoutAlias = firstSupportField + numSupportFields;

constexpr std::string_view templates[] = {
    "Enum: <class name>",
    "Bus: <object name>",
    "<data type expression>",
};

std::vector<const char*> textsOf(const EnumStrs& list) {
    std::vector<const char*> texts;
    for (std::int32_t i = 0; i < list.count; ++i)
        if (list.entries[i].flag != 1) texts.push_back(list.entries[i].name);
    return texts;
}

std::vector<const char*> textsOf(const StringVector& list) {
    std::vector<const char*> texts;
    for (std::size_t i = 0; i < list.size(); ++i)
        texts.push_back(list.element(i));
    return texts;
}

txArrayPtr rowOfTexts(const std::vector<const char*>& texts) {
    txArrayPtr row(txCreateCellMatrix(1, texts.size()));
    for (std::size_t i = 0; i < texts.size(); ++i)
        txSetCell(row.get(), i, txCreateString(texts[i]));
    return row;
}

// Returns the number of the next free field.
int setSupportFields(txArray_tag* question, const std::vector<AdditionalType>& additionalTypes) {
    int field = firstSupportField;
    for (int type = 0; type < numSupportFields; ++type, ++field) {
        const bool isSupported = std::find(additionalTypes.begin(), additionalTypes.end(),
                                           static_cast<AdditionalType>(type)) != additionalTypes.end();
        txSetFieldByNumber(question, 0, field, txCreateLogicalScalar(isSupported));
    }
    return field;
}

// The structure that tells the host function what the parameter may hold; the alias name may be null.
template <class List>
txArrayPtr makeQuestion(const std::array<const List*, 4>& lists, const std::vector<AdditionalType>& additionalTypes,
                        const std::string* aliasObjectName = nullptr) {
    txArrayPtr question(txCreateStructMatrix(1, 1, numFieldsWithoutAlias + (aliasObjectName ? 1 : 0), fieldNames));
    int field = 0;
    for (const List* list : lists) {
        if (list) txSetFieldByNumber(question.get(), 0, field, rowOfTexts(textsOf(*list)).release());
        ++field;
    }
    const int nextField = setSupportFields(question.get(), additionalTypes);
    if (aliasObjectName) txSetFieldByNumber(question.get(), 0, nextField, txCreateString(aliasObjectName->c_str()));
    return question;
}

void askHost(const txArrayPtr& question, txArray_tag* context, StringVector& items) {
    txArray_tag* inputs[] = {question.get(), context};
    txArray_tag* output = nullptr;
    qlsvDiagnosticImpl* ignored =
        qlsvFEVAL_NoThrow(1, &output, 2, inputs, "Quillane.DataTypePrmWidget.getDataTypeAllowedItems", true, nullptr);
    qlsvDiscardDiagnostic(ignored); // kept: a dialog whose host function fails shows an empty menu
    const txArrayPtr menu(output);
    if (txGetClassID(menu.get()) != txClassCell) return;
    for (std::size_t i = 0; i < txGetNumberOfElements(menu.get()); ++i) {
        const txArray_tag* cell = txGetCell(menu.get(), i);
        if (txGetClassID(cell) != txClassChar) continue;
        const std::string text = txArrayToUTF8StdString(cell);
        if (std::find(std::begin(templates), std::end(templates), text) == std::end(templates))
            items.addElement(text.c_str());
    }
}

void askHost(const txArrayPtr& question, const UDInterface* context, StringVector& items) {
    const qlsvLocalScope scope;
    txArray_tag* array = uddtConvertToTorvex(context, UDInterfaceType::getType());
    if (array) qlsvSetLocalScope(array);
    askHost(question, array, items);
}

} // namespace

void GetDataTypeAllowedItems(const EnumStrs* inheritRules, const EnumStrs* builtinTypes, const EnumStrs* scalingModes,
                             const EnumStrs* signModes, const std::vector<AdditionalType>& additionalTypes,
                             StringVector& items, UDInterface* context) {
    const std::array lists = {inheritRules, builtinTypes, scalingModes, signModes};
    askHost(makeQuestion(lists, additionalTypes), context, items);
}

void GetDataTypeAllowedItems(const StringVector* inheritRules, const StringVector* builtinTypes,
                             const StringVector* scalingModes, const StringVector* signModes,
                             const std::vector<AdditionalType>& additionalTypes, StringVector& items,
                             UDInterface* context) {
    const std::array lists = {inheritRules, builtinTypes, scalingModes, signModes};
    askHost(makeQuestion(lists, additionalTypes), context, items);
}

void GetDataTypeAllowedItems(const StringVector* inheritRules, const StringVector* builtinTypes,
                             const StringVector* scalingModes, const StringVector* signModes,
                             const std::vector<AdditionalType>& additionalTypes, StringVector& items,
                             const std::string& aliasObjectName, const tcos::COSValue& context) {
    const std::array lists = {inheritRules, builtinTypes, scalingModes, signModes};
    askHost(makeQuestion(lists, additionalTypes, &aliasObjectName), context.getHostArray(), items);
}

void GetDataTypeAllowedItems(const EnumStrs* inheritRules, const EnumStrs* builtinTypes, const EnumStrs* scalingModes,
                             const EnumStrs* signModes, const std::vector<AdditionalType>& additionalTypes,
                             std::vector<std::string>& items, txArray_tag* context) {
    const std::array lists = {inheritRules, builtinTypes, scalingModes, signModes};
    StringVector collected;
    askHost(makeQuestion(lists, additionalTypes), context, collected);
    for (std::size_t i = 0; i < collected.size(); ++i)
        if (const char* item = collected.element(i)) items.emplace_back(item);
}
