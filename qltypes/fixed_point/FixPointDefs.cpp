#include "qltypes/fixed_point/FixPointDefs.h"
