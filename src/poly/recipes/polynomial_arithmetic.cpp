#include "qx/polynomial_arithmetic.h"

#include "tests/support/recipe.h"

namespace qx::test {

namespace {

constexpr auto DBL = ElementType::DBL;
constexpr auto CDB = ElementType::CDB;

const std::vector<int32_t> degrees = {1, 2, 3, 6, 12, 33};
const std::vector<int32_t> lengths = {1, 2, 3, 8, 50, 130};

// Coefficient k of (x - 1)^(degree / 2) (x + shift)^(the rest).
double Multiple(int32_t k, int32_t degree, double shift) {
    std::vector<double> a(static_cast<std::size_t>(degree) + 1);
    a[0] = 1.0;
    for (int32_t i = 0; i < degree; ++i) {
        const double root = i < degree / 2 ? 1.0 : -shift;
        for (int32_t j = i + 1; j > 0; --j)
            a[j] = a[j - 1] - root * a[j];
        a[0] *= -root;
    }
    return k <= degree ? a[static_cast<std::size_t>(k)] : 0.0;
}

// The exports of both element types in one record.
template <ElementType E>
struct Exports {
    std::string prefix;
    ErrorCode (*add)(Handle1D<E>, Handle1D<E>, Handle1D<E>);
    ErrorCode (*subtract)(Handle1D<E>, Handle1D<E>, Handle1D<E>);
    ErrorCode (*multiply)(Handle1D<E>, Handle1D<E>, Handle1D<E>);
    ErrorCode (*compose)(Handle1D<E>, Handle1D<E>, Handle1D<E>);
    ErrorCode (*divide)(Handle1D<E>, Handle1D<E>, Handle1D<E>, Handle1D<E>);
    ErrorCode (*gcd)(Handle1D<E>, Handle1D<E>, double, Handle1D<E>, double *);
    ErrorCode (*value)(Handle1D<E>, Handle1D<E>, Handle1D<E>);
    ErrorCode (*matrix)(Handle1D<E>, Handle2D<E>, int32_t, Handle2D<E>);
    ErrorCode (*derivative)(Handle1D<E>, int32_t, Handle1D<E>);
};

template <ElementType E>
void AddKind(std::vector<Recipe> &recipes, const Exports<E> &e) {
    const auto binary = [&](const std::string &name, auto function, std::vector<int32_t> sizes) {
        for (const int32_t shorter : {0, 3})
            recipes.push_back({e.prefix + name + (shorter == 0 ? ": p longer" : ": q longer"),
                               [=](Call &c) {
                                   return function(c.in<E>(0, c.n + 1),
                                                   c.in<E>(1, shorter == 0 ? 1 : c.n + 2),
                                                   c.out<E>(0));
                               },
                               TakesEmptyInput, sizes});
    };
    binary("AddPolyH", e.add, lengths);
    binary("SubtractPolyH", e.subtract, lengths);
    binary("MultiplyPolyH", e.multiply, lengths);
    binary("PolyComposeH", e.compose, degrees);
    recipes.push_back({e.prefix + "DividePolyH",
                       [=](Call &c) {
                           c.mayBeEmpty(0);
                           return e.divide(c.in<E>(0, 2 * c.n), c.in<E>(1), c.out<E>(0),
                                           c.out<E>(1));
                       },
                       None, lengths});
    recipes.push_back({e.prefix + "PolyGCD_H: nothing in common",
                       [=](Call &c) {
                           return e.gcd(c.in<E>(0, c.n + 1), c.in<E>(1), 0.0, c.out<E>(0),
                                        c.scalar(0));
                       },
                       None, degrees});
    recipes.push_back(
        {e.prefix + "PolyGCD_H: a common factor",
         [=](Call &c) {
             const int32_t n = c.n;
             return e.gcd(c.in<E>(0, n + 1, [n](int32_t k) { return Multiple(k, n, 2.0); }),
                          c.in<E>(1, n + 2, [n](int32_t k) { return Multiple(k, n + 1, 0.5); }),
                          1e-9, c.out<E>(0), c.scalar(0));
         },
         None, std::vector<int32_t>{1, 2, 3, 6, 12}});
    recipes.push_back({e.prefix + "PolyEv", [=](Call &c) {
                           c.mayBeEmpty(1);
                           return e.value(c.in<E>(0, 7), c.in<E>(1), c.out<E>(0));
                       }});
    for (const int32_t mode : {0, 1})
        recipes.push_back({e.prefix + "EvPoly2D: mode " + std::to_string(mode),
                           [=](Call &c) {
                               c.mayBeEmpty(1);
                               return e.matrix(c.in<E>(0, 2 * c.n), c.in2D<E>(1, c.n, c.n), mode,
                                               c.out2D<E>(0));
                           },
                           None, degrees});
    for (const int32_t order : {0, 1, 3})
        recipes.push_back({e.prefix + "PolyDerivativeH: order " + std::to_string(order),
                           [=](Call &c) { return e.derivative(c.in<E>(0), order, c.out<E>(0)); }});
}

struct ::CDB Constant() {
    return {0.5, -0.25};
}

// Roots in conjugate pairs; the middle one of an odd count is real.
struct ::CDB Paired(int32_t k, int32_t n) {
    const int32_t other = n - 1 - k;
    const int32_t least = k < other ? k : other;
    const double im = k == other ? 0.0 : 0.125 * (least + 1);
    return {0.25 * (least % 5) - 0.5, k < other ? im : -im};
}

std::vector<Recipe> PolynomialArithmeticRecipes() {
    std::vector<Recipe> recipes = {
        {"PolyLCM_H",
         [](Call &c) {
             const int32_t n = c.n;
             return PolyLCM_H(
                 c.in<DBL>(0, n + 1, [n](int32_t k) { return Multiple(k, n, 2.0); }),
                 c.in<DBL>(1, n + 2, [n](int32_t k) { return Multiple(k, n + 1, 0.5); }), 1e-9,
                 c.out<DBL>(0));
         },
         None,
         {1, 2, 3, 6, 12}},
        {"PolyIntegralH", [](Call &c) { return PolyIntegralH(c.in<DBL>(0), 0.5, c.out<DBL>(0)); }},
        {"CxPolyIntegralH",
         [](Call &c) {
             static const auto constant = Constant();
             return CxPolyIntegralH(c.in<CDB>(0), &constant, c.out<CDB>(0));
         }},
        {"PolyFromRootsH",
         [](Call &c) {
             const int32_t n = c.n;
             c.mayBeEmpty(0);
             return PolyFromRootsH(c.in<CDB>(0, n, [n](int32_t k) { return Paired(k, n); }),
                                   c.out<DBL>(0));
         },
         None, lengths},
        {"CxPolyFromRootsH",
         [](Call &c) {
             c.mayBeEmpty(0);
             return CxPolyFromRootsH(c.in<CDB>(0), c.out<CDB>(0));
         },
         None, lengths},
        {"PartialFractionsH: simple poles",
         [](Call &c) {
             return PartialFractionsH(c.in<DBL>(0, c.n + 2), c.in<DBL>(1, c.n + 1), 0.0,
                                      c.out<DBL>(0), c.out<CDB>(1), c.out<CDB>(2));
         },
         None, degrees},
        {"PartialFractionsH: multiple poles",
         [](Call &c) {
             const int32_t n = c.n;
             return PartialFractionsH(
                 c.in<DBL>(0, n),
                 c.in<DBL>(1, n + 1, [n](int32_t k) { return Multiple(k, n, 0.5); }), 1e-10,
                 c.out<DBL>(0), c.out<CDB>(1), c.out<CDB>(2));
         },
         None,
         {1, 2, 3, 6, 12}},
    };
    AddKind<DBL>(recipes, {"", AddPolyH, SubtractPolyH, MultiplyPolyH, PolyComposeH, DividePolyH,
                           PolyGCD_H, PolyEv, EvPoly2D, PolyDerivativeH});
    AddKind<CDB>(recipes, {"Cx", CxAddPolyH, CxSubtractPolyH, CxMultiplyPolyH, CxPolyComposeH,
                           CxDividePolyH, CxPolyGCD_H, CxPolyEv, CxEvPoly2D, CxPolyDerivativeH});
    return recipes;
}

const RecipeFile file(PolynomialArithmeticRecipes);

} // namespace

} // namespace qx::test
