// A feature flag in a chosen state for the length of a test.
#pragma once

#include "qlplatform/services/QlFeature.h"

namespace testsupport {

class FlagState {
  public:
    FlagState(QlFeature* flag, int state) : flag_(flag), before_(flag->state()) { flag->setState(state); }
    ~FlagState() { flag_->setState(before_); }
    FlagState(const FlagState&) = delete;
    FlagState& operator=(const FlagState&) = delete;

  private:
    QlFeature* flag_;
    int before_;
};

} // namespace testsupport
