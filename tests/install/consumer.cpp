// A client of the installed package: compiled and linked with nothing but what the package tells.
//
//   consumer VERSION      ends with 0 when the library that runs has that version
#include <cstdio>
#include <cstring>

#include "qlplatform/services/MessageTexts.h"
#include "qltypes/host/MessageCatalogue.h"
#include "qltypes/host/Version.h"

int main(int argc, char** argv) {
    if (argc != 2 || std::strcmp(argv[1], QLTypeSys::libraryVersion()) != 0 ||
        std::strcmp(argv[1], QLTYPES_VERSION_STRING) != 0) {
        std::fprintf(stderr, "built against %s, runs with %s\n", QLTYPES_VERSION_STRING, QLTypeSys::libraryVersion());
        return 1;
    }
    return 0;
}
