// The host object of a record: one reference held, given up with the record.

#include <gtest/gtest.h>

#include "qlplatform/arrays/HostArray.h"
#include "qltypes/types/DataTypeTable.h"
#include "qltypes/types/DataTypeTableUtils.h"

namespace {

TEST(Interface, ARecordKeepsItsArrayAndLetsItGo) {
    const std::size_t before = txGetNumLiveArrays();
    {
        QLTypeSys::DataTypeTable table;
        const int id = table.registerDataType("Gear", dtSourceEnum, nullptr);
        QLTypeSys::DataType* type = table.getDataTypeAt(static_cast<unsigned long>(id + 1));
        const txArrayPtr mine(txCreateString("mine"));
        type->setInterface(mine.get());
        EXPECT_EQ(type->getInterface(), mine.get());
        EXPECT_EQ(DtGetDataTypeInterface(&table, id), mine.get());
        EXPECT_EQ(txGetReferenceCount(mine.get()), 2u);
        EXPECT_FALSE(txIsTemporary(mine.get()));

        txArrayPtr second(txCreateString("second"));
        type->setInterface(second.get());
        EXPECT_EQ(txGetReferenceCount(mine.get()), 1u);
        second.reset(); // the record's reference is the only one left
        EXPECT_EQ(txArrayToUTF8StdString(type->getInterface()), "second");

        type->setInterface(type->getInterface());
        EXPECT_EQ(txArrayToUTF8StdString(type->getInterface()), "second");
        EXPECT_EQ(txGetReferenceCount(type->getInterface()), 1u);

        type->setInterface(nullptr);
        EXPECT_EQ(type->getInterface(), nullptr);
        EXPECT_EQ(txGetNumLiveArrays(), before + 1);
        type->setInterface(mine.get());
    }
    EXPECT_EQ(txGetNumLiveArrays(), before);
}

} // namespace
