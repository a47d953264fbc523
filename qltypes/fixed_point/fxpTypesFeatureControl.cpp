#include "qltypes/fixed_point/fxpTypesFeatureControl.h"

#include "qltypes/host/FeatureFlags.h"

namespace fxpTypesFeature {

bool getUseTorvexNameForInt64() { return QLFEAT_UseTorvexNameForInt64->state() != 0; }

void setUseTorvexNameForInt64(bool useTorvexName) {
    QLFEAT_UseTorvexNameForInt64->setState(useTorvexName);
    if (const QlFeature::Callback& changed = QLFEAT_UseTorvexNameForInt64->callback())
        changed(*QLFEAT_UseTorvexNameForInt64);
}

} // namespace fxpTypesFeature
