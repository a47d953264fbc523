// Wherever an allocation fails, a registration leaves the table whole and a value operation leaves the value usable.
#include <cstring>
#include <functional>
#include <new>

#include <gtest/gtest.h>

#include "qlplatform/strings/DynamicStringPool.h"
#include "qltypes/date_time/DateTimeType.h"
#include "qltypes/dynamic_matrix/DynamicMatrix.h"
#include "qltypes/dynamic_matrix/DynamicMatrixMemoryManager.h"
#include "qltypes/image/ImageDataType.h"
#include "qltypes/types/DataTypeTableUtils.h"
#include "qltypes/types/StringDataType.h"
#include "tests/support/FailingNew.h"
#include "tests/types/ClientTable.h"

namespace {

using QLTypeSys::DynamicMatrix;
using QLTypeSys::DynamicMatrixMemoryManager;
using QLTypeSys::StringDataType;
using testsupport::ClientTable;

// Runs `work` with its n-th allocation failing; whether it had that many.
bool failsAt(unsigned long n, const std::function<void()>& work) {
    bool threw = false;
    testsupport::failNewAt(n);
    try {
        work();
    } catch (const std::bad_alloc&) {
        threw = true;
    }
    const bool reached = testsupport::failNewAt(0);
    EXPECT_EQ(threw, reached);
    return reached;
}

struct Registration {
    const char* name;
    std::function<int(ClientTable&)> run;
};

const Registration registrations[] = {
    {"string", [](ClientTable& t) { return t.registerStringDataType(123456789, nullptr); }},
    {"date-time", [](ClientTable& t) { return t.registerDateTimeDataType(QLDateTime::DateTimeType(), nullptr); }},
    {"matrix", [](ClientTable& t) { return t.registerDynamicMatrixDataType(DATA_TYPE_ID_BOOLEAN, 2); }},
    {"image",
     [](ClientTable& t) {
         return t.registerImageDataType(31, SSImageColorFormat_Spectral, SSImageDataLayout_ColumnMajorPlanar,
                                        DATA_TYPE_ID_BOOLEAN);
     }},
};

void expectWhole(const ClientTable& table) {
    for (int id = -1; id + 1 < static_cast<int>(table.getNumDataTypes()); ++id) {
        EXPECT_EQ(DtGetDataTypeId(&table, DtGetDataTypeName(&table, id)), id);
        if (id >= 14) {
            EXPECT_GT(DtGetDataTypeSize(&table, id), 0) << DtGetDataTypeName(&table, id);
        }
    }
}

TEST(AllocationFailure, ARegistrationHappensWhollyOrNotAtAll) {
    for (bool declines : {false, true}) // true: a registration replaces what is there
        for (const Registration& registration : registrations)
            for (unsigned long n = 1;; ++n) {
                SCOPED_TRACE(testing::Message() << registration.name << ", allocation " << n << ", " << declines);
                ClientTable table;
                int before = DATA_TYPE_ID_INVALID;
                if (declines) before = registration.run(table);
                table.declines = declines;
                const std::size_t numTypes = table.getNumDataTypes();
                const bool failed = failsAt(n, [&] { registration.run(table); });
                expectWhole(table);
                EXPECT_GE(table.getNumDataTypes(), numTypes);
                const int id = registration.run(table);
                if (declines) {
                    EXPECT_EQ(id, before);
                }
                expectWhole(table);
                if (!failed) {
                    EXPECT_GT(n, 1u);
                    break;
                }
            }
}

TEST(AllocationFailure, ATextStaysWhatItWas) {
    const std::u16string text = u"a text that is too long to be held without memory";
    const StringDataType type(14, "string", 0);
    for (unsigned long n = 1;; ++n) {
        SCOPED_TRACE(testing::Message() << "allocation " << n);
        void* from = nullptr;
        void* to = nullptr;
        type.constructScalarElement(&from);
        StringDataType::writeUStringScalarToVoidPtrOutput(std::u16string(text), &from, 0);
        const bool failed = failsAt(n, [&] { type.deepCopyScalarElement(&from, &to); });
        EXPECT_EQ(StringDataType::getUStringScalarFromVoidPtrInput(&from), text);
        if (to) {
            EXPECT_EQ(StringDataType::getUStringScalarFromVoidPtrInput(&to), failed ? u"" : text);
        }
        type.destroyScalarElement(&from);
        type.destroyScalarElement(&to);
        if (!failed) break;
    }
    using stringutil::DynamicStringPool;
    EXPECT_EQ(DynamicStringPool::GetPool(DynamicStringPool::GlobalPoolName).size(), 0u);
}

TEST(AllocationFailure, AMatrixCanStillBeUsedAndTakenDown) {
    const unsigned long dims[] = {3, 4};
    const unsigned long larger[] = {30, 40};
    const std::vector<char> data(12, 'x');
    for (unsigned long n = 1;; ++n) {
        SCOPED_TRACE(testing::Message() << "allocation " << n);
        DynamicMatrix kept;
        DynamicMatrix::dataConstructFcn(2, dims, 1, data.data(), &kept);
        DynamicMatrix changed;
        DynamicMatrix copy;
        const bool failed = failsAt(n, [&] {
            DynamicMatrix::dataConstructFcn(2, dims, 1, data.data(), &changed);
            DynamicMatrix::updateDataDimsFcn(2, larger, 1, &changed);
            DynamicMatrix::copyFcn(&copy, &changed);
        });
        EXPECT_EQ(std::memcmp(kept.rawData, data.data(), data.size()), 0);
        for (DynamicMatrix* m : {&changed, &copy}) {
            if (!m->rawData) DynamicMatrixMemoryManager::GetMemoryManager().Deallocate({m, nullptr});
            DynamicMatrix::dataConstructFcn(2, dims, 1, data.data(), m);
            EXPECT_EQ(std::memcmp(m->rawData, data.data(), data.size()), 0);
        }
        if (!failed) break;
    }
    EXPECT_EQ(DynamicMatrixMemoryManager::GetMemoryManager().numBlocks(), 0u);
}

TEST(AllocationFailure, AValueIsBuiltAndCopiedByIdOrNotAtAll) {
    struct Slot {
        alignas(16) unsigned char bytes[sizeof(DynamicMatrix)] = {};
    };
    ClientTable table;
    const int text = table.registerStringDataType(0, "Text");
    const int matrix = table.registerDynamicMatrixDataType(DATA_TYPE_ID_UINT8, 2);
    const int image =
        table.registerImageDataType(3, SSImageColorFormat_RGB, SSImageDataLayout_ColumnMajorPlanar, DATA_TYPE_ID_UINT8);
    const unsigned long dims[] = {5, 7, 3};
    const std::vector<char> data(5 * 7 * 3, 'x');
    const auto fill = [&](int id, Slot& slot) {
        if (id == text)
            StringDataType::writeUStringScalarToVoidPtrOutput(u"a text that is too long for a slot", &slot, 0);
        else
            EXPECT_TRUE(table.dataConstruct(id, id == image ? 3 : 2, dims, 1, data.data(), &slot));
    };
    const auto isFilled = [&](int id, Slot& slot) {
        if (id == text)
            return StringDataType::getUStringScalarFromVoidPtrInput(&slot) == u"a text that is too long for a slot";
        const void* const held = table.getDataTypeAt(static_cast<unsigned long>(id + 1))->containedData(&slot);
        return held && std::memcmp(held, data.data(), id == image ? 105 : 35) == 0;
    };
    using stringutil::DynamicStringPool;
    const DynamicStringPool& pool = DynamicStringPool::GetPool(DynamicStringPool::GlobalPoolName);
    const DynamicMatrixMemoryManager& matrices = DynamicMatrixMemoryManager::GetMemoryManager();
    for (const int id : {text, matrix, image})
        for (unsigned long n = 1;; ++n) {
            SCOPED_TRACE(testing::Message() << DtGetDataTypeName(&table, id) << ", allocation " << n);
            Slot from, to;
            const bool built = !failsAt(n, [&] { table.construct(id, &from); });
            EXPECT_EQ(pool.size(), built && id == text ? 1u : 0u);
            EXPECT_EQ(matrices.numBlocks(), 0u);
            if (!built) table.construct(id, &from);
            fill(id, from);
            table.construct(id, &to);
            const bool copied = !failsAt(n, [&] { table.deepCopy(id, &to, &from); });
            EXPECT_TRUE(isFilled(id, from));
            if (!copied) table.deepCopy(id, &to, &from);
            EXPECT_TRUE(isFilled(id, to));
            table.destruct(id, &from);
            table.destruct(id, &to);
            EXPECT_EQ(pool.size(), 0u);
            EXPECT_EQ(matrices.numBlocks(), 0u);
            if (built && copied) break;
        }
}

} // namespace
