// A client of the installed package, compiled and linked with nothing but what the package tells, everything hidden: it
// derives its own table, and catches what the library throws.
//
//   consumer VERSION      ends with 0 when all is well and the library that runs has that version
#include <cstdio>
#include <cstring>
#include <string>

#include "qlplatform/services/IException.h"
#include "qltypes/host/Version.h"
#include "qltypes/types/DataTypeTable.h"

namespace {

// Replaces records instead of answering the id of the name, and asks this client about each registration.
class ClientTable : public QLTypeSys::DataTypeTable {
  public:
    bool shortCircuitRegistration(DataTypeSource) const override { return false; }
};

int failures = 0;

void expect(bool claim, const char* what) {
    if (claim) return;
    std::fprintf(stderr, "not so: %s\n", what);
    ++failures;
}

} // namespace

int main(int argc, char** argv) {
    expect(argc == 2 && std::strcmp(argv[1], QLTypeSys::libraryVersion()) == 0, "the library has the version given");
    expect(std::strcmp(QLTYPES_VERSION_STRING, QLTypeSys::libraryVersion()) == 0,
           "headers and library are of a version");

    ClientTable table;
    const QLTypeSys::DataTypeTable& base = table;
    expect(dynamic_cast<const ClientTable*>(&base) == &table, "a derived table is found again behind its base");
    const int id = table.registerDataType("Torque", DataTypeSource(2), nullptr);
    expect(table.registerDataType("Torque", DataTypeSource(7), nullptr) == id, "a declined short circuit replaces");

    std::string caught;
    try {
        table.registerDataType("no identifier", DataTypeSource(2), nullptr);
    } catch (const foundation::core::except::IException& e) {
        caught = e.what();
    }
    expect(caught.find("no identifier") != std::string::npos, "what the library throws is caught and tells the name");
    return failures == 0 ? 0 : 1;
}
