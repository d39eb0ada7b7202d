#ifndef QX_TESTS_FUZZ_THUNK_CASE_H
#define QX_TESTS_FUZZ_THUNK_CASE_H

#include "tests/fuzz/attack.h"
#include "tests/fuzz/scenario.h"

namespace qx::test {

// Cases whose arguments come from the catalogue. Each returns the outcome of one of its calls.

// A few calls on one node.
Outcome RunThunkCase(Random &random, const Thunk &thunk);
// One call, then calls with each pair of arrays of one type as one array, and, for each array, a
// call with it and all later ones of its type as one array.
Outcome RunThunkMeetings(Random &random, const Thunk &thunk);
// One call, then calls in which each of its resizes, some of its allocations or a small workspace
// refuses.
Outcome RunThunkHonesty(Random &random, const Thunk &thunk);

} // namespace qx::test

#endif
