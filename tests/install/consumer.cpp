// A client of the installed package, compiled and linked with nothing but what the package tells, everything hidden: it
// derives its own table with buses, a check of registrations and replacement of records, and catches what is thrown
// through the library, by the library and by itself.
//
//   consumer VERSION      ends with 0 when all is well and the library that runs has that version
#include <cstdio>
#include <cstring>
#include <memory>
#include <string>

#include <boost/make_shared.hpp>

#include "qlplatform/services/Diagnostics.h"
#include "qlplatform/services/IException.h"
#include "qltypes/host/Version.h"
#include "qltypes/structures/StructDataType.h"
#include "qltypes/structures/StructDataTypeUtils.h"
#include "qltypes/structures/StructLayout.h"
#include "qltypes/types/DataTypeTable.h"
#include "qltypes/types/DataTypeTableUtils.h"

namespace {

constexpr DataTypeSource client = static_cast<DataTypeSource>(2);

int failures = 0;

void expect(bool claim, const char* what) {
    if (claim) return;
    std::fprintf(stderr, "not so: %s\n", what);
    ++failures;
}

// The client's own failure: an exception of the library's family that the library knows nothing of.
class Veto : public foundation::core::except::IException {
  public:
    explicit Veto(const std::string& name) : text_("the model has no place for " + name) {}
    const char* what() const noexcept override { return text_.c_str(); }
    const qlsvDiagnosticImpl* diagnostic() const noexcept override { return nullptr; }

  private:
    std::string text_;
};

class Check : public QLTypeSys::ClientDataTypeCheckCallback {
  public:
    void check(QLTypeSys::DataType* type, const char*) override {
        if (std::strcmp(type->getName(), "Forbidden") == 0) throw Veto(type->getName());
        ++accepted;
    }
    void reset() override { accepted = 0; }

    int accepted = 0;
};

class ModelBus : public BusDataType {
  public:
    using BusDataType::BusDataType;
};

// Has buses; replaces records instead of answering the id of the name.
class ClientTable : public QLTypeSys::DataTypeTable {
  public:
    explicit ClientTable(boost::shared_ptr<Check> check) { clientDataTypeCheckCallback_ = std::move(check); }

    int registerBusDataType(const char* name, DataTypeSource source, const char* blockName) override {
        validateDataTypeName(name);
        auto record = std::make_unique<ModelBus>(getNumDataTypes() - 1, name, source);
        ModelBus* const bus = record.get();
        addDataType(record.release());
        try {
            clientDataTypeCheckCallback_->check(bus, blockName);
        } catch (const foundation::core::except::IException&) {
            removeDataType(bus);
            throw;
        }
        return bus->getId();
    }
    bool shortCircuitRegistration(DataTypeSource) const override { return false; }
};

void versions(const char* wanted) {
    expect(std::strcmp(wanted, QLTypeSys::libraryVersion()) == 0, "the library has the version given");
    expect(std::strcmp(QLTYPES_VERSION_STRING, QLTypeSys::libraryVersion()) == 0,
           "headers and library are of a version");
}

void replacement(ClientTable& table) {
    const QLTypeSys::DataTypeTable& base = table;
    expect(dynamic_cast<const ClientTable*>(&base) == &table, "a derived table is found again behind its base");
    const int id = table.registerDataType("Torque", client, nullptr);
    expect(table.registerDataType("Torque", static_cast<DataTypeSource>(7), nullptr) == id,
           "a declined short circuit keeps the identifier");
    expect(table.getDataTypeAliasedThruTo(id)->getDataTypeSource() == static_cast<DataTypeSource>(7),
           "and replaces the record");
}

void buses(ClientTable& table) {
    const int id = table.registerBusDataType("Sensor", client, nullptr);
    expect(DtGetDataTypeIsBus(&table, id), "a derived record is a bus");
    expect(dynamic_cast<const ModelBus*>(DtGetBusDataTypeObject(&table, id)) != nullptr, "and of the client's class");
    DtSetDataTypeNumElements(&table, nullptr, id, 2);
    const auto& elements = DtGetStructDataTypeObject(&table, id)->getElements();
    elements[0]->setName("valid");
    elements[0]->setDataTypeId(DATA_TYPE_ID_BOOLEAN);
    elements[1]->setName("value");
    elements[1]->setDataTypeId(DATA_TYPE_ID_DOUBLE);
    expect(DtComputeDerivedStructAttributes(&table, id) == nullptr, "a bus is laid out");
    expect(DtGetDataTypeSize(&table, id) == 16, "with its padding");
}

void exceptions(ClientTable& table, const Check& check) {
    std::string caught;
    try {
        table.registerDataType("no identifier", client, nullptr);
    } catch (const foundation::core::except::IException& e) {
        caught = e.what();
        expect(e.diagnostic() && e.diagnostic()->numItems() == 1, "what the library throws carries its message");
    }
    expect(caught.find("no identifier") != std::string::npos, "what the library throws is caught and tells the name");

    const int types = table.getNumDataTypes();
    const int accepted = check.accepted;
    try {
        table.registerDataType("Forbidden", client, nullptr);
        caught.clear();
    } catch (const Veto& veto) {
        caught = veto.what();
    }
    expect(caught == "the model has no place for Forbidden", "the client's exception comes back through the library");
    expect(table.getNumDataTypes() == types, "a vetoed type leaves nothing behind");
    table.registerDataType("Allowed", client, nullptr);
    expect(check.accepted == accepted + 1, "the client is asked about each registration");
    table.resetToBuiltin();
    expect(check.accepted == 0, "and hears of a reset");
}

} // namespace

int main(int argc, char** argv) {
    if (argc != 2) return 2;
    versions(argv[1]);
    const auto check = boost::make_shared<Check>();
    ClientTable table(check);
    replacement(table);
    buses(table);
    exceptions(table, *check);
    return failures == 0 ? 0 : 1;
}
