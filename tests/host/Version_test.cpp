#include "qltypes/host/Version.h"

#include <string>

#include <gtest/gtest.h>

namespace {

TEST(Version, LibraryAnswersTheVersionOfTheHeaders) {
    EXPECT_STREQ(QLTypeSys::libraryVersion(), QLTYPES_VERSION_STRING);
}

TEST(Version, StringIsMadeOfTheThreeNumbers) {
    EXPECT_EQ(std::to_string(QLTYPES_VERSION_MAJOR) + "." + std::to_string(QLTYPES_VERSION_MINOR) + "." +
                  std::to_string(QLTYPES_VERSION_PATCH),
              QLTYPES_VERSION_STRING);
}

} // namespace
