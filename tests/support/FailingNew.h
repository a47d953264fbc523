// Allocation functions of the language that can be told to fail. A test that uses them compiles FailingNew.cpp into its
// program, which then allocates through them everywhere, in the libraries too.
#pragma once

namespace testsupport {

/// Makes the `n`-th allocation that throws (1 is the next) throw std::bad_alloc; 0 lets all of them pass again. Answers
/// whether the one asked for before was reached.
bool failNewAt(unsigned long n);

/// Makes the `n`-th array allocation that answers null (1 is the next) do so; 0 lets all of them pass again. Requests
/// beyond a terabyte always fail.
void failNothrowNewAt(unsigned long n);

} // namespace testsupport
