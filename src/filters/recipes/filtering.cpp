#include "qx/filtering.h"

#include "tests/support/recipe.h"

#include <algorithm>

namespace qx::test {

namespace {

constexpr auto DBL = ElementType::DBL;
constexpr auto CDB = ElementType::CDB;

const uint8_t clears = 0;
const uint8_t keeps = 1;

// A decaying recursion, after an a[0] of 2.
double Denominator(int32_t i) { return i == 0 ? 2.0 : 0.25 / i; }
// Poles well inside the unit circle.
double SectionDenominator(int32_t i) { return i % 2 == 0 ? -0.3 : 0.1; }

constexpr int32_t taps = 40;

// Without a denominator the numerator may be missing, too.
template <ElementType Coefficients>
auto A(Call &c, int32_t count) {
    c.mayBeEmpty(1);
    if (count == 0)
        c.mayBeEmpty(2);
    return c.in<Coefficients>(1, count, Denominator);
}

// The states are inputs that the export resizes if necessary.
template <ElementType Signal>
auto State(Call &c, int number, int32_t count) {
    c.mayBeEmpty(number);
    return c.spoiled<Signal>(number, count);
}

template <ElementType Signal, ElementType Coefficients, class Export>
Recipe OfTwoStates(const char *name, Export filter, int32_t na) {
    return {name,
            [=](Call &c) {
                return filter(c.inOut<Signal>(0), A<Coefficients>(c, na),
                              c.in<Coefficients>(2, taps), State<Signal>(c, 3, taps - 1),
                              State<Signal>(c, 4, 5), &keeps, c.err());
            },
            HostStatusInResult | MayKeepArrayOnFailure};
}

template <ElementType Signal, class Export>
Recipe OfOneState(const char *name, Export filter, int32_t na) {
    return {name, [=](Call &c) {
                c.mayBeEmpty(3);
                return filter(c.inOut<Signal>(0), A<DBL>(c, na), c.in<DBL>(2, taps),
                              c.inOut<Signal>(3, taps - 1 + na), &clears);
            }};
}

template <ElementType Signal, class Export>
Recipe InOneStream(const char *name, Export filter, int32_t na) {
    return {name, [=](Call &c) {
                c.mayBeEmpty(3);
                return filter(c.inOut<Signal>(0), A<DBL>(c, na), c.in<DBL>(2, taps),
                              c.inOut<Signal>(3, taps - 1 + std::max(na - 1, 0)), &keeps);
            }};
}

template <ElementType Signal, class Export>
Recipe OfCascade(const char *name, Export filter, int32_t form, bool hasState = false) {
    return {name,
            [=](Call &c) {
                const int32_t order = form == 0 ? 2 : 4;
                const int32_t sections = c.n % 11 + 1;
                return filter(c.inOut<Signal>(0), c.byReference(form),
                              c.in<DBL>(1, sections * order, SectionDenominator),
                              c.in<DBL>(2, sections * (order + 1)),
                              State<Signal>(c, 3, hasState ? sections * order : 1), &keeps,
                              c.err());
            },
            HostStatusInResult | MayKeepArrayOnFailure};
}

template <ElementType Signal, class Export>
Recipe OfSample(const char *name, Export filter, int32_t mode) {
    typedef typename Element<Signal>::type Sample;
    return {name, [=](Call &c) {
                Sample *const x = c.record<Sample>(0);
                if constexpr (Signal == CDB)
                    *x = {0.75, -0.5};
                else
                    *x = 0.75;
                const int32_t order = mode == 1 ? 4 : 2;
                if (mode >= 2)
                    c.mayBeEmpty(1);
                c.mayBeEmpty(3);
                return filter(x, mode, c.in<DBL>(1, 3 * order, SectionDenominator),
                              c.in<DBL>(2, 3 * (order + 1)), c.inOut<Signal>(3, 3 * order),
                              &clears);
            }};
}

std::vector<Recipe> FilteringRecipes() {
    return {
        OfTwoStates<DBL, DBL>("IIR_Filter: IIR", IIR_Filter, 6),
        OfTwoStates<DBL, DBL>("IIR_Filter: FIR", IIR_Filter, 0),
        OfTwoStates<CDB, DBL>("CxSigIIR_Filter: IIR", CxSigIIR_Filter, 6),
        OfTwoStates<CDB, DBL>("CxSigIIR_Filter: FIR", CxSigIIR_Filter, 0),
        OfTwoStates<CDB, CDB>("CxIIR_Filter_H: IIR", CxIIR_Filter_H, 6),
        OfTwoStates<CDB, CDB>("CxIIR_Filter_H: FIR", CxIIR_Filter_H, 0),
        {"CxIIRReSig_Filter_H",
         [](Call &c) {
             c.mayBeEmpty(2);
             return CxIIRReSig_Filter_H(c.in<DBL>(0), c.out<CDB>(0), A<CDB>(c, 6),
                                        c.in<CDB>(2, taps), State<DBL>(c, 3, taps - 1),
                                        State<CDB>(c, 4, 5), &keeps);
         }},
        OfOneState<DBL>("IIR_Filter_OneState: IIR", IIR_Filter_OneState, 6),
        OfOneState<DBL>("IIR_Filter_OneState: FIR", IIR_Filter_OneState, 0),
        OfOneState<CDB>("CxSigIIR_Filter_OneState", CxSigIIR_Filter_OneState, 6),
        InOneStream<DBL>("IIR_Filter_OneState: IIR in a stream", IIR_Filter_OneState, 6),
        InOneStream<DBL>("IIR_Filter_OneState: FIR in a stream", IIR_Filter_OneState, 0),
        InOneStream<CDB>("CxSigIIR_Filter_OneState: in a stream", CxSigIIR_Filter_OneState, 6),
        OfCascade<DBL>("IIR_Filter2: second order", IIR_Filter2, 0),
        OfCascade<DBL>("IIR_Filter2: fourth order", IIR_Filter2, 1),
        OfCascade<CDB>("CxSigIIR_Filter2: second order", CxSigIIR_Filter2, 0),
        OfCascade<CDB>("CxSigIIR_Filter2: fourth order", CxSigIIR_Filter2, 1),
        OfCascade<DBL>("IIR_Filter2: in a stream", IIR_Filter2, 0, true),
        OfCascade<CDB>("CxSigIIR_Filter2: in a stream", CxSigIIR_Filter2, 1, true),
        OfSample<DBL>("IIR_Filter_PtbyPt: second order", IIR_Filter_PtbyPt, 0),
        OfSample<DBL>("IIR_Filter_PtbyPt: fourth order", IIR_Filter_PtbyPt, 1),
        OfSample<DBL>("IIR_Filter_PtbyPt: IIR", IIR_Filter_PtbyPt, 2),
        OfSample<DBL>("IIR_Filter_PtbyPt: FIR", IIR_Filter_PtbyPt, 3),
        OfSample<CDB>("CxSigIIR_Filter_PtbyPt: second order", CxSigIIR_Filter_PtbyPt, 0),
        OfSample<CDB>("CxSigIIR_Filter_PtbyPt: FIR", CxSigIIR_Filter_PtbyPt, 3),
    };
}

const RecipeFile file(FilteringRecipes);

} // namespace

} // namespace qx::test
