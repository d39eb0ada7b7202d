#include "qx/zero_phase.h"

#include "tests/support/recipe.h"

namespace qx::test {

namespace {

constexpr auto DBL = ElementType::DBL;

double Denominator(int32_t i) { return i == 0 ? 2.0 : 0.25 / i; }
double SectionDenominator(int32_t i) { return i % 2 == 0 ? -0.3 : 0.1; }

// The states are inputs that the export resizes if necessary.
DBL1D State(Call &c, int number, int32_t count = 3) {
    c.mayBeEmpty(number);
    return c.spoiled<DBL>(number, count);
}

Recipe Direct(const char *name, int32_t na, int32_t ofX = 3, int32_t ofY = 3) {
    return {name,
            [=](Call &c) {
                c.mayBeEmpty(1);
                if (na == 0)
                    c.mayBeEmpty(2);
                return zeroPhaseFiltH(c.kept<DBL>(0, c.n), c.in<DBL>(1, na, Denominator),
                                      c.in<DBL>(2, 12), State(c, 3, ofX), State(c, 4, ofX),
                                      State(c, 5, ofY), State(c, 6, ofY), 1);
            },
            HostStatusPassesThrough};
}

Recipe Cascade(const char *name, int32_t form, bool hasStates = false) {
    return {name,
            [=](Call &c) {
                const int32_t order = form == 0 ? 2 : 4;
                const int32_t sections = c.n % 5 + 1;
                const int32_t ofState = hasStates ? sections * order : 3;
                return zeroPhaseCascadeFiltH(c.kept<DBL>(0, c.n), c.byReference(form),
                                             c.in<DBL>(1, sections * order, SectionDenominator),
                                             c.in<DBL>(2, sections * (order + 1)),
                                             State(c, 3, ofState), State(c, 4, ofState), hasStates);
            },
            HostStatusPassesThrough};
}

std::vector<Recipe> ZeroPhaseRecipes() {
    return {Direct("zeroPhaseFiltH: IIR", 6),
            Direct("zeroPhaseFiltH: FIR", 0),
            Direct("zeroPhaseFiltH: with states", 6, 11, 5),
            Cascade("zeroPhaseCascadeFiltH: second order", 0),
            Cascade("zeroPhaseCascadeFiltH: fourth order", 1),
            Cascade("zeroPhaseCascadeFiltH: with states", 0, true)};
}

const RecipeFile file(ZeroPhaseRecipes);

} // namespace

} // namespace qx::test
