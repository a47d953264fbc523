// A table as an engine derives it: reserved words in reach, a client check, a choice about existing names.
#pragma once

#include <string>
#include <vector>

#include <boost/make_shared.hpp>

#include "qltypes/types/DataTypeTable.h"

namespace testsupport {

/// Records what it is shown; vetoes one name by raising a message of the table's own.
struct RecordingClient : QLTypeSys::ClientDataTypeCheckCallback {
    void check(QLTypeSys::DataType* type, const char* blockName) override {
        seen.push_back(std::string(type->getName()) + " from " + (blockName ? blockName : "-"));
        if (vetoed == type->getName()) QLTypeSys::DataTypeTable::throwDataTypeNameIntrinsicFixptError(type->getName());
    }
    void reset() override { ++resets; }

    std::vector<std::string> seen;
    std::string vetoed;
    int resets = 0;
};

struct ClientTable : QLTypeSys::DataTypeTable {
    using DataTypeTable::fixptAtomicWordLengths_;
    using DataTypeTable::reservedIndex_;

    boost::shared_ptr<RecordingClient> install() {
        auto client = boost::make_shared<RecordingClient>();
        clientDataTypeCheckCallback_ = client;
        return client;
    }

    bool shortCircuitRegistration(DataTypeSource) const override { return !declines; }

    bool declines = false;
};

} // namespace testsupport
