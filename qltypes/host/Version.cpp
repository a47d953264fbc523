#include "qltypes/host/Version.h"

namespace QLTypeSys {

const char* libraryVersion() noexcept { return QLTYPES_VERSION_STRING; }

} // namespace QLTypeSys
