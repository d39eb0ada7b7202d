#include "qx/polynomial_roots.h"

#include "tests/support/recipe.h"

namespace qx::test {

namespace {

constexpr auto DBL = ElementType::DBL;
constexpr auto CDB = ElementType::CDB;

const std::vector<int32_t> degrees = {1, 2, 3, 6, 12};

// (x - 1)^2 (x + 2)^3 and factors x - 1/2 up to the degree n.
double WithMultipleRoots(int32_t k, int32_t n) {
    std::vector<double> a(static_cast<std::size_t>(n) + 1);
    a[0] = 1.0;
    const double roots[] = {1.0, -2.0, 1.0, -2.0, -2.0};
    for (int32_t degree = 0; degree < n; ++degree) {
        const double root = degree < 5 ? roots[degree] : 0.5;
        for (int32_t i = degree + 1; i > 0; --i)
            a[i] = a[i - 1] - root * a[i];
        a[0] *= -root;
    }
    return k <= n ? a[static_cast<std::size_t>(k)] : 0.0;
}

template <ElementType Code, class Export>
void AddMultiple(std::vector<Recipe> &recipes, const std::string &name, Export roots) {
    for (const int32_t refine : {0, 1}) {
        const char *const kind = refine != 0 ? "refined" : "as found";
        recipes.push_back({name + ": simple roots " + kind,
                           [=](Call &c) {
                               return roots(c.inOut<Code>(0, c.n + 1), refine, 0.0, c.out<CDB>(0),
                                            c.out<CDB>(1), c.out<ElementType::I32>(2));
                           },
                           None, degrees});
        recipes.push_back(
            {name + ": multiple roots " + kind,
             [=](Call &c) {
                 const int32_t n = c.n;
                 return roots(
                     c.inOut<Code>(0, n + 1, [n](int32_t k) { return WithMultipleRoots(k, n); }),
                     refine, 1e-10, c.out<CDB>(0), c.out<CDB>(1), c.out<ElementType::I32>(2));
             },
             None, degrees});
    }
}

std::vector<Recipe> PolynomialRootsRecipes() {
    std::vector<Recipe> recipes = {
        {"PolyRootsNtBst_head",
         [](Call &c) {
             c.mayBeEmpty(0);
             c.mayBeEmpty(1);
             c.mayBeEmpty(2);
             return PolyRootsNtBst_head(c.in<DBL>(0, c.n + 4), c.in<DBL>(1), 50, 1e-12,
                                        c.in<CDB>(2, 6), 60, 1e-12, c.out<CDB>(0));
         }},
        {"CxPolyRoots_head",
         [](Call &c) {
             return CxPolyRoots_head(c.inOut<CDB>(0, c.n + 1), c.byReference(100), c.err());
         },
         None, degrees},
    };
    recipes.push_back({"PolyRoots2026_head",
                       [](Call &c) {
                           return PolyRoots2026_head(c.in<DBL>(0, c.n + 1), c.out<CDB>(0),
                                                     c.out<DBL>(1));
                       },
                       None, degrees});
    recipes.push_back({"CxPolyRoots2026_head",
                       [](Call &c) {
                           return CxPolyRoots2026_head(c.in<CDB>(0, c.n + 1), c.out<CDB>(0),
                                                       c.out<DBL>(1));
                       },
                       None, degrees});
    recipes.push_back(
        {"PolyRoots2026_head: multiple roots",
         [](Call &c) {
             const int32_t n = c.n;
             return PolyRoots2026_head(
                 c.in<DBL>(0, n + 1, [n](int32_t k) { return WithMultipleRoots(k, n); }),
                 c.out<CDB>(0), c.out<DBL>(1));
         },
         None, degrees});
    AddMultiple<DBL>(recipes, "MultPolyRoots_head", MultPolyRoots_head);
    AddMultiple<CDB>(recipes, "CxMultPolyRoots_head", CxMultPolyRoots_head);
    return recipes;
}

const RecipeFile file(PolynomialRootsRecipes);

} // namespace

} // namespace qx::test
