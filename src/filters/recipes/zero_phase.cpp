#include "qx/zero_phase.h"

#include "tests/support/recipe.h"

namespace qx::test {

namespace {

constexpr auto DBL = ElementType::DBL;

double Denominator(int32_t i) { return i == 0 ? 2.0 : 0.25 / i; }
double SectionDenominator(int32_t i) { return i % 2 == 0 ? -0.3 : 0.1; }

// The states are inputs that the export resizes if necessary.
DBL1D State(Call &c, int number) {
    c.mayBeEmpty(number);
    return c.spoiled<DBL>(number, 3);
}

Recipe Direct(const char *name, int32_t na) {
    return {name,
            [na](Call &c) {
                c.mayBeEmpty(1);
                if (na == 0)
                    c.mayBeEmpty(2);
                return zeroPhaseFiltH(c.kept<DBL>(0, c.n), c.in<DBL>(1, na, Denominator),
                                      c.in<DBL>(2, 12), State(c, 3), State(c, 4), State(c, 5),
                                      State(c, 6), 1);
            },
            HostStatusPassesThrough};
}

Recipe Cascade(const char *name, int32_t form) {
    return {name,
            [form](Call &c) {
                const int32_t order = form == 0 ? 2 : 4;
                const int32_t sections = c.n % 5 + 1;
                return zeroPhaseCascadeFiltH(c.kept<DBL>(0, c.n), c.byReference(form),
                                             c.in<DBL>(1, sections * order, SectionDenominator),
                                             c.in<DBL>(2, sections * (order + 1)), State(c, 3),
                                             State(c, 4), 0);
            },
            HostStatusPassesThrough};
}

std::vector<Recipe> ZeroPhaseRecipes() {
    return {Direct("zeroPhaseFiltH: IIR", 6), Direct("zeroPhaseFiltH: FIR", 0),
            Cascade("zeroPhaseCascadeFiltH: second order", 0),
            Cascade("zeroPhaseCascadeFiltH: fourth order", 1)};
}

const RecipeFile file(ZeroPhaseRecipes);

} // namespace

} // namespace qx::test
