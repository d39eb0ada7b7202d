#include "qx/nonlinear_fits.h"
#include "tests/support/recipe.h"

#include <cmath>

namespace qx::test {

namespace {

constexpr auto DBL = ElementType::DBL;
constexpr double inf = std::numeric_limits<double>::infinity();

double Position(int32_t i) { return 0.25 * (i % 16) + 0.5; }
double Peak(int32_t i) {
    const double z = Position(i) - 2.25;
    return 4.0 / (1.0 + z * z) + 0.5 + 0.03125 * (i % 5 - 2) + (i % 11 == 7);
}

// The resonance a / (1 + ((x - m) / s)^2) + c, which needs nothing but basic arithmetic.
int32_t Resonance(void *, const ::DBL *x, int32_t xCount, const ::DBL *p, int32_t, ::DBL *out,
                  int32_t n) {
    if (xCount < n || x[0] > 1e200)
        return 1;
    for (int32_t i = 0; i < n; ++i) {
        const double z = (x[i] - p[1]) / p[2];
        out[i] = p[0] / (1.0 + z * z) + p[3];
    }
    return 0;
}
int32_t Slopes(void *, const ::DBL *x, int32_t, const ::DBL *p, int32_t, ::DBL *out, int32_t n) {
    for (int32_t i = 0; i < n; ++i, out += 4) {
        const double z = (x[i] - p[1]) / p[2], part = 1.0 / (1.0 + z * z);
        out[0] = part;
        out[1] = 2.0 * p[0] * part * part * z / p[2];
        out[2] = out[1] * z;
        out[3] = 1.0;
    }
    return 0;
}

DBL1D Values(Call &c, int number, const double *values) {
    c.mayBeEmpty(number);
    return c.in<DBL>(number, 4, [values](int32_t i) { return i < 4 ? values[i] : 0.0; });
}
DBL1D Weights(Call &c, int number) {
    c.mayBeEmpty(number);
    return c.in<DBL>(number, c.n, [](int32_t i) { return 0.5 + i % 4; });
}

constexpr double start[] = {3.0, 2.0, 0.75, 0.25};
constexpr double lower[] = {0.0, 0.0, 0.125, 0.625}, upper[] = {inf, 5.0, 5.0, inf};

int32_t Fit(Call &c, FitProcedure jacobian, int32_t loss) {
    int32_t *const iterations = c.integer(0);
    *iterations = 50;
    const auto guess = c.in<DBL>(3, 4, [](int32_t i) { return i < 4 ? start[i] : 0.0; });
    c.mayBeEmpty(0);
    return NonlinearFit2026(c.in<DBL>(0, c.n, Position), c.in<DBL>(1, c.n, Peak), Weights(c, 2),
                            Resonance, jacobian, nullptr, guess, Values(c, 4, lower),
                            Values(c, 5, upper), loss, 0.125, 1e-9, iterations, c.out<DBL>(0),
                            c.out2D<DBL>(1), c.out<DBL>(2), c.scalar(0), c.integer(1));
}

std::vector<Recipe> NonlinearRecipes() {
    const char *const losses[] = {"linear", "soft", "Huber", "Cauchy", "arctan"};
    std::vector<Recipe> recipes;
    for (int32_t loss = 0; loss < 5; ++loss)
        for (const FitProcedure jacobian : {FitProcedure(nullptr), FitProcedure(Slopes)})
            recipes.push_back({std::string("NonlinearFit2026: ") + losses[loss] +
                                   (jacobian != nullptr ? ", derivatives" : ""),
                               [loss, jacobian](Call &c) { return Fit(c, jacobian, loss); },
                               None,
                               {4, 8, 50, 1000}});
    return recipes;
}

const RecipeFile nonlinear(NonlinearRecipes);

} // namespace

} // namespace qx::test
