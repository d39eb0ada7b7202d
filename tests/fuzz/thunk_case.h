#ifndef QX_TESTS_FUZZ_THUNK_CASE_H
#define QX_TESTS_FUZZ_THUNK_CASE_H

#include "tests/fuzz/attack.h"
#include "tests/fuzz/scenario.h"

namespace qx::test {

// Cases whose arguments come from the catalogue. Each gives the outcome of one of its calls.

// A few calls of one node.
Outcome RunThunkCase(Random &random, const Thunk &thunk);
// One call, and with each pair of arrays of one type as one array, and with all that one array may
// be in its place.
Outcome RunThunkMeetings(Random &random, const Thunk &thunk);
// One call, and while each of its resizes, some of its allocations or a small workspace refuse.
Outcome RunThunkHonesty(Random &random, const Thunk &thunk);

} // namespace qx::test

#endif
