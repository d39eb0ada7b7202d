#ifndef QX_TESTS_RECIPES_SCALAR_H
#define QX_TESTS_RECIPES_SCALAR_H

#include "tests/support/recipe.h"

#include <limits>

namespace qx::test {

// A recipe for a function of one number, with arguments that reach each of its methods as the size
// grows.
inline Recipe OfNumber(const char *name, void (*function)(double, double *)) {
    return {name,
            [function](Call &c) {
                int output = 0;
                for (const double x : {0.01 * c.n, 0.3 * c.n, 0.5 * c.n, 1.7 * c.n, 3.3 * c.n,
                                       -0.7 * c.n, std::numeric_limits<double>::quiet_NaN()})
                    function(x, c.scalar(output++));
                return 0;
            },
            NoStatus};
}

// A function of two numbers, likewise.
inline Recipe OfTwoNumbers(const char *name, void (*function)(double, double, double *)) {
    return {name,
            [function](Call &c) {
                const double x = c.n;
                const double arguments[][2] = {
                    {0.3, x},        {x, 2.5},
                    {-0.6, 0.4 * x}, {2.25, 0.1 * x},
                    {0.7 * x, 1.5},  {0.5, std::numeric_limits<double>::quiet_NaN()}};
                int output = 0;
                for (const auto &a : arguments)
                    function(a[0], a[1], c.scalar(output++));
                return 0;
            },
            NoStatus};
}

} // namespace qx::test

#endif
