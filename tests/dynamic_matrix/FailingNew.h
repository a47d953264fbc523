// An array allocation that can be told to fail: this program's own operator new[] of the form that answers null.
#pragma once

namespace testsupport {

/// Makes the `n`-th nothrow array allocation from now on (1 is the next) answer null; 0 lets all of them pass again.
/// Requests beyond a terabyte always fail.
void failNewAt(unsigned long n);

} // namespace testsupport
