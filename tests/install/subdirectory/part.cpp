#include "qltypes/host/Version.h"

const char* versionThroughPart() { return QLTypeSys::libraryVersion(); }
