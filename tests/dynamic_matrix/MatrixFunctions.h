// What a matrix type and an image that is stored as one have in common.
#pragma once

#include <gtest/gtest.h>

#include "qltypes/dynamic_matrix/DynamicMatrix.h"
#include "qltypes/types/DataType.h"

namespace testsupport {

/// Expects the functions of DynamicMatrix with their names, but for the one that updates a single dimension.
inline void expectMatrixFunctions(const QLTypeSys::DataType& record) {
    using QLTypeSys::DynamicMatrix;
    EXPECT_EQ(record.getConstructFcn(), DynamicMatrix::constructFcn);
    EXPECT_EQ(record.getConstructFcnName(), "constructFcn");
    EXPECT_EQ(record.getDestructFcn(), DynamicMatrix::destructFcn);
    EXPECT_EQ(record.getDestructFcnName(), "destructFcn");
    EXPECT_EQ(record.getDeepCopyFcn(), DynamicMatrix::copyFcn);
    EXPECT_EQ(record.getDeepCopyFcnName(), "copyFcn");
    EXPECT_EQ(record.getSizeOfFcn(), DynamicMatrix::getSizeFcn);
    EXPECT_EQ(record.getSizeOfFcnName(), "getSizeFcn");
    EXPECT_EQ(record.getContainedDataFcn(), DynamicMatrix::getDataFcn);
    EXPECT_EQ(record.getContainedDataFcnName(), "getDataFcn");
    EXPECT_EQ(record.getContainedDataDimsFcn(), DynamicMatrix::getDataDimsFcn);
    EXPECT_EQ(record.getContainedDataDimsFcnName(), "getDataDimsFcn");
    EXPECT_EQ(record.getUpdateContainedDataDimsFcn(), DynamicMatrix::updateDataDimsFcn);
    EXPECT_EQ(record.getUpdateContainedDataDimsFcnName(), "updateDataDimsFcn");
    EXPECT_EQ(record.getDataConstructFcn(), DynamicMatrix::dataConstructFcn);
    EXPECT_EQ(record.getDataConstructFcnName(), "dataConstructFcn");
}

} // namespace testsupport
