#include <gtest/gtest.h>

#include "qlplatform/dialogs/UDInterface.h"

namespace {

struct Widget : UDInterface {
    explicit Widget(bool hasHostForm) : hasHostForm_(hasHostForm) {}
    txArrayPtr toHostArray() const override {
        return hasHostForm_ ? txArrayPtr(txCreateString("widget")) : txArrayPtr();
    }
    bool hasHostForm_;
};

TEST(UDInterface, ObjectsBecomeHostArrays) {
    const UDInterfaceType* type = UDInterfaceType::getType();
    EXPECT_EQ(type, UDInterfaceType::getType());
    const Widget shown(true);
    const txArrayPtr array(uddtConvertToTorvex(&shown, type));
    EXPECT_EQ(txArrayToUTF8StdString(array.get()), "widget");
    const Widget hidden(false);
    EXPECT_EQ(uddtConvertToTorvex(&hidden, type), nullptr);
    EXPECT_EQ(uddtConvertToTorvex(nullptr, type), nullptr);
}

TEST(StringVector, KeepsItsTextsInOrder) {
    StringVector texts;
    EXPECT_EQ(texts.size(), 0u);
    std::string changing = "one";
    texts.addElement(changing.c_str());
    changing = "two";
    texts.addElement(nullptr);
    texts.addElement("");
    ASSERT_EQ(texts.size(), 3u);
    EXPECT_STREQ(texts.element(0), "one");
    EXPECT_EQ(texts.element(1), nullptr);
    EXPECT_STREQ(texts.element(2), "");
}

} // namespace
