#ifndef QX_TESTS_FUZZ_COST_H
#define QX_TESTS_FUZZ_COST_H

#include "tests/fuzz/attack.h"
#include "tests/fuzz/scenario.h"

namespace qx::test {

// A call with few data whose numbers are of any size, in a process of its own: what it takes of the
// processor and of memory is bounded by what it reads and writes.
Outcome RunCost(Random &random, const Subject &subject);
// The highest costs there were.
void PrintCosts();

} // namespace qx::test

#endif
