#ifndef QX_TESTS_FUZZ_COST_H
#define QX_TESTS_FUZZ_COST_H

#include "tests/fuzz/attack.h"
#include "tests/fuzz/scenario.h"

namespace qx::test {

// Makes a call with little data and numbers of any magnitude, in a separate process: its processor
// time and memory must be bounded by the amount of data that it reads and writes.
Outcome RunCost(Random &random, const Subject &subject);
// Prints the highest costs.
void PrintCosts();

} // namespace qx::test

#endif
